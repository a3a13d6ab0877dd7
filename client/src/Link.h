// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <chrono>
#include <exception>
#include <functional>
#include <list>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <utility>

#include "base/UniqueFd.h"
#include "pack/ArgumentReader.h"
#include "pack/PackedArguments.h"
#include "ptc/SocketRemoteReceiver.h"
#include "ptc/SocketRemoteSender.h"
#include "qnsmedia/Connection.h"

namespace qnsmedia {

class CallbackAdapter;

/**
 * What a connection is made of: the server that the daemon connects back to, the sender to the
 * daemon, the requests that wait for answers, and a thread that watches deadlines and the
 * daemon's end. Any thread may call it.
 */
class Link {
public:
    using Clock = std::chrono::steady_clock;

    /** Takes an event's method and arguments on the dispatching thread. */
    using EventHandler = std::function<void(long method, ArgumentReader& arguments)>;

    /** Told once: an error, or null and the answer's arguments. */
    using Completion = std::function<void(std::exception_ptr error, ArgumentReader* answer)>;

    /** Which answers belong to a kind of request. */
    enum class Answers {
        inOrder, ///< one each, in the order of the requests
        shared   ///< one answer serves all that wait: it tells how things are now
    };

    struct Request {
        long service = 0; ///< object id of the service
        long method = 0;
        long replyObject = 0;
        long replyMethod = 0;
        Answers answers = Answers::inOrder;
        std::chrono::milliseconds deadline{};
        std::string what; ///< for error texts, such as "play"
    };

    explicit Link(const Connection::Options& options);
    ~Link();

    [[nodiscard]] int identity() const { return mIdentity; }
    [[nodiscard]] std::chrono::milliseconds deadline() const { return mDeadline; }
    [[nodiscard]] bool alive() const { return !mLost; }
    void onLost(std::function<void()> handler);

    /** Gives an object id to `handler`; 0 when there are too many. */
    long claimObject(EventHandler handler);
    /** Waits for a running handler, unless it is the caller. */
    void releaseObject(long id);

    void request(const Request& request, PackedArguments& arguments, Completion completion);

    /** Waits for an answer without sending anything; false when the connection is lost. */
    bool await(const Request& request, Completion completion);

    /** Sends a request that has no answer. */
    void post(long service, long method, PackedArguments& arguments);

    /** Completes the request that `method` of `object` answers. */
    void answer(long object, long method, ArgumentReader& arguments);

    /** Fails what still waits for answers to `object`; waits for completions on other threads. */
    void abandon(long object);

private:
    struct Pending {
        long object;
        long method;
        Answers answers;
        Clock::time_point deadline;
        std::string what;
        Completion completion; ///< empty once told: the late answer is still this one's
    };
    using PendingList = std::list<Pending>;

    void takeIdentity(const Connection::Options& options);
    bool startServer(int identity);
    void connectToDaemon();

    void watch();
    void wakeWatcher();
    int millisecondsToNextDeadline();
    void expireRequests();
    void lose();

    std::chrono::milliseconds mDeadline;
    int mIdentity = 0;
    std::list<CallbackAdapter*> mAdapters; ///< owned by the receiver
    std::unique_ptr<SocketRemoteReceiver> mpServer;
    std::unique_ptr<SocketRemoteSender> mpSender;

    std::atomic<bool> mLost{false};
    std::atomic<bool> mStopping{false};
    qns::UniqueFd mWakeUp;

    /** Held while the watcher completes requests; recursive, so that a completion may abandon. */
    std::recursive_mutex mCompleting;
    std::mutex mMutex; ///< guards the next two
    PendingList mPending;
    std::function<void()> mLostHandler;

    std::thread mWatcher; ///< last: uses all of the above
};

/** An object of this process that the daemon can call, for as long as this claim lives. */
class ObjectClaim {
public:
    ObjectClaim(std::shared_ptr<Link> link, Link::EventHandler handler)
        : mpLink(std::move(link)), mId(mpLink->claimObject(std::move(handler))) {}
    ~ObjectClaim() { mpLink->releaseObject(mId); }
    ObjectClaim(const ObjectClaim&) = delete;
    ObjectClaim& operator=(const ObjectClaim&) = delete;

    /** 0 when there are too many. */
    [[nodiscard]] long id() const { return mId; }

private:
    std::shared_ptr<Link> mpLink;
    long mId;
};

} // namespace qnsmedia
