// SPDX-License-Identifier: MIT
#pragma once

#include <exception>
#include <functional>
#include <future>
#include <memory>
#include <string>

#include "qnsmedia/Connection.h"
#include "qnsmedia/Types.h"

namespace qnsmedia {

class PlayerClient;

/**
 * The daemon's player. There is one for all clients: what one client does, every client hears.
 *
 * Each request comes twice: it returns a future, or it takes a callback, which is called once,
 * with null when the daemon has accepted the request. Otherwise the future or the callback
 * carries Refused, TimedOut, ConnectionLost or Error. "Accepted" is not "done": what comes of a
 * request is told by notifications, except where the text says more.
 *
 * Any thread may call; see Connection for the thread that calls back.
 */
class QNSMEDIA_API Player {
public:
    using Callback = std::function<void(std::exception_ptr error)>;
    using MediaCallback = std::function<void(std::exception_ptr error, MediaInfo media)>;
    using StatusCallback = std::function<void(std::exception_ptr error, PlayerStatus status)>;
    using NotificationHandler = std::function<void(const PlayerNotification& notification)>;

    /**
     * Registers with the daemon and waits until it has given an id. Throws as the futures do.
     * A daemon that was not started with --reconnect-clients connects to each identity only once
     * in its life; a process that uses an identity after another one gets no answer, and TimedOut.
     */
    explicit Player(Connection& connection);

    /**
     * Leaves the daemon. The medium stays as it is. What still waits for an answer is told
     * ConnectionLost, callbacks on this thread. No handler runs when it has returned.
     */
    ~Player();

    Player(const Player&) = delete;
    Player& operator=(const Player&) = delete;

    /** The id that the daemon gave this client: 1 or above. */
    [[nodiscard]] int clientId() const;

    /** Who is told of notifications from now on; replaces the one before. */
    void onNotification(NotificationHandler handler);

    /** Warms the engine up. The daemon does nothing else for two seconds. */
    std::future<void> initialize();
    void initialize(Callback callback);

    /** Opens a path or a URI. The daemon reads a relative path from its own folder. */
    std::future<void> open(const std::string& path);
    void open(const std::string& path, Callback callback);

    /**
     * Opens, and waits for what comes of it: the medium's streams and duration, or MediaError.
     * An open of this player that takes the place of another ends that with MediaError 6. A
     * failure does not say of which medium: when another client opens something at the same
     * time, its failure is taken for this one's.
     */
    std::future<MediaInfo> openMedia(const std::string& path);
    void openMedia(const std::string& path, MediaCallback callback);

    std::future<void> close();
    void close(Callback callback);
    std::future<void> play();
    void play(Callback callback);
    /** The daemon accepts this one always. */
    std::future<void> pause();
    void pause(Callback callback);

    std::future<void> seek(Nanoseconds position, SeekMode mode = SeekMode::accurate);
    void seek(Nanoseconds position, SeekMode mode, Callback callback);

    /** Loops from `start` to `end` until noRepeat(); an end of -1 is the end of the medium. */
    std::future<void> repeat(Nanoseconds start, Nanoseconds end);
    void repeat(Nanoseconds start, Nanoseconds end, Callback callback);
    std::future<void> noRepeat();
    void noRepeat(Callback callback);

    /**
     * State and position now; notReady until a medium has been opened. When several requests
     * wait, one answer serves them all. When two clients ask at the same time, the daemon may
     * give both answers to one of them; the other gets TimedOut.
     */
    std::future<PlayerStatus> status();
    void status(StatusCallback callback);

    /** Used by the next open. No answer comes, so nothing tells that it has arrived. */
    void setSystemFormat(SystemFormat format);

    /** Ends the daemon, for all clients. */
    std::future<void> powerOff();
    void powerOff(Callback callback);

private:
    std::unique_ptr<PlayerClient> mpClient;
};

} // namespace qnsmedia
