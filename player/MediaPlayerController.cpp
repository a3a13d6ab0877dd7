// SPDX-License-Identifier: MIT
#include "player/MediaPlayerController.h"

#include <chrono>
#include <string_view>
#include <thread>
#include <utility>

#include "LibMediaPlayer/IMediaPlayer.h"
#include "LibMediaPlayer/InterfaceFactory.h"
#include "base/StandardOutput.h"
#include "base/SystemPaths.h"
#include "log/Logging.h"

namespace {

constexpr wchar_t kModule[] = L"MediaPlayerService";
constexpr unsigned int kAllFlags = LibMediaPlayer::kPlayVideo | LibMediaPlayer::kPlayAudio |
                                   LibMediaPlayer::kPlayText | LibMediaPlayer::kPlayVisualisation;
constexpr int kNoPlayer = -1;

/** How long the engine needs before and after the picture that warms it up. */
constexpr std::chrono::seconds kWarmUpPause{1};

// The wide form writes a file name as it stands, percent signs included, whatever its length.
void log(std::wstring text) {
    LOG_EVENT(kModule, 101, std::move(text), 6);
}

std::wstring blackPicture() {
    std::wstring prefix;
    qns::systemPrefixPath(prefix);
    return prefix + L"/share/mediaplayer/images/black.jpg";
}

} // namespace

MediaPlayerController::MediaPlayerController() {
    INIT_LOGGING(kModule);
    mpPlayer.reset(LibMediaPlayer::InterfaceFactory::createPlayer(nullptr, kAllFlags));
    if (mpPlayer)
        mpPlayer->setNotify(
            [this](LibMediaPlayer::MediaPlayerNotify& notify) { openNotify(notify); });
}

MediaPlayerController::~MediaPlayerController() = default;

void MediaPlayerController::setFileName(std::wstring fileName) {
    const std::lock_guard lock(mMutex);
    mFileName = std::move(fileName);
}

void MediaPlayerController::setFormat(int format) {
    const std::lock_guard lock(mMutex);
    mFormat = format;
}

void MediaPlayerController::setSeekParam(const MediaServiceDefine::_tagSeekParam& param) {
    const std::lock_guard lock(mMutex);
    mSeekParam.iClientID = param.iClientID;
    mSeekParam.iSeekMode = param.iSeekMode;
    mSeekParam.lPosition = param.lPosition;
}

void MediaPlayerController::setStatusClientID(int iClientID) {
    const std::lock_guard lock(mMutex);
    mStatusClientID = iClientID;
}

void MediaPlayerController::setRepeatParam(const MediaServiceDefine::_tagRepeatParam& param) {
    const std::lock_guard lock(mMutex);
    mRepeatParam = param;
}

MediaPlayerController::StatusAnswer MediaPlayerController::statusAnswer() const {
    const std::lock_guard lock(mMutex);
    return {mStatusClientID, mStatus};
}

const MediaServiceDefine::_tagMediaPlayerNotify& MediaPlayerController::notification() const {
    return mNotification;
}

int32_t MediaPlayerController::initialize() {
    log(L"MediaPlayerController::initializePlayer");
    qns::printLine("MediaPlayerController::initialize");
    std::this_thread::sleep_for(kWarmUpPause);
    const std::wstring picture = blackPicture();
    setFileName(picture);
    log(L"MediaPlayerController::initializePlayer open " + picture);
    openInPlayer(picture);
    std::this_thread::sleep_for(kWarmUpPause);
    log(L"MediaPlayerController::initializePlayer close");
    closeInPlayer();
    return 0;
}

int32_t MediaPlayerController::open() {
    const std::wstring fileName = copyOf(mFileName);
    log(L"MediaPlayerController::open " + fileName);
    qns::printLine("MediaPlayerController::open");
    return openInPlayer(fileName);
}

int32_t MediaPlayerController::close() {
    log(L"MediaPlayerController::close");
    qns::printLine("MediaPlayerController::close");
    return closeInPlayer();
}

int32_t MediaPlayerController::play() {
    qns::printLine("MediaPlayerController::play");
    return mpPlayer ? mpPlayer->play() : kNoPlayer;
}

int32_t MediaPlayerController::pause() {
    qns::printLine("MediaPlayerController::pause");
    return mpPlayer ? mpPlayer->pause() : kNoPlayer;
}

int32_t MediaPlayerController::seek() {
    qns::printLine("MediaPlayerController::seek");
    const auto param = copyOf(mSeekParam);
    return mpPlayer ? mpPlayer->seek(param.lPosition, param.iSeekMode) : kNoPlayer;
}

int32_t MediaPlayerController::getStatus() {
    MediaServiceDefine::_tagMediaPlayerStatus status{kNoPlayer, 0, 0, 0};
    if (mpPlayer)
        status.iStatus = mpPlayer->status(status.lStatusValue1, status.lStatusValue2);
    {
        const std::lock_guard lock(mMutex);
        mStatus = status;
    }
    Q_EMIT retPlayerStatus_signal();
    return status.iStatus;
}

int32_t MediaPlayerController::setRepeat() {
    qns::printLine("MediaPlayerController::setRepeat");
    const auto param = copyOf(mRepeatParam);
    LibMediaPlayer::RepeatParam repeat{param.bRepeat, param.lRepeatStart, param.lRepeatEnd};
    return mpPlayer ? mpPlayer->repeat(repeat) : kNoPlayer;
}

int32_t MediaPlayerController::generateDotFile() {
    qns::printLine("MediaPlayerController::generateDotFile");
    return mpPlayer ? mpPlayer->dumpGraph(mDotFileName) : kNoPlayer;
}

int MediaPlayerController::openInPlayer(const std::wstring& fileName) {
    return mpPlayer ? mpPlayer->open(fileName, copyOf(mFormat)) : kNoPlayer;
}

int MediaPlayerController::closeInPlayer() {
    return mpPlayer ? mpPlayer->close() : kNoPlayer;
}

void MediaPlayerController::openNotify(LibMediaPlayer::MediaPlayerNotify& notify) {
    try {
        log(L"MediaPlayerController::openNotify");
        qns::printLine("MediaPlayerController::openNotify");
        passOn(notify);
    } catch (...) {
        // The engine's threads are not prepared for exceptions: this notification is lost.
    }
}

void MediaPlayerController::passOn(const LibMediaPlayer::MediaPlayerNotify& notify) {
    const std::lock_guard lock(mNotifyMutex);
    mNotification = {notify.type,   notify.result,  notify.text,    notify.param1, notify.param2,
                     notify.param3, notify.uvalue1, notify.uvalue2, notify.value};
    Q_EMIT openNotify_signal();
}
