// SPDX-License-Identifier: MIT
#include "bench/rpc/DaemonPeer.h"

#include <cstdlib>
#include <cstring>
#include <filesystem>

#include "define/ObjectIds.h"
#include "define/PlayerMethods.h"
#include "pack/CUnpack.h"
#include "pack/PackedArguments.h"

namespace bench {
namespace {

using MediaServiceDefine::PlayerCallBack;
using MediaServiceDefine::PlayerMethod;

constexpr long kIdentity = MediaServiceDefine::kFirstClientIdentity;

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

long methodOf(const Packet& packet) {
    PTC::EventPacket header;
    std::memcpy(&header, packet.data(), sizeof header);
    return header.methodId;
}

int64_t integerAt(const Packet& packet, std::size_t offset) {
    unpack_info_t info{};
    CUnpack().unpack(info, packet.data() + sizeof(PTC::EventPacket) + offset);
    return info.value.signedInt;
}

ChildProcess startDaemon() {
    ::setenv("LD_LIBRARY_PATH", (programFolder() + "/../lib/bench-engine").c_str(), 1);
    ChildProcess daemon = ChildProcess::run({programFolder() + "/QNSMediaService"});
    ::unsetenv("LD_LIBRARY_PATH");
    return daemon;
}

} // namespace

std::string programFolder() {
    return std::filesystem::read_symlink("/proc/self/exe").parent_path().string();
}

DaemonPeer::DaemonPeer()
    : mDaemon(startDaemon()), mClient(MediaServiceDefine::kServiceIdentity, kIdentity) {
    PackedArguments registration;
    registration.int64(1);
    registration.int64(kIdentity);
    const Packet request = makeRequest(PlayerMethod::registerCallBack, registration);
    Packet reply;
    if (!mClient.awaitConnectionBack(&request) || !mClient.receive(reply))
        return;
    mClientId = static_cast<int>(integerAt(reply, 0));

    PackedArguments clientId;
    clientId.int32(mClientId);
    mStatusRequest = makeRequest(PlayerMethod::getPlayerStatus, clientId);
}

bool DaemonPeer::openFile() {
    PackedArguments arguments;
    arguments.int32(mClientId);
    arguments.text(L"bench");
    Packet reply;
    if (!mClient.send(makeRequest(PlayerMethod::openPlayer, arguments)) || !mClient.receive(reply))
        return false;
    // The engine opens on the main thread: until then the worker answers "not ready".
    do {
        if (!mClient.send(mStatusRequest) || !mClient.receive(reply))
            return false;
    } while (methodOf(reply) == static_cast<long>(PlayerCallBack::getPlayerStatus) &&
             integerAt(reply, 0) == 2);
    return true;
}

int64_t DaemonPeer::engineCallTime(const Packet& reply) {
    constexpr std::size_t kTwoInt32 = 10; // status and the reserved field come first
    return integerAt(reply, kTwoInt32);
}

} // namespace bench
