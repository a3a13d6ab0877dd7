// SPDX-License-Identifier: MIT
#include "tests/client/support/FakeDaemon.h"

#include <algorithm>
#include <array>
#include <netinet/in.h>
#include <netinet/tcp.h>
#include <poll.h>
#include <sys/eventfd.h>
#include <sys/socket.h>
#include <utility>

#include <gtest/gtest.h>

#include "tests/daemon/support/ImporterClient.h"

namespace {

constexpr std::size_t kInt64Size = 9;

/** The callback that gives a client its id, in all services. */
constexpr long kSetClientId = 1;

qns::UniqueFd connectTo(std::int64_t port) {
    qns::UniqueFd socket(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0));
    sockaddr_in address{};
    address.sin_family = AF_INET;
    address.sin_port = htons(static_cast<std::uint16_t>(port));
    address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
    EXPECT_EQ(::connect(socket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)),
              0);
    const int on = 1;
    ::setsockopt(socket.get(), IPPROTO_TCP, TCP_NODELAY, &on, sizeof(on));
    return socket;
}

bool isEnded(int socket) {
    pollfd poll{socket, POLLRDHUP, 0};
    return ::poll(&poll, 1, 0) == 1;
}

std::size_t clientId(const wire::Packet& request) {
    return static_cast<std::size_t>(wire::readInt32(request.payload.substr(0, 5)));
}

} // namespace

FakeService FakeService::player() {
    const wire::Bytes accepted = wire::int32(0);
    return {
        62,
        request::kRegisterCallBack,
        request::kRegisterNotify,
        {{request::kInitializePlayer, {callback::kInitializePlayer, accepted}},
         {request::kOpenPlayer, {callback::kOpenPlayer, accepted}},
         {request::kClosePlayer, {callback::kClosePlayer, accepted}},
         {request::kPlay, {callback::kPlay, accepted}},
         {request::kPause, {callback::kPause, accepted}},
         {request::kSeek, {callback::kSeek, accepted}},
         {request::kGetPlayerStatus, {callback::kGetPlayerStatus, encode(PlayerStatus{})}},
         {request::kSetRepeat, {callback::kSetRepeat, accepted}},
         {request::kPowerOffMediaPlayer, {callback::kPowerOffMediaPlayer, wire::Bytes(4, '\0')}}}};
}

FakeService FakeService::importer() {
    const wire::Bytes accepted = wire::int32(0);
    return {56,
            importer::kRegister,
            importer::kRegisterNotify,
            {{importer::kInitialize, {importer::kInitializeCallBack, accepted}},
             {importer::kImport, {importer::kImportCallBack, accepted}},
             {importer::kCancel, {importer::kCancelCallBack, accepted}},
             {importer::kGetStatus, {importer::kStatusCallBack, importer::status(0, 0, 0)}}}};
}

FakeDaemon::FakeDaemon(FakeService service)
    : mService(std::move(service)),
      mWakeUp(::eventfd(0, EFD_CLOEXEC)),
      mListener(listenOn(kDaemonPort)) {
    mThread = std::thread([this] { run(); });
}

FakeDaemon::~FakeDaemon() {
    die();
}

void FakeDaemon::on(long method, Reaction reaction) {
    const std::lock_guard lock(mMutex);
    mReactions[method] = std::move(reaction);
}

void FakeDaemon::reply(const wire::Packet& request, long callback, const wire::Bytes& payload) {
    const std::lock_guard lock(mMutex);
    const Client client = mClients.at(clientId(request) - 1);
    sendTo(client, client.callbackObject, callback, payload);
}

void FakeDaemon::callBack(long callback, const wire::Bytes& payload) {
    const Client client = lastClient();
    sendTo(client, client.callbackObject, callback, payload);
}

void FakeDaemon::notify(const wire::Bytes& payload) {
    std::unique_lock lock(mMutex);
    const auto listens = [](const Client& client) { return client.notifyObject != 0; };
    const auto last = [&] { return std::find_if(mClients.rbegin(), mClients.rend(), listens); };
    const auto isThere = [&] { return last() != mClients.rend(); };
    ASSERT_TRUE(mChanged.wait_until(lock, patience::deadline(), isThere)) << "No notify object";
    sendTo(*last(), last()->notifyObject, 1, payload);
}

void FakeDaemon::sendBytes(std::string_view bytes) {
    write(lastClient().identity, bytes);
}

std::int64_t FakeDaemon::callbackObject() const {
    return lastClient().callbackObject;
}

std::int64_t FakeDaemon::receiver() const {
    return receiverOf(lastClient().identity);
}

std::optional<wire::Packet> FakeDaemon::waitForRequest(long method) {
    std::unique_lock lock(mMutex);
    std::optional<wire::Packet> found;
    mChanged.wait_until(lock, patience::deadline(), [&] {
        while (!found && !mRequests.empty()) {
            if (mRequests.front().method == method)
                found = mRequests.front();
            mRequests.pop_front();
        }
        return found.has_value();
    });
    return found;
}

bool FakeDaemon::hasRequest(long method) const {
    const std::lock_guard lock(mMutex);
    return std::any_of(mRequests.begin(), mRequests.end(),
                       [=](const wire::Packet& request) { return request.method == method; });
}

void FakeDaemon::die() {
    {
        const std::lock_guard lock(mMutex);
        mDying = true;
    }
    ::eventfd_write(mWakeUp.get(), 1);
    if (mThread.joinable())
        mThread.join();
    const std::lock_guard lock(mMutex);
    mListener.reset();
    mIncoming.clear();
    mOutgoing.clear();
}

void FakeDaemon::run() {
    while (true) {
        std::vector<pollfd> polls{{mWakeUp.get(), POLLIN, 0}, {mListener.get(), POLLIN, 0}};
        for (const Incoming& incoming : mIncoming)
            polls.push_back({incoming.socket.get(), POLLIN, 0});
        ::poll(polls.data(), polls.size(), -1);
        if (polls[0].revents != 0)
            return;
        std::size_t index = 2;
        for (Incoming& incoming : mIncoming)
            if (polls[index++].revents != 0)
                serve(incoming);
        mIncoming.remove_if([](const Incoming& incoming) { return !incoming.socket; });
        if (polls[1].revents != 0)
            mIncoming.push_back(
                {qns::UniqueFd(::accept4(mListener.get(), nullptr, nullptr, SOCK_CLOEXEC)), {}});
    }
}

void FakeDaemon::serve(Incoming& incoming) {
    std::array<char, wire::kPacketSize> buffer{};
    const auto count = ::recv(incoming.socket.get(), buffer.data(), buffer.size(), MSG_DONTWAIT);
    if (count <= 0)
        return incoming.socket.reset();
    ::send(incoming.socket.get(), wire::kAcknowledgement.data(), wire::kAcknowledgement.size(),
           MSG_NOSIGNAL);
    incoming.received.append(buffer.data(), static_cast<std::size_t>(count));
    while (incoming.received.size() >= wire::kPacketSize) {
        handle(wire::fromBytes(incoming.received.substr(0, wire::kPacketSize)));
        incoming.received.erase(0, wire::kPacketSize);
    }
}

void FakeDaemon::handle(const wire::Packet& request) {
    EXPECT_EQ(request.receiver, 8);
    EXPECT_EQ(request.object, mService.object);
    EXPECT_FALSE(request.callback);
    EXPECT_TRUE(request.remote);
    react(request);
    const std::lock_guard lock(mMutex);
    mRequests.push_back(request);
    mChanged.notify_all();
}

void FakeDaemon::react(const wire::Packet& request) {
    const std::lock_guard lock(mMutex);
    const auto ordered = mReactions.find(request.method);
    if (ordered != mReactions.end()) {
        if (ordered->second)
            ordered->second(request);
        return;
    }
    const auto answer = mService.answers.find(request.method);
    if (request.method == mService.registerCallBack)
        registerCallBack(request);
    else if (request.method == mService.registerNotify)
        registerNotify(request);
    else if (answer != mService.answers.end())
        reply(request, answer->second.callback, answer->second.payload);
}

void FakeDaemon::registerCallBack(const wire::Packet& request) {
    Client client;
    client.callbackObject = wire::readInt64(request.payload, 0);
    client.identity = wire::readInt64(request.payload, kInt64Size);
    qns::UniqueFd& outgoing = mOutgoing[client.identity];
    if (!outgoing || isEnded(outgoing.get()))
        outgoing = connectTo(client.identity);
    mClients.push_back(client);
    sendTo(client, client.callbackObject, kSetClientId,
           wire::int32(static_cast<std::int32_t>(mClients.size())));
}

void FakeDaemon::registerNotify(const wire::Packet& request) {
    const auto id =
        static_cast<std::size_t>(wire::readInt32(request.payload.substr(2 * kInt64Size)));
    EXPECT_EQ(wire::readInt64(request.payload, kInt64Size), mClients.at(id - 1).identity);
    mClients.at(id - 1).notifyObject = wire::readInt64(request.payload, 0);
    mChanged.notify_all();
}

void FakeDaemon::sendTo(const Client& client, std::int64_t object, long method,
                        const wire::Bytes& payload) {
    write(client.identity,
          wire::toBytes({receiverOf(client.identity), object, method, true, true, payload}));
}

void FakeDaemon::write(std::int64_t identity, std::string_view bytes) {
    const std::lock_guard lock(mMutex);
    const int socket = mOutgoing[identity].get();
    while (!bytes.empty()) {
        const auto count = ::send(socket, bytes.data(), bytes.size(), MSG_NOSIGNAL);
        if (count <= 0)
            return;
        bytes.remove_prefix(static_cast<std::size_t>(count));
    }
}

FakeDaemon::Client FakeDaemon::lastClient() const {
    const std::lock_guard lock(mMutex);
    if (mClients.empty()) {
        ADD_FAILURE() << "No client has registered";
        return {};
    }
    return mClients.back();
}
