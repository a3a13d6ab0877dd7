// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <chrono>
#include <exception>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <thread>
#include <utility>

#include "base/UniqueFd.h"
#include "client/src/Dispatcher.h"
#include "client/src/PendingRequests.h"
#include "pack/PackedArguments.h"
#include "ptc/SocketRemoteReceiver.h"
#include "ptc/SocketRemoteSender.h"
#include "qnsmedia/Connection.h"

namespace qnsmedia {

/**
 * What a connection is made of: the server that the daemon connects back to, the sender to the
 * daemon, the requests that wait for answers, and a thread that watches deadlines and the
 * daemon's end. Any thread may use it.
 *
 * Completions that call the user run on the dispatching thread; the others, which keep the
 * promise of a future, on whichever thread knows first: so a handler that waits for a future,
 * which it must not, gets TimedOut instead of waiting for ever.
 */
class Link {
public:
    struct Request {
        long service = 0; ///< object id of the service
        long method = 0;
        long replyObject = 0;
        long replyMethod = 0;
        Answers answers = Answers::inOrder;
        std::chrono::milliseconds extraTime{}; ///< beyond the connection's deadline
        std::string what;                      ///< for error texts, such as "play"
    };

    explicit Link(const Connection::Options& options);
    ~Link();
    Link(const Link&) = delete;
    Link& operator=(const Link&) = delete;

    [[nodiscard]] int identity() const { return mIdentity; }
    [[nodiscard]] bool alive() const { return !mLost; }
    void onLost(std::function<void()> handler);
    void onError(std::function<void(std::exception_ptr)> handler);

    /** Gives an object id to `handler`; 0 when there are too many. */
    long claimObject(Dispatcher::EventHandler handler);

    /** Fails what waits for answers to the object; nothing of it runs when this has returned. */
    void releaseObject(long id);

    void request(const Request& request, PackedArguments& arguments, Completion completion);

    /** Waits for an answer without sending anything. Returns a ticket; 0 when it failed at once. */
    long await(const Request& request, Completion completion);

    /** Sends a request that has no answer. */
    void post(long service, long method, PackedArguments& arguments);

    /** Completes what `method` of `object` answers. On the dispatching thread. */
    void answer(long object, long method, const ArgumentReader& arguments);

    /** Completes what a ticket stands for, if it still waits. On the dispatching thread. */
    void answerTicket(long ticket, const ArgumentReader& arguments);
    /** From any thread. */
    void failTicket(long ticket, std::exception_ptr error);

    /** Tells a completion that nothing waits for yet. From any thread. */
    void fail(long object, Completion completion, std::exception_ptr error);

    /** Calls the user's code; what that throws goes to the error handler. */
    template<typename Call>
    void callUser(Call&& call) noexcept {
        try {
            std::forward<Call>(call)();
        } catch (...) {
            reportError(std::current_exception());
        }
    }

private:
    PendingRequests::Added add(const Request& request, Completion completion);
    void takeIdentity(const Connection::Options& options);
    bool startServer(int identity);
    void connectToDaemon();

    void watch();
    void wakeWatcher();
    void wakeWatcherBefore(Clock::time_point deadline);
    int millisecondsToNextDeadline();
    void expireRequests();
    void lose();

    void failAll(PendingRequests::List requests, std::exception_ptr (*error)(const std::string&));
    void reportError(std::exception_ptr error) noexcept;

    const std::chrono::milliseconds mDeadline;
    int mIdentity = 0;
    Dispatcher mDispatcher;
    std::unique_ptr<SocketRemoteReceiver> mpServer;
    std::unique_ptr<SocketRemoteSender> mpSender;
    PendingRequests mPending;

    /**
     * Held from when requests are taken to be failed until that is told or posted, so that
     * releaseObject() misses none. Recursive, since one failure may bring another.
     */
    std::recursive_mutex mFailing;

    std::atomic<bool> mLost{false};
    std::atomic<bool> mStopping{false};
    qns::UniqueFd mWakeUp;
    std::atomic<Clock::time_point> mWatcherWakes{Clock::time_point::max()}; ///< by itself

    std::mutex mMutex; ///< guards the handlers, and the order of loss and of mLostHandler
    std::function<void()> mLostHandler;
    std::function<void(std::exception_ptr)> mErrorHandler;

    std::thread mWatcher; ///< last: uses all of the above
};

/** An object of this process that the daemon can call, for as long as this claim lives. */
class ObjectClaim {
public:
    /** Throws Error when there are too many. */
    ObjectClaim(std::shared_ptr<Link> link, Dispatcher::EventHandler handler);
    ~ObjectClaim() { mpLink->releaseObject(mId); }
    ObjectClaim(const ObjectClaim&) = delete;
    ObjectClaim& operator=(const ObjectClaim&) = delete;

    [[nodiscard]] long id() const { return mId; }

private:
    std::shared_ptr<Link> mpLink;
    long mId;
};

} // namespace qnsmedia
