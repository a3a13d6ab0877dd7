// SPDX-License-Identifier: MIT
#include "client/src/Link.h"

#include <algorithm>
#include <cerrno>
#include <poll.h>
#include <sys/eventfd.h>
#include <sys/socket.h>

#include "define/ObjectIds.h"
#include "ptc/Barrier.h"
#include "ptc/Event.h"
#include "ptc/EventPacket.h"
#include "ptc/LTReceiver.h"
#include "ptc/LoopbackSocket.h"
#include "qnsmedia/Error.h"

using namespace MediaServiceDefine;
using std::chrono::milliseconds;

namespace qnsmedia {
namespace {

constexpr milliseconds kShortestDeadline{1};
constexpr milliseconds kLongestDeadline = std::chrono::hours(24);

template<typename Failure>
std::exception_ptr failure(const std::string& text) {
    return std::make_exception_ptr(Failure(text));
}

std::exception_ptr lost(const std::string& what) {
    return failure<ConnectionLost>(what + ": the connection to the daemon is lost");
}

std::exception_ptr overdue(const std::string& what) {
    return failure<TimedOut>(what + ": the daemon gave no answer");
}

std::exception_ptr released(const std::string& what) {
    return failure<ConnectionLost>(what + ": given up, no answer had come yet");
}

/** Whether nobody has the port: known beforehand, to tell a taken one from a forbidden one. */
bool isFree(int port) {
    const qns::UniqueFd socket(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0));
    PTC::setSocketOption(socket.get(), SOL_SOCKET, SO_REUSEADDR, 1);
    const sockaddr_in address = PTC::loopbackAddress(port);
    if (::bind(socket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0)
        return true;
    if (errno != EADDRINUSE)
        throw Error("this process may not use the loopback port " + std::to_string(port));
    return false;
}

} // namespace

Link::Link(const Connection::Options& options)
    : mDeadline(options.deadline), mWakeUp(::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)) {
    if (mDeadline < kShortestDeadline || mDeadline > kLongestDeadline)
        throw Error("a deadline is a time from 1 millisecond to 24 hours");
    if (!mWakeUp)
        throw Error("this process can open no more files");
    takeIdentity(options);
    connectToDaemon();
    mWatcher = std::thread([this] { watch(); });
}

Link::~Link() {
    mStopping = true;
    wakeWatcher();
    if (mWatcher.joinable())
        mWatcher.join();
    mpServer.reset(); // nothing is dispatched from here on
}

void Link::takeIdentity(const Connection::Options& options) {
    if (options.identity) {
        const int identity = *options.identity;
        if (identity < kFirstClientIdentity || identity > kLastClientIdentity)
            throw Error("an identity is a number from 1000 to 1007");
        if (!isFree(identity) || !startServer(identity))
            throw IdentityInUse("identity " + std::to_string(identity) +
                                " is used by another process");
        return;
    }
    for (int identity = kFirstClientIdentity; identity <= kLastClientIdentity; ++identity)
        if (isFree(identity) && startServer(identity))
            return;
    throw IdentityInUse("all identities are used by other processes");
}

bool Link::startServer(int identity) {
    auto receiver = std::make_unique<LTReceiver>(toModuleId(identity));
    mDispatcher.attach(*receiver);
    const auto quiet = [](std::string_view) {};
    auto server = std::make_unique<SocketRemoteReceiver>(kSocketReceiverId, quiet);
    server->addReceiver(receiver.release());
    if (!server->initialize(identity))
        return false;
    mpServer = std::move(server);
    mIdentity = identity;
    return true;
}

void Link::connectToDaemon() {
    mpSender = std::make_unique<SocketRemoteSender>(kThreadedReceiverId);
    if (!mpSender->initialize(kServiceIdentity))
        throw DaemonNotRunning("the daemon is not running (nobody listens at 127.0.0.1:" +
                               std::to_string(kServiceIdentity) + ")");
}

void Link::onLost(std::function<void()> handler) {
    const std::lock_guard lock(mMutex);
    mLostHandler = std::move(handler);
    if (mLost && mLostHandler)
        mDispatcher.post(0,
                         [this, tell = std::exchange(mLostHandler, nullptr)] { callUser(tell); });
}

void Link::onError(std::function<void(std::exception_ptr)> handler) {
    const std::lock_guard lock(mMutex);
    mErrorHandler = std::move(handler);
}

long Link::claimObject(Dispatcher::EventHandler handler) {
    return mDispatcher.claimObject(std::move(handler));
}

void Link::releaseObject(long id) {
    {
        const std::lock_guard failing(mFailing);
        failAll(mPending.takeObject(id), released);
    }
    mDispatcher.releaseObject(id);
}

void Link::request(const Request& request, PackedArguments& arguments, Completion completion) {
    if (arguments.size() > static_cast<uint64_t>(PTC::kMaxPayloadSize))
        return fail(request.replyObject, std::move(completion),
                    failure<Error>(request.what + ": the text is too long for a request"));
    const auto [ticket, isServed] = add(request, std::move(completion));
    if (ticket != 0 && !isServed)
        post(request.service, request.method, arguments);
}

long Link::await(const Request& request, Completion completion) {
    return add(request, std::move(completion)).ticket;
}

PendingRequests::Added Link::add(const Request& request, Completion completion) {
    const auto deadline = Clock::now() + mDeadline + request.extraTime;
    PendingRequest pending;
    pending.object = request.replyObject;
    pending.method = request.replyMethod;
    pending.answers = request.answers;
    pending.deadline = deadline;
    pending.what = request.what;
    pending.completion = std::move(completion);
    const auto added = mPending.add(pending);
    if (added.ticket != 0)
        wakeWatcherBefore(deadline);
    else
        fail(request.replyObject, std::move(pending.completion), lost(request.what));
    return added;
}

void Link::post(long service, long method, PackedArguments& arguments) {
    mpSender->send(new PTC::Event(service, method, arguments.data(),
                                  static_cast<long>(arguments.size()), true, false));
}

void Link::answer(long object, long method, const ArgumentReader& arguments) {
    for (const PendingRequest& request : mPending.takeAnswered(object, method)) {
        ArgumentReader copy = arguments;
        request.completion.tell(nullptr, &copy);
    }
}

void Link::answerTicket(long ticket, const ArgumentReader& arguments) {
    for (const PendingRequest& request : mPending.takeTicket(ticket)) {
        ArgumentReader copy = arguments;
        request.completion.tell(nullptr, &copy);
    }
}

void Link::failTicket(long ticket, std::exception_ptr error) {
    const std::lock_guard failing(mFailing);
    for (PendingRequest& request : mPending.takeTicket(ticket))
        fail(request.object, std::move(request.completion), error);
}

void Link::fail(long object, Completion completion, std::exception_ptr error) {
    if (!completion.callsUser) {
        completion.tell(error, nullptr);
        return;
    }
    mDispatcher.post(object, [tell = std::move(completion.tell), error] { tell(error, nullptr); });
}

void Link::failAll(PendingRequests::List requests,
                   std::exception_ptr (*error)(const std::string&)) {
    for (PendingRequest& request : requests)
        fail(request.object, std::move(request.completion), error(request.what));
}

void Link::wakeWatcher() {
    ::eventfd_write(mWakeUp.get(), 1);
}

/** Most deadlines are later than one that it waits for already, and cost nothing. */
void Link::wakeWatcherBefore(Clock::time_point deadline) {
    if (deadline < mWatcherWakes.load())
        wakeWatcher();
}

void Link::watch() {
    while (!mStopping) {
        pollfd watched[] = {{mWakeUp.get(), POLLIN, 0},
                            {mLost ? -1 : mpSender->socket(), POLLRDHUP, 0}};
        ::poll(watched, 2, millisecondsToNextDeadline());
        eventfd_t wakeUps = 0;
        ::eventfd_read(mWakeUp.get(), &wakeUps);
        PTC::barrier([&] {
            if (watched[1].revents != 0)
                lose();
            expireRequests();
        });
    }
}

int Link::millisecondsToNextDeadline() {
    // First: a request that comes while the next one is looked for wakes in any case.
    mWatcherWakes = Clock::time_point::max();
    const std::optional<Clock::time_point> next = mPending.nextDeadline();
    if (!next)
        return -1;
    mWatcherWakes = *next;
    const auto left = std::chrono::ceil<milliseconds>(*next - Clock::now());
    return static_cast<int>(std::clamp<long>(left.count(), 0, 60'000));
}

void Link::expireRequests() {
    const std::lock_guard failing(mFailing);
    failAll(mPending.takeOverdue(Clock::now()), overdue);
}

void Link::lose() {
    {
        const std::lock_guard lock(mMutex);
        mLost = true;
    }
    const std::lock_guard failing(mFailing);
    failAll(mPending.close(), lost);
    const std::lock_guard lock(mMutex);
    if (mLostHandler)
        mDispatcher.post(0,
                         [this, tell = std::exchange(mLostHandler, nullptr)] { callUser(tell); });
}

void Link::reportError(std::exception_ptr error) noexcept {
    PTC::barrier([&] {
        std::function<void(std::exception_ptr)> handler;
        {
            const std::lock_guard lock(mMutex);
            handler = mErrorHandler;
        }
        if (handler)
            handler(error);
    });
}

ObjectClaim::ObjectClaim(std::shared_ptr<Link> link, Dispatcher::EventHandler handler)
    : mpLink(std::move(link)), mId(mpLink->claimObject(std::move(handler))) {
    if (mId == 0)
        throw Error("too many players and the like on one connection");
}

} // namespace qnsmedia
