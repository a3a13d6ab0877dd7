// SPDX-License-Identifier: MIT
#include "fuzz/support/Daemon.h"

#include <algorithm>
#include <cstring>
#include <iterator>
#include <poll.h>
#include <sys/eventfd.h>
#include <sys/socket.h>

#include "define/DiscovererMethods.h"
#include "define/ImporterMethods.h"
#include "define/ObjectIds.h"
#include "define/PlayerMethods.h"
#include "fuzz/support/Require.h"
#include "pack/ArgumentReader.h"
#include "pack/PackedArguments.h"
#include "ptc/LoopbackSocket.h"

using namespace MediaServiceDefine;

namespace fuzz {

namespace {

/** How clients register their objects. */
struct Registration {
    template<typename Method>
    constexpr Registration(std::size_t which, long service, Method number)
        : kind(which), object(service), method(static_cast<long>(number)) {}

    std::size_t kind;
    long object;
    long method;
};

constexpr Registration kRegistrations[] = {
    {Daemon::kPlayer, kPlayerAdapterId, PlayerMethod::registerCallBack},
    {Daemon::kPlayerNotify, kPlayerAdapterId, PlayerMethod::registerNotify},
    {Daemon::kDiscoverer, kDiscovererAdapterId, DiscovererMethod::registerCallBack},
    {Daemon::kImporter, kImporterAdapterId, ImporterMethod::registerCallBack},
    {Daemon::kImporterNotify, kImporterAdapterId, ImporterMethod::registerNotify},
};

qns::UniqueFd listenOn(long port) {
    qns::UniqueFd socket(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0));
    PTC::setSocketOption(socket.get(), SOL_SOCKET, SO_REUSEADDR, 1);
    const auto address = PTC::loopbackAddress(port);
    require(::bind(socket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)) ==
            0);
    require(::listen(socket.get(), 1) == 0);
    return socket;
}

qns::UniqueFd connectTo(long port) {
    qns::UniqueFd socket(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0));
    const auto address = PTC::loopbackAddress(port);
    require(::connect(socket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)) ==
            0);
    PTC::disableDelay(socket.get());
    return socket;
}

/** A client that waits for room for its acknowledgements would read nothing. */
void dropAcknowledgements(int socket) {
    std::array<char, 4096> dropped;
    while (::recv(socket, dropped.data(), dropped.size(), MSG_DONTWAIT) > 0)
        continue;
}

} // namespace

Daemon::Daemon() : mListener(listenOn(kServiceIdentity)), mWakeUp(::eventfd(0, EFD_CLOEXEC)) {
    mThread = std::thread([this] { run(); });
}

Daemon::~Daemon() {
    ::eventfd_write(mWakeUp.get(), 1);
    mThread.join();
}

long Daemon::object(std::size_t kind) const {
    const std::lock_guard lock(mMutex);
    return mObjects.at(kind);
}

void Daemon::answerStatusOf(int clientId) {
    const std::lock_guard lock(mMutex);
    mAnsweredId = clientId;
    mAnsweredObject = mObjects[kPlayer];
}

void Daemon::send(const PTC::EventPacket& header, const std::string& payload) {
    std::array<char, PTC::kPacketSize> packet{};
    std::memcpy(packet.data(), &header, sizeof(header));
    payload.copy(packet.data() + sizeof(header), packet.size() - sizeof(header));
    const std::lock_guard lock(mMutex);
    dropAcknowledgements(mToClient.get());
    require(::send(mToClient.get(), packet.data(), packet.size(), MSG_NOSIGNAL) ==
            static_cast<ssize_t>(packet.size()));
}

void Daemon::run() {
    const qns::UniqueFd client(::accept4(mListener.get(), nullptr, nullptr, SOCK_CLOEXEC));
    for (;;) {
        std::array<pollfd, 2> sources{{{mWakeUp.get(), POLLIN, 0}, {client.get(), POLLIN, 0}}};
        ::poll(sources.data(), sources.size(), -1);
        if (sources[0].revents != 0 || !read(client.get()))
            return;
    }
}

bool Daemon::read(int socket) {
    std::array<char, PTC::kPacketSize> buffer;
    const auto count = ::recv(socket, buffer.data(), buffer.size(), 0);
    if (count <= 0)
        return false;
    ::send(socket, PTC::kAcknowledgement, sizeof(PTC::kAcknowledgement), MSG_NOSIGNAL);
    mReceived.append(buffer.data(), static_cast<std::size_t>(count));
    if (mReceived.size() >= PTC::kPacketSize) {
        take(mReceived.data());
        mReceived.erase(0, PTC::kPacketSize);
    }
    return true;
}

void Daemon::take(const char* packet) {
    PTC::EventPacket header{};
    std::memcpy(&header, packet, sizeof(header));
    const char* const payload = packet + sizeof(header);
    const auto* const registration = std::find_if(
        std::begin(kRegistrations), std::end(kRegistrations), [&](const Registration& row) {
            return row.object == header.objectId && row.method == header.methodId;
        });
    const std::lock_guard lock(mMutex);
    if (registration != std::end(kRegistrations))
        registerObject(registration->kind, header, payload);
    else
        answerStatus(header, payload);
}

void Daemon::registerObject(std::size_t kind, const PTC::EventPacket& header, const char* payload) {
    ArgumentReader reader(payload, header.size);
    reader.read(mObjects.at(kind));
    reader.read(mIdentity);
    if (!mToClient)
        mToClient = connectTo(mIdentity);
    if (kind != kPlayerNotify && kind != kImporterNotify)
        giveId(mObjects.at(kind));
}

void Daemon::giveId(long object) {
    constexpr long kSetClientId = 1; // of all services
    PackedArguments arguments;
    arguments.int32(++mLastId);
    PTC::EventPacket header{};
    header.receiverId = toModuleId(mIdentity);
    header.objectId = object;
    header.methodId = kSetClientId;
    header.isCallback = 1;
    header.isRemote = 1;
    header.size = static_cast<long>(arguments.size());
    send(header, std::string(reinterpret_cast<const char*>(arguments.data()), arguments.size()));
}

void Daemon::answerStatus(const PTC::EventPacket& header, const char* payload) {
    int clientId = 0;
    ArgumentReader(payload, header.size).read(clientId);
    if (header.objectId != kPlayerAdapterId || clientId != mAnsweredId ||
        header.methodId != static_cast<long>(PlayerMethod::getPlayerStatus))
        return;
    PackedArguments status;
    status.int32(0).int32(0).int64(0).int64(0);
    PTC::EventPacket answer{};
    answer.receiverId = toModuleId(mIdentity);
    answer.objectId = mAnsweredObject;
    answer.methodId = static_cast<long>(PlayerCallBack::getPlayerStatus);
    answer.isCallback = 1;
    answer.isRemote = 1;
    answer.size = static_cast<long>(status.size());
    send(answer, std::string(reinterpret_cast<const char*>(status.data()), status.size()));
}

} // namespace fuzz
