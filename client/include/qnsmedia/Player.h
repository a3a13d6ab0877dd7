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

/**
 * The daemon's player. There is one for all clients: what one client does, every client hears.
 *
 * Each request comes twice: it returns a future, or it takes a callback, which is called on the
 * library's thread with null when the daemon has accepted the request. A future or callback
 * carries Refused, TimedOut or ConnectionLost otherwise. "Accepted" is not "done": what comes of
 * a request is told by notifications, except where the text says more.
 *
 * Any thread may call. In callbacks and handlers, requests may be made but not waited for: the
 * answers arrive on that very thread.
 */
class QNSMEDIA_API Player {
public:
    using Callback = std::function<void(std::exception_ptr error)>;
    using StatusCallback = std::function<void(std::exception_ptr error, PlayerStatus status)>;
    using NotificationHandler = std::function<void(const PlayerNotification& notification)>;

    /** Registers with the daemon and waits for the client id. Throws as the futures do. */
    explicit Player(Connection& connection);

    /** Leaves the daemon. The medium stays as it is. Handlers have ended when it returns. */
    ~Player();

    Player(const Player&) = delete;
    Player& operator=(const Player&) = delete;

    /** The id that the daemon gave this client. */
    [[nodiscard]] int clientId() const;

    /** Who is told of notifications; replaces the one before. What it throws is dropped. */
    void onNotification(NotificationHandler handler);

    /** Warms the engine up, which takes the daemon two seconds. */
    std::future<void> initialize();
    void initialize(Callback callback);

    /** Opens a path or a URI. The daemon reads a relative path from its own folder. */
    std::future<void> open(const std::string& path);
    void open(const std::string& path, Callback callback);

    /**
     * Opens and waits for what comes of it: the medium's streams and duration, or MediaError.
     * A second call before the first has ended takes its place: the first gets TimedOut.
     */
    std::future<MediaInfo> openMedia(const std::string& path);

    std::future<void> close();
    void close(Callback callback);
    std::future<void> play();
    void play(Callback callback);
    std::future<void> pause();
    void pause(Callback callback);

    std::future<void> seek(Nanoseconds position, SeekMode mode = SeekMode::accurate);
    void seek(Nanoseconds position, SeekMode mode, Callback callback);

    /** Loops from `start` to `end` until noRepeat(); an end of -1 is the end of the medium. */
    std::future<void> repeat(Nanoseconds start, Nanoseconds end);
    void repeat(Nanoseconds start, Nanoseconds end, Callback callback);
    std::future<void> noRepeat();
    void noRepeat(Callback callback);

    /** State and position now; notReady until a medium has been opened. */
    std::future<PlayerStatus> status();
    void status(StatusCallback callback);

    /** No answer comes; the next open uses it. */
    void setSystemFormat(SystemFormat format);

    /** Ends the daemon. */
    std::future<void> powerOff();
    void powerOff(Callback callback);

private:
    class Implementation;
    std::shared_ptr<Implementation> mpImplementation;
};

} // namespace qnsmedia
