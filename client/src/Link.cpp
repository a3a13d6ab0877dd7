// SPDX-License-Identifier: MIT
#include "client/src/Link.h"

#include <algorithm>
#include <arpa/inet.h>
#include <cerrno>
#include <netinet/in.h>
#include <poll.h>
#include <sys/eventfd.h>
#include <sys/socket.h>
#include <utility>

#include "client/src/CallbackAdapter.h"
#include "define/ObjectIds.h"
#include "ptc/Event.h"
#include "ptc/LTReceiver.h"
#include "qnsmedia/Error.h"

using namespace MediaServiceDefine;

namespace qnsmedia {
namespace {

/** Objects that one process can have; a player takes two. */
constexpr long kObjectCount = 64;

template<typename Failure>
std::exception_ptr failure(const std::string& text) {
    return std::make_exception_ptr(Failure(text));
}

std::exception_ptr lostFailure(const std::string& what) {
    return failure<ConnectionLost>(what + ": the connection to the daemon is lost");
}

/** Whether another process has the port: known beforehand, so that nothing is printed. */
bool isFree(int port) {
    const qns::UniqueFd socket(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0));
    const int one = 1;
    ::setsockopt(socket.get(), SOL_SOCKET, SO_REUSEADDR, &one, sizeof one);
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    address.sin_port = htons(static_cast<uint16_t>(port));
    if (::bind(socket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) == 0)
        return true;
    if (errno == EACCES)
        throw Error("no permission to use the loopback ports 1000 to 1007");
    return false;
}

} // namespace

Link::Link(const Connection::Options& options)
    : mDeadline(options.deadline), mWakeUp(::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)) {
    takeIdentity(options);
    connectToDaemon();
    mWatcher = std::thread([this] { watch(); });
}

Link::~Link() {
    mStopping = true;
    wakeWatcher();
    if (mWatcher.joinable())
        mWatcher.join();
    mpServer.reset(); // no event is dispatched from here on
    lose();
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
    mAdapters.clear();
    for (long id = 1; id <= kObjectCount; ++id) {
        auto adapter = std::make_unique<CallbackAdapter>(id);
        mAdapters.push_back(adapter.get());
        receiver->addCBAdapter(adapter.release());
    }
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
    {
        const std::lock_guard lock(mMutex);
        if (!mLost) {
            mLostHandler = std::move(handler);
            return;
        }
    }
    handler();
}

long Link::claimObject(EventHandler handler) {
    for (CallbackAdapter* adapter : mAdapters)
        if (adapter->claim(handler))
            return adapter->getId();
    return 0;
}

void Link::releaseObject(long id) {
    for (CallbackAdapter* adapter : mAdapters)
        if (adapter->getId() == id)
            adapter->release();
}

void Link::request(const Request& request, PackedArguments& arguments, Completion completion) {
    if (await(request, std::move(completion)))
        post(request.service, request.method, arguments);
}

bool Link::await(const Request& request, Completion completion) {
    const Clock::time_point deadline = Clock::now() + request.deadline;
    {
        const std::lock_guard lock(mMutex);
        if (!mLost)
            mPending.push_back({request.replyObject, request.replyMethod, request.answers, deadline,
                                request.what, std::exchange(completion, nullptr)});
    }
    if (completion) {
        completion(lostFailure(request.what), nullptr);
        return false;
    }
    wakeWatcher();
    return true;
}

void Link::post(long service, long method, PackedArguments& arguments) {
    mpSender->send(new PTC::Event(service, method, arguments.data(),
                                  static_cast<long>(arguments.size()), true, false));
}

void Link::answer(long object, long method, ArgumentReader& arguments) {
    PendingList answered;
    {
        const std::lock_guard lock(mMutex);
        for (auto pending = mPending.begin(); pending != mPending.end();) {
            const auto next = std::next(pending);
            if (pending->object == object && pending->method == method) {
                answered.splice(answered.end(), mPending, pending);
                if (answered.front().answers == Answers::inOrder)
                    break;
            }
            pending = next;
        }
    }
    for (Pending& pending : answered) {
        ArgumentReader copy = arguments;
        if (pending.completion)
            pending.completion(nullptr, &copy);
    }
}

void Link::abandon(long object) {
    const std::lock_guard completing(mCompleting);
    PendingList abandoned;
    {
        const std::lock_guard lock(mMutex);
        for (auto pending = mPending.begin(); pending != mPending.end();) {
            const auto next = std::next(pending);
            if (pending->object == object)
                abandoned.splice(abandoned.end(), mPending, pending);
            pending = next;
        }
    }
    for (Pending& pending : abandoned)
        if (pending.completion)
            pending.completion(lostFailure(pending.what), nullptr);
}

void Link::wakeWatcher() {
    ::eventfd_write(mWakeUp.get(), 1);
}

void Link::watch() {
    while (!mStopping) {
        pollfd watched[] = {{mWakeUp.get(), POLLIN, 0}, {mpSender->socket(), POLLRDHUP, 0}};
        if (mLost)
            watched[1].fd = -1;
        ::poll(watched, 2, millisecondsToNextDeadline());
        eventfd_t wakeUps = 0;
        ::eventfd_read(mWakeUp.get(), &wakeUps);
        if ((watched[1].revents & (POLLRDHUP | POLLHUP | POLLERR)) != 0)
            lose();
        expireRequests();
    }
}

int Link::millisecondsToNextDeadline() {
    const std::lock_guard lock(mMutex);
    Clock::time_point next = Clock::time_point::max();
    for (const Pending& pending : mPending)
        if (pending.completion)
            next = std::min(next, pending.deadline);
    if (next == Clock::time_point::max())
        return -1;
    const auto left = std::chrono::ceil<std::chrono::milliseconds>(next - Clock::now());
    return static_cast<int>(std::clamp<long>(left.count(), 0, 60'000));
}

void Link::expireRequests() {
    const std::lock_guard completing(mCompleting);
    PendingList expired;
    {
        const std::lock_guard lock(mMutex);
        for (auto pending = mPending.begin(); pending != mPending.end();) {
            const auto next = std::next(pending);
            if (pending->completion && pending->deadline <= Clock::now()) {
                if (pending->answers == Answers::shared) {
                    expired.splice(expired.end(), mPending, pending);
                } else {
                    expired.push_back(*pending);
                    pending->completion = nullptr;
                }
            }
            pending = next;
        }
    }
    for (Pending& pending : expired)
        pending.completion(failure<TimedOut>(pending.what + ": the daemon gave no answer"),
                           nullptr);
}

void Link::lose() {
    const std::lock_guard completing(mCompleting);
    PendingList lost;
    std::function<void()> handler;
    {
        const std::lock_guard lock(mMutex);
        mLost = true;
        lost.swap(mPending);
        handler = std::exchange(mLostHandler, nullptr);
    }
    for (Pending& pending : lost)
        if (pending.completion)
            pending.completion(lostFailure(pending.what), nullptr);
    if (handler && !mStopping)
        handler();
}

} // namespace qnsmedia
