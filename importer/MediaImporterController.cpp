// SPDX-License-Identifier: MIT
#include "importer/MediaImporterController.h"

#include <utility>

#include "LibMediaPlayer/IMediaDiscoverer.h"
#include "LibMediaPlayer/IMediaImporter.h"
#include "LibMediaPlayer/InterfaceFactory.h"
#include "log/Logging.h"

namespace {

constexpr char kModule[] = "MediaImporterController";
constexpr int kInformation = 6;
constexpr int kWarning = 4;
constexpr int kNoObject = -1;

// The wide form writes a file name as it stands, percent signs included, whatever its length.
void logFailure(int code, const wchar_t* what, const std::wstring& file, int result) {
    LOG_EVENT(L"MediaImporterController", code, what + file + L" iRet: " + std::to_wstring(result),
              kWarning);
}

} // namespace

MediaImporterController::MediaImporterController() {
    using LibMediaPlayer::InterfaceFactory;
    mpImporter.reset(InterfaceFactory::createImporter());
    mpDiscoverer.reset(InterfaceFactory::createDiscoverer());
    if (mpImporter)
        mpImporter->setNotify(
            [this](LibMediaPlayer::MediaImporterNotify& notify) { importNotify(notify); });
}

MediaImporterController::~MediaImporterController() = default;

void MediaImporterController::setTexts(std::wstring file, std::wstring folder) {
    const std::lock_guard lock(mMutex);
    mFile = std::move(file);
    mFolder = std::move(folder);
}

void MediaImporterController::setStatusClientID(int iClientID) {
    const std::lock_guard lock(mMutex);
    mStatusClientID = iClientID;
}

MediaImporterController::StatusAnswer MediaImporterController::statusAnswer() const {
    const std::lock_guard lock(mMutex);
    return {mStatusClientID, mStatus};
}

MediaServiceDefine::_tagMediaImporterNotify MediaImporterController::notification() const {
    return copyOf(mNotification);
}

int MediaImporterController::initialize() {
    return 0;
}

int MediaImporterController::import() {
    std::wstring file = copyOf(mFile);
    std::wstring folder = copyOf(mFolder);
    LibMediaPlayer::MediaMetaInfo info;
    const int result = readMetadata(file, info);
    remember(info);
    if (result != 0) {
        LibMediaPlayer::MediaImporterNotify failed{LibMediaPlayer::kImportFinished, result, {}};
        importNotify(failed);
        return result;
    }
    return mpImporter ? mpImporter->import(file, folder) : result;
}

/** An open that fails is forgotten when the metadata can be read all the same. */
int MediaImporterController::readMetadata(const std::wstring& file,
                                          LibMediaPlayer::MediaMetaInfo& info) {
    if (!mpDiscoverer)
        return kNoObject;
    if (const int opened = mpDiscoverer->open(file); opened != 0)
        logFailure(310, L"import ", file, opened);
    const int result = mpDiscoverer->metadata(info);
    if (result != 0)
        logFailure(311, L"import ", file, result);
    mpDiscoverer->close();
    return result;
}

void MediaImporterController::remember(const LibMediaPlayer::MediaMetaInfo& info) {
    const auto& video = info.video;
    const auto& audio = info.audio.front();
    const std::lock_guard lock(mMutex);
    mNotification.strText2 = video.description;
    mNotification.strText3 = audio.description;
    mNotification.iValue = {video.width, video.height, video.frameRateNumerator,
                            video.frameRateDenominator, audio.sampleRate};
}

void MediaImporterController::importNotify(LibMediaPlayer::MediaImporterNotify& notify) {
    try {
        const std::wstring file = store(notify);
        if (notify.result != 0)
            logFailure(312, L"importNotify ", file, notify.result);
        Q_EMIT importNotify_signal();
    } catch (...) {
        // The engine's threads are not prepared for exceptions: this notification is lost.
    }
}

std::wstring MediaImporterController::store(const LibMediaPlayer::MediaImporterNotify& notify) {
    const std::lock_guard lock(mMutex);
    mNotification.iNotifyType = notify.kind;
    mNotification.iRet = notify.result;
    mNotification.strText1 = notify.text;
    return mFile;
}

int MediaImporterController::cancel() {
    LOG_EVENT(kInformation, kModule, 101, "cancel() called. ");
    const int result = mpImporter ? mpImporter->cancel() : kNoObject;
    LOG_EVENT(kInformation, kModule, 102, "cancel() finished. ");
    return result;
}

int MediaImporterController::getStatus() {
    MediaServiceDefine::_tagMediaImporterStatus status{kNoObject, 0, 0, 0};
    if (mpImporter) {
        LibMediaPlayer::MediaImporterStatus bytes;
        status.iStatus = mpImporter->status(bytes);
        status.llValue1 = bytes.done;
        status.llValue2 = bytes.total;
    }
    {
        const std::lock_guard lock(mMutex);
        mStatus = status;
    }
    Q_EMIT retImporterStatus_signal();
    return status.iStatus;
}

int MediaImporterController::generateDotFile() {
    return mpImporter ? mpImporter->dumpGraph(mDotFileName) : kNoObject;
}
