// SPDX-License-Identifier: MIT
#include "discoverer/MediaDiscovererController.h"

#include <algorithm>
#include <utility>

#include "LibMediaPlayer/IMediaDiscoverer.h"
#include "LibMediaPlayer/InterfaceFactory.h"
#include "base/StandardOutput.h"
#include "base/Text.h"
#include "discoverer/BlackPicture.h"
#include "log/Logging.h"
#include "pack/CPack_Simplebuffer.h"
#include "pack/PackedArguments.h"

using namespace MediaServiceDefine;

namespace {

constexpr int kNotOpened = 5;
constexpr int kNoDiscoverer = -1;
constexpr int kSucceeded = 0;
constexpr int kFailed = 1;

/** Where a picture is taken that was asked for beyond the end: near the start. */
constexpr int64_t kInsteadOfBeyondTheEnd = 1;

void logFailure(const wchar_t* operation, const std::wstring& file, int result) {
    constexpr int kError = 3;
    LOG_EVENT(L"MediaDiscovererController", 410,
              operation + file + L" iRet: " + std::to_wstring(result), kError);
}

_tagSystemMetaInfo toRecord(const LibMediaPlayer::SystemMetaInfo& info) {
    return {qns::widen(info.mediaType), info.tags, info.seekable, info.live, info.duration};
}

_tagVideoMetaInfo toRecord(const LibMediaPlayer::VideoMetaInfo& info) {
    return {qns::widen(info.mediaType),
            info.description,
            info.width,
            info.height,
            info.depth,
            info.frameRateNumerator,
            info.frameRateDenominator,
            info.pixelAspectNumerator,
            info.pixelAspectDenominator,
            info.interlaced,
            info.bitRate,
            info.maxBitRate,
            info.stillPicture};
}

_tagAudioMetaInfo toRecord(const LibMediaPlayer::AudioMetaInfo& info) {
    return {qns::widen(info.mediaType),
            info.description,
            info.channels,
            info.sampleRate,
            info.depth,
            info.bitRate,
            info.maxBitRate};
}

/** No more streams than there is room for, whatever the engine counts. */
int32_t streamCount(int32_t counted, std::size_t room) {
    return std::clamp(counted, 0, static_cast<int32_t>(room));
}

template<typename Stream, typename Serialize>
PackedArguments packStreams(const Stream* streams, int32_t count, Serialize serialize) {
    PackedArguments block;
    for (const Stream* stream = streams; stream != streams + count; ++stream)
        serialize(*block.get(), toRecord(*stream));
    return block;
}

} // namespace

MediaDiscovererController::MediaDiscovererController() {
    for (Discoverer& discoverer : mDiscoverers)
        discoverer.pEngine.reset(LibMediaPlayer::InterfaceFactory::createDiscoverer());
}

MediaDiscovererController::~MediaDiscovererController() {
    for (Discoverer& discoverer : mDiscoverers)
        discoverer.pEngine.reset();
}

bool MediaDiscovererController::setOpenFile(int iDiscovererID, std::wstring fileName) {
    const std::lock_guard lock(mMutex);
    std::wstring& openFile = at(iDiscovererID).openFile;
    if (!openFile.empty())
        return false;
    openFile = std::move(fileName);
    return true;
}

void MediaDiscovererController::clearOpenFile(int iDiscovererID) {
    const std::lock_guard lock(mMutex);
    at(iDiscovererID).openFile.clear();
}

void MediaDiscovererController::setImageParam(_tagImageParam param, int iDiscovererID) {
    const std::lock_guard lock(mMutex);
    at(iDiscovererID).imageParam = std::move(param);
}

const _tagMediaImageInfo& MediaDiscovererController::image(int iDiscovererID) const {
    return at(iDiscovererID).image;
}

const _tagSupportedExtensions& MediaDiscovererController::extensions(int iDiscovererID) const {
    return at(iDiscovererID).extensions;
}

const _tagMediaMetaInfo& MediaDiscovererController::metadata(int iDiscovererID) const {
    return at(iDiscovererID).metadata;
}

int MediaDiscovererController::serializeVideoMetaInfo(simplebuffer& buffer,
                                                      const _tagVideoMetaInfo& info) {
    CPack_Simplebuffer pack;
    pack.pack_simplebuffer_wstring(&buffer, info.strNarrowInfo);
    pack.pack_simplebuffer_wstring(&buffer, info.strWideInfo);
    for (const int32_t value :
         {info.iVideoInfo1, info.iVideoInfo2, info.iVideoInfo3, info.iVideoInfo4, info.iVideoInfo5,
          info.iVideoInfo6, info.iVideoInfo7})
        pack.pack_simplebuffer_int32(&buffer, value);
    pack.pack_simplebuffer_bool(&buffer, info.bVideoFlag1);
    pack.pack_simplebuffer_int32(&buffer, info.iVideoInfo8);
    pack.pack_simplebuffer_int32(&buffer, info.iVideoInfo9);
    return pack.pack_simplebuffer_bool(&buffer, info.bVideoFlag2);
}

int MediaDiscovererController::serializeAudioMetaInfo(simplebuffer& buffer,
                                                      const _tagAudioMetaInfo& info) {
    CPack_Simplebuffer pack;
    pack.pack_simplebuffer_wstring(&buffer, info.strNarrowInfo);
    pack.pack_simplebuffer_wstring(&buffer, info.strWideInfo);
    for (const int32_t value :
         {info.iAudioInfo1, info.iAudioInfo2, info.iAudioInfo3, info.iAudioInfo4})
        pack.pack_simplebuffer_int32(&buffer, value);
    return pack.pack_simplebuffer_int32(&buffer, info.iAudioInfo5);
}

int MediaDiscovererController::initialize(int) {
    return 0;
}

int MediaDiscovererController::open(int iDiscovererID) {
    int result = kNotOpened;
    if (auto* const engine = at(iDiscovererID).pEngine.get()) {
        const std::wstring file = copyOf(at(iDiscovererID).openFile);
        qns::printLine("MediaDiscovererController::open " + std::to_string(iDiscovererID) + ' ' +
                       qns::narrow(file));
        result = engine->open(file);
        if (result != 0) {
            logFailure(L"open ", file, result);
            clearOpenFile(iDiscovererID);
        }
    }
    Q_EMIT retOpen_signal(result, iDiscovererID);
    return result;
}

int MediaDiscovererController::close(int iDiscovererID) {
    auto* const engine = at(iDiscovererID).pEngine.get();
    const int result = engine ? engine->close() : kNoDiscoverer;
    clearOpenFile(iDiscovererID);
    return result;
}

int MediaDiscovererController::getMetadata(int iDiscovererID) {
    Discoverer& discoverer = at(iDiscovererID);
    LibMediaPlayer::MediaMetaInfo info;
    const int result = readMetadata(discoverer, L"getMetadata ", info);
    const int32_t videoCount = streamCount(info.videoCount, 1);
    const int32_t audioCount = streamCount(info.audioCount, info.audio.size());
    const auto video = packStreams(&info.video, videoCount, serializeVideoMetaInfo);
    const auto audio = packStreams(info.audio.data(), audioCount, serializeAudioMetaInfo);
    discoverer.metadata = {result == 0 ? kSucceeded : kFailed,
                           result,
                           toRecord(info.system),
                           video.data(),
                           static_cast<int32_t>(video.size()),
                           videoCount,
                           audio.data(),
                           static_cast<int32_t>(audio.size()),
                           audioCount};
    Q_EMIT retMetaData_signal(iDiscovererID);
    discoverer.metadata.pVideoData = nullptr;
    discoverer.metadata.pAudioData = nullptr;
    return result;
}

int MediaDiscovererController::readMetadata(Discoverer& discoverer, const wchar_t* operation,
                                            LibMediaPlayer::MediaMetaInfo& info) const {
    if (!discoverer.pEngine)
        return kNoDiscoverer;
    const int result = discoverer.pEngine->metadata(info);
    if (result != 0)
        logFailure(operation, copyOf(discoverer.openFile), result);
    return result;
}

int MediaDiscovererController::getImage(int iDiscovererID) {
    Discoverer& discoverer = at(iDiscovererID);
    LibMediaPlayer::MediaMetaInfo info;
    int result = readMetadata(discoverer, L"getImage ", info);
    if (result == 0) {
        const _tagImageParam param = copyOf(discoverer.imageParam);
        result = makeImage(discoverer, param, info.system.duration);
        discoverer.image.strFileName = copyOf(discoverer.openFile);
        discoverer.image.strImagePath = param.strImagePath;
    }
    discoverer.image.iResult = result == 0 ? kSucceeded : kFailed;
    discoverer.image.iRet = result;
    Q_EMIT retImage_signal(iDiscovererID);
    return result;
}

int MediaDiscovererController::makeImage(Discoverer& discoverer, const _tagImageParam& param,
                                         int64_t duration) const {
    const bool isBeyondTheEnd = param.lPosition > duration;
    const int64_t position = isBeyondTheEnd ? kInsteadOfBeyondTheEnd : param.lPosition;
    const int result =
        discoverer.pEngine->makeImage(position, param.iWidth, param.iHeight, param.strImagePath);
    if (result != 0) {
        logFailure(L"makeImage ", copyOf(discoverer.openFile), result);
        qns::writeBlackPicture(param.strImagePath, param.iWidth, param.iHeight);
    }
    return result;
}

int MediaDiscovererController::getSupportedExtensions(int iDiscovererID) {
    Discoverer& discoverer = at(iDiscovererID);
    LibMediaPlayer::SupportedExtensions supported;
    const int result =
        discoverer.pEngine ? discoverer.pEngine->supportedExtensions(supported) : kNoDiscoverer;
    discoverer.extensions.strExtensions = std::move(supported.extensions);
    discoverer.extensions.iExtensionValue = supported.count;
    Q_EMIT retSupportedExtensions_signal(iDiscovererID);
    return result;
}

MediaDiscovererController::Discoverer& MediaDiscovererController::at(int iDiscovererID) {
    return mDiscoverers.at(static_cast<std::size_t>(iDiscovererID));
}

const MediaDiscovererController::Discoverer&
MediaDiscovererController::at(int iDiscovererID) const {
    return mDiscoverers.at(static_cast<std::size_t>(iDiscovererID));
}
