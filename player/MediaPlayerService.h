// SPDX-License-Identifier: MIT
#pragma once

#include <QObject>

#include <atomic>
#include <memory>

#include "player/IMediaPlayerService.h"
#include "player/IMediaPlayerServiceNotify.h"
#include "ptc/ClientNotify.h"

class MediaPlayerController;
struct PlayerRequest;

/**
 * Checks each request's client, leaves the parameters with the controller, tells it by a signal
 * and answers at once.
 *
 * Threads: made and destroyed on the main thread, to which the controller belongs; requests come
 * from one thread at a time, which may be another. Notifications are passed on by the thread on
 * which the engine delivers them.
 */
class MediaPlayerService : public QObject, public IMediaPlayerService, public ClientNotify {
    Q_OBJECT

public:
    MediaPlayerService();
    ~MediaPlayerService() override;

    void initializePlayer(int iClientID) override;
    void openPlayer(MediaServiceDefine::_tagFileName fileName) override;
    void closePlayer(int iClientID) override;
    void play(int iClientID) override;
    void pause(int iClientID) override;
    void seek(MediaServiceDefine::_tagSeekParam param) override;
    void getPlayerStatus(int iClientID) override;
    void setRepeat(MediaServiceDefine::_tagRepeatParam param) override;
    void powerOffMediaPlayer(int iClientID) override;
    void registerCallBack(IMediaPlayerServiceCallBack* callback) override;
    void registerNotify(_tagIMediaPlayerServiceNotify notify) override;
    void unregisterCallBack(int iClientID) override;
    void unregisterNotify(int iClientID) override;
    void setSystemFormat(MediaServiceDefine::_emMediaServiceSystemFormat format) override;

    /** The engine's format value set last: 2 or 3. For the thread that makes the requests. */
    [[nodiscard]] int systemFormat() const { return miSystemFormat; }

Q_SIGNALS:
    void initialize_signal();
    void open_signal();
    void close_signal();
    void play_signal();
    void pause_signal();
    void seek_signal();
    void getStatus_signal();
    void setRepeat_signal();
    void generateDotFile_signal();

public Q_SLOTS:
    /** Passes the controller's notification on to every notify object, lowest client id first. */
    void openNotify();

    /** Answers the client that asked for the status, if it is still registered. */
    void retPlayerStatus();

private:
    /** All requests but getPlayerStatus(): check, `store` the parameters, emit, answer. */
    template<typename Store>
    void handle(const PlayerRequest& request, int iClientID, Store store);
    void handle(const PlayerRequest& request, int iClientID);

    void emitSignal(void (MediaPlayerService::*signal)());
    void connectController();
    [[nodiscard]] IMediaPlayerServiceCallBack* callbackOf(int iClientID) const;

    std::atomic<bool> mbPlayerReady{false};
    int miSystemFormat = 2;

    /** Last, so that it ends first: until it has, its notifications come through here. */
    const std::unique_ptr<MediaPlayerController> mpMediaPlayerController;
};
