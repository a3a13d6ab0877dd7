// SPDX-License-Identifier: MIT
#pragma once

#include <QObject>

#include <cstdint>
#include <memory>
#include <mutex>
#include <string>

#include "define/PlayerDefine.h"

namespace LibMediaPlayer {
class IMediaPlayer;
struct MediaPlayerNotify;
} // namespace LibMediaPlayer

/**
 * Owns the engine's player and makes every call to it, on the main thread.
 *
 * A request is a setter, called on any thread, and then a queued signal to the slot, which reads
 * what was set last: of two requests of the same kind that come before the slot has run, both
 * use the later values.
 *
 * The slots return what the engine answered, or -1 when there is no player.
 */
class MediaPlayerController : public QObject {
    Q_OBJECT

public:
    /** A status, and the client that asked for it. */
    struct StatusAnswer {
        int iClientID;
        MediaServiceDefine::_tagMediaPlayerStatus status;
    };

    MediaPlayerController();

    /** Notifications may arrive, and are passed on, until it has ended. */
    ~MediaPlayerController() override;

    void setFileName(std::wstring fileName);
    void setFormat(int format);

    /** Does not take over `bSeekOption`. */
    void setSeekParam(const MediaServiceDefine::_tagSeekParam& param);
    void setStatusClientID(int iClientID);
    void setRepeatParam(const MediaServiceDefine::_tagRepeatParam& param);

    /** The result of the last getStatus(). Any thread may call it. */
    [[nodiscard]] StatusAnswer statusAnswer() const;

    /** What openNotify_signal() is about. Call it only from a slot that runs inside the signal. */
    [[nodiscard]] const MediaServiceDefine::_tagMediaPlayerNotify& notification() const;

    /** Takes a notification of the engine, on any thread; several threads wait for each other. */
    void openNotify(LibMediaPlayer::MediaPlayerNotify& notify);

Q_SIGNALS:
    void openNotify_signal();
    void retPlayerStatus_signal();

public Q_SLOTS:
    /** Opens and closes a black picture. Blocks for two seconds. Returns 0 in any case. */
    int32_t initialize();
    int32_t open();
    int32_t close();
    int32_t play();
    int32_t pause();
    int32_t seek();

    /** Ends with retPlayerStatus_signal(). */
    int32_t getStatus();
    int32_t setRepeat();
    int32_t generateDotFile();

private:
    int openInPlayer(const std::wstring& fileName);
    int closeInPlayer();

    /** A parameter as it was set last. */
    template<typename T>
    [[nodiscard]] T copyOf(const T& parameter) const {
        const std::lock_guard lock(mMutex);
        return parameter;
    }

    void passOn(const LibMediaPlayer::MediaPlayerNotify& notify);

    mutable std::mutex mMutex; ///< guards the parameters and the status
    std::wstring mFileName;
    int mFormat = 2; ///< 60 Hz
    MediaServiceDefine::_tagSeekParam mSeekParam;
    int mStatusClientID = -1;
    MediaServiceDefine::_tagMediaPlayerStatus mStatus{-1, 0, 0, 0};
    MediaServiceDefine::_tagRepeatParam mRepeatParam;

    const std::wstring mDotFileName; ///< for use in a debugger

    std::mutex mNotifyMutex; ///< held while a notification is stored and passed on
    MediaServiceDefine::_tagMediaPlayerNotify mNotification; ///< guarded by mNotifyMutex

    /** Last, so that it ends first: its threads may notify until then. */
    std::unique_ptr<LibMediaPlayer::IMediaPlayer> mpPlayer;
};
