// SPDX-License-Identifier: MIT
#include "bench/rpc/DaemonClient.h"

#include <cstring>

#include "define/ObjectIds.h"
#include "define/PlayerMethods.h"
#include "pack/CUnpack.h"
#include "pack/PackedArguments.h"

namespace bench {
namespace {

using MediaServiceDefine::PlayerCallBack;
using MediaServiceDefine::PlayerMethod;

constexpr long kCallBackObject = 1; // what listens has other numbers
constexpr int kListenerBase = 100;

Packet makeRequest(PlayerMethod method, const PackedArguments& arguments) {
    PTC::EventPacket header{};
    header.receiverId = MediaServiceDefine::kThreadedReceiverId;
    header.objectId = MediaServiceDefine::kPlayerAdapterId;
    header.methodId = static_cast<long>(method);
    header.size = static_cast<long>(arguments.size());
    header.isRemote = 1;
    Packet packet{};
    std::memcpy(packet.data(), &header, sizeof header);
    std::memcpy(packet.data() + sizeof header, arguments.data(), arguments.size());
    return packet;
}

PTC::EventPacket headerOf(const Packet& packet) {
    PTC::EventPacket header;
    std::memcpy(&header, packet.data(), sizeof header);
    return header;
}

int64_t integerAt(const Packet& packet, std::size_t offset) {
    unpack_info_t info{};
    CUnpack().unpack(info, packet.data() + sizeof(PTC::EventPacket) + offset);
    return info.value.signedInt;
}

} // namespace

DaemonClient::DaemonClient(long identity)
    : mIdentity(identity),
      mClient(MediaServiceDefine::kServiceIdentity, static_cast<uint16_t>(identity)) {
    PackedArguments registration;
    registration.int64(kCallBackObject);
    registration.int64(identity);
    const Packet request = makeRequest(PlayerMethod::registerCallBack, registration);
    Packet reply;
    if (!mClient.awaitConnectionBack(&request) || !mClient.receive(reply))
        return;
    mClientId = static_cast<int>(integerAt(reply, 0));

    PackedArguments clientId;
    clientId.int32(mClientId);
    mStatusRequest = makeRequest(PlayerMethod::getPlayerStatus, clientId);
    clientId.text(L"bench");
    mOpenRequest = makeRequest(PlayerMethod::openPlayer, clientId);
}

bool DaemonClient::openFile() {
    Packet reply;
    if (!mClient.send(mOpenRequest) || !mClient.receive(reply))
        return false;
    // The engine opens on the main thread: until then the worker answers "not ready".
    do {
        if (!mClient.send(mStatusRequest) || !mClient.receive(reply))
            return false;
    } while (headerOf(reply).methodId == static_cast<long>(PlayerCallBack::getPlayerStatus) &&
             integerAt(reply, 0) == 2);
    return true;
}

bool DaemonClient::listen(int object) {
    PackedArguments registration;
    registration.int64(kListenerBase + object);
    registration.int64(mIdentity);
    registration.int32(kListenerBase + object); // one listener for each of these
    return mClient.send(makeRequest(PlayerMethod::registerNotify, registration));
}

int64_t DaemonClient::engineCallTime(const Packet& reply) {
    constexpr std::size_t kTwoInt32 = 10; // status and the reserved field come first
    return integerAt(reply, kTwoInt32);
}

bool DaemonClient::isOpenNotification(const Packet& packet) {
    return headerOf(packet).objectId >= kListenerBase;
}

int64_t DaemonClient::notifyTime(const Packet& notification) {
    constexpr long kInt64 = 9; // the last field
    return integerAt(notification, static_cast<std::size_t>(headerOf(notification).size - kInt64));
}

} // namespace bench
