// SPDX-License-Identifier: MIT
#include "player/MediaPlayerService.h"

#include <utility>

#include <QCoreApplication>

#include "base/StandardOutput.h"
#include "log/Logging.h"
#include "player/IMediaPlayerServiceCallBack.h"
#include "player/MediaPlayerController.h"

/** What is peculiar to one kind of request. */
struct PlayerRequest {
    const char* name; ///< of the operation
    void (MediaPlayerService::*signal)();
    void (IMediaPlayerServiceCallBack::*answer)(int);
    int accepted;   ///< the answer to a registered client
    int refused;    ///< the answer to any other
    bool endsReady; ///< what is open now will be gone
};

namespace {

using S = MediaPlayerService;
using C = IMediaPlayerServiceCallBack;

// clang-format off
constexpr PlayerRequest
    kInitialize{"initializePlayer", &S::initialize_signal, &C::initializePlayerCallBack, 0, 1, true},
    kOpen      {"openPlayer",       &S::open_signal,       &C::openPlayerCallBack,       0, 1, true},
    kOpenEmpty {"openPlayer",       &S::close_signal,      &C::openPlayerCallBack,       1, 1, true},
    kClose     {"closePlayer",      &S::close_signal,      &C::closePlayerCallBack,      0, 1, true},
    kPlay      {"play",             &S::play_signal,       &C::playCallBack,             0, 1, false},
    kPause     {"pause",            &S::pause_signal,      &C::pauseCallBack,            0, 0, false},
    kSeek      {"seek",             &S::seek_signal,       &C::seekCallBack,             0, 1, false},
    kSetRepeat {"setRepeat",        &S::setRepeat_signal,  &C::setRepeatCallBack,        0, 1, false};
// clang-format on

constexpr char kModule[] = "MediaPlayerService";
constexpr int kInformation = 6;
constexpr int kError = 3;

constexpr int kFormat60Hz = 2;
constexpr int kFormat50Hz = 3;

constexpr MediaServiceDefine::_tagMediaPlayerStatus kNotReady{2, 0, 0, 0};

std::unique_ptr<MediaPlayerController> makeController() {
    INIT_LOGGING(L"MediaPlayerService");
    return std::make_unique<MediaPlayerController>();
}

} // namespace

MediaPlayerService::MediaPlayerService() : mpMediaPlayerController(makeController()) {
    connectController();
}

MediaPlayerService::~MediaPlayerService() = default;

void MediaPlayerService::connectController() {
    MediaPlayerController* const controller = mpMediaPlayerController.get();
    connect(this, SIGNAL(initialize_signal()), controller, SLOT(initialize()));
    connect(this, SIGNAL(open_signal()), controller, SLOT(open()));
    connect(this, SIGNAL(close_signal()), controller, SLOT(close()));
    connect(this, SIGNAL(play_signal()), controller, SLOT(play()));
    connect(this, SIGNAL(pause_signal()), controller, SLOT(pause()));
    connect(this, SIGNAL(seek_signal()), controller, SLOT(seek()));
    connect(this, SIGNAL(getStatus_signal()), controller, SLOT(getStatus()));
    connect(this, SIGNAL(setRepeat_signal()), controller, SLOT(setRepeat()));
    connect(this, SIGNAL(generateDotFile_signal()), controller, SLOT(generateDotFile()));
    // Direct: the notification must not be overtaken by the next one.
    connect(controller, SIGNAL(openNotify_signal()), this, SLOT(openNotify()),
            Qt::DirectConnection);
    connect(controller, SIGNAL(retPlayerStatus_signal()), this, SLOT(retPlayerStatus()));
}

void MediaPlayerService::initializePlayer(int iClientID) {
    handle(kInitialize, iClientID);
}

void MediaPlayerService::openPlayer(MediaServiceDefine::_tagFileName fileName) {
    if (fileName.strFileName.empty())
        return handle(kOpenEmpty, fileName.iClientID);
    handle(kOpen, fileName.iClientID,
           [&] { mpMediaPlayerController->setFileName(std::move(fileName.strFileName)); });
}

void MediaPlayerService::closePlayer(int iClientID) {
    handle(kClose, iClientID);
}

void MediaPlayerService::play(int iClientID) {
    handle(kPlay, iClientID);
}

void MediaPlayerService::pause(int iClientID) {
    handle(kPause, iClientID);
}

void MediaPlayerService::seek(MediaServiceDefine::_tagSeekParam param) {
    handle(kSeek, param.iClientID, [&] { mpMediaPlayerController->setSeekParam(param); });
}

void MediaPlayerService::setRepeat(MediaServiceDefine::_tagRepeatParam param) {
    handle(kSetRepeat, param.iClientID, [&] { mpMediaPlayerController->setRepeatParam(param); });
}

template<typename Store>
void MediaPlayerService::handle(const PlayerRequest& request, int iClientID, Store store) {
    qns::printFormatted("MediaPlayerService::%s\n", request.name);
    auto* const callback = callbackOf(iClientID);
    const bool accepted = isEnableID(iClientID);
    if (accepted) {
        store();
        if (request.endsReady)
            mbPlayerReady = false;
        emitSignal(request.signal);
    }
    if (callback)
        (callback->*request.answer)(accepted ? request.accepted : request.refused);
}

void MediaPlayerService::handle(const PlayerRequest& request, int iClientID) {
    handle(request, iClientID, [] {});
}

void MediaPlayerService::emitSignal(void (MediaPlayerService::*signal)()) {
    try {
        Q_EMIT(this->*signal)();
    } catch (...) {
        // The client is answered for the request, not for what becomes of it.
    }
}

void MediaPlayerService::getPlayerStatus(int iClientID) {
    auto* const callback = callbackOf(iClientID);
    if (isEnableID(iClientID) && mbPlayerReady) {
        mpMediaPlayerController->setStatusClientID(iClientID);
        emitSignal(&MediaPlayerService::getStatus_signal);
    } else if (callback) {
        callback->getPlayerStatusCallBack(kNotReady);
    }
}

void MediaPlayerService::retPlayerStatus() {
    const auto [iClientID, status] = mpMediaPlayerController->statusAnswer();
    const auto held = use();
    if (auto* const callback = callbackOf(iClientID))
        callback->getPlayerStatusCallBack(status);
}

void MediaPlayerService::powerOffMediaPlayer(int iClientID) {
    LOG_EVENT(kInformation, kModule, 900, "MediaPlayerService::powerOffMediaPlayer() is called.");
    if (!isEnableID(iClientID)) {
        LOG_EVENT(kError, kModule, 400,
                  "MediaPlayerService::powerOffMediaPlayer() is called, but clientID %d is not "
                  "enabled.",
                  iClientID);
        return;
    }
    // Queued: called from here, quit() of a GUI application would wait for the main thread.
    QMetaObject::invokeMethod(QCoreApplication::instance(), "quit", Qt::QueuedConnection);
    LOG_EVENT(kInformation, kModule, 901,
              "MediaPlayerService::powerOffMediaPlayer() : QApplication::quit() finished.");
    if (auto* const callback = callbackOf(iClientID)) {
        LOG_EVENT(kInformation, kModule, 902,
                  "MediaPlayerService::powerOffMediaPlayer() : calling the callback func.");
        callback->powerOffMediaPlayerCallBack();
    }
    LOG_EVENT(kInformation, kModule, 903, "MediaPlayerService::powerOffMediaPlayer() finished.");
}

void MediaPlayerService::registerCallBack(IMediaPlayerServiceCallBack* callback) {
    if (callback)
        callback->setPlayerClientID(registerClient(callback));
}

void MediaPlayerService::registerNotify(_tagIMediaPlayerServiceNotify notify) {
    if (notify.pNotify)
        registerNotifyClient(notify.iClientID, notify.pNotify);
}

void MediaPlayerService::unregisterCallBack(int iClientID) {
    unregisterClient(iClientID);
}

void MediaPlayerService::unregisterNotify(int iClientID) {
    unregisterNotifyClient(iClientID);
}

void MediaPlayerService::setSystemFormat(MediaServiceDefine::_emMediaServiceSystemFormat format) {
    LOG_EVENT(kInformation, kModule, 100, "MediaPlayerService::setSystemFormat() Enter.");
    miSystemFormat = format != 0 ? kFormat60Hz : kFormat50Hz;
    mpMediaPlayerController->setFormat(miSystemFormat);
    LOG_EVENT(kInformation, kModule, 101,
              "MediaPlayerService::setSystemFormat() : systemFormat = %d", miSystemFormat);
}

void MediaPlayerService::openNotify() {
    qns::printLine("MediaPlayerService::openNotify");
    const auto& notification = mpMediaPlayerController->notification();
    const auto held = use();
    for (const auto& [iClientID, object] : notifyClients()) {
        qns::printFormatted("####### LOOP(%d)\n", iClientID);
        if (auto* const notify = static_cast<IMediaPlayerServiceNotify*>(object))
            notify->mediaPlayerNotify(notification);
    }
    if (notification.iNotifyResult == 0)
        mbPlayerReady = true;
}

IMediaPlayerServiceCallBack* MediaPlayerService::callbackOf(int iClientID) const {
    return static_cast<IMediaPlayerServiceCallBack*>(getCurrentMethod(iClientID));
}
