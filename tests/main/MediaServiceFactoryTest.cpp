// SPDX-License-Identifier: MIT
#include "main/MediaServiceFactory.h"

#include <QCoreApplication>
#include <arpa/inet.h>
#include <gmock/gmock.h>
#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>

#include "base/UniqueFd.h"
#include "define/ObjectIds.h"
#include "player/MediaPlayerServiceCallBackRemoteProxy.h"
#include "player/MediaPlayerServiceNotifyRemoteProxy.h"
#include "ptc/IProxy.h"
#include "ptc/ISender.h"

using namespace MediaServiceDefine;

namespace {

/** A client's port. */
class ClientPort {
public:
    explicit ClientPort(int port) : mSocket(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0)) {
        const int one = 1;
        ::setsockopt(mSocket.get(), SOL_SOCKET, SO_REUSEADDR, &one, sizeof one);
        sockaddr_in address{};
        address.sin_family = AF_INET;
        address.sin_addr.s_addr = htonl(INADDR_LOOPBACK);
        address.sin_port = htons(static_cast<uint16_t>(port));
        EXPECT_EQ(
            ::bind(mSocket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address), 0);
        EXPECT_EQ(::listen(mSocket.get(), 10), 0);
    }

    /** Accepts what has connected by now. */
    int connections() {
        int count = 0;
        for (pollfd watched{mSocket.get(), POLLIN, 0}; ::poll(&watched, 1, 0) == 1; ++count)
            mConnections.emplace_back(::accept(mSocket.get(), nullptr, nullptr));
        return count;
    }

private:
    qns::UniqueFd mSocket;
    std::vector<qns::UniqueFd> mConnections;
};

class Factory : public ::testing::Test {
protected:
    MediaServiceFactory mFactory;
};

TEST(ModuleIds, FollowTheTable) {
    EXPECT_EQ(toModuleId(1000), 1);
    EXPECT_EQ(toModuleId(1005), 6);
    EXPECT_EQ(toModuleId(1006), 8);
    EXPECT_EQ(toModuleId(1007), 7);
    EXPECT_EQ(toModuleId(999), 8);
    EXPECT_EQ(toModuleId(1008), 8);
    EXPECT_EQ(toModuleId(-1), 8);
}

TEST_F(Factory, MakesNoProxyOfAnUnknownInterface) {
    ClientPort client(1000);
    EXPECT_EQ(mFactory.createProxy(53, 1, 1000), nullptr);
    EXPECT_EQ(client.connections(), 0);
}

TEST_F(Factory, SharesOneConnectionAmongTheProxiesOfAClient) {
    ClientPort client(1002);
    PTC::IProxyBase* first = mFactory.createProxy(kPlayerCallBackId, 5, 1002);
    PTC::IProxyBase* second = mFactory.createProxy(kPlayerCallBackId, 5, 1002);
    ASSERT_NE(first, nullptr);
    ASSERT_NE(second, nullptr);
    EXPECT_NE(first, second);
    EXPECT_EQ(first->getId(), 5);
    EXPECT_EQ(client.connections(), 1);
    ASSERT_NE(mFactory.findSender(3), nullptr);
}

TEST_F(Factory, UsesTheSenderOfModuleEightForEveryUnknownIdentity) {
    ClientPort client(1006);
    EXPECT_NE(mFactory.createProxy(kPlayerCallBackId, 5, 1006), nullptr);
    EXPECT_NE(mFactory.createProxy(kPlayerNotifyId, 6, 1009), nullptr);
    EXPECT_EQ(client.connections(), 1);
}

TEST_F(Factory, StoresNoSenderForAClientThatCannotBeReached) {
    EXPECT_EQ(mFactory.createProxy(kPlayerCallBackId, 1, 1003), nullptr);
    EXPECT_EQ(mFactory.findSender(4), nullptr);
    ClientPort client(1003);
    EXPECT_NE(mFactory.createProxy(kPlayerCallBackId, 1, 1003), nullptr);
}

TEST_F(Factory, MakesTheProxyOfTheInterface) {
    ClientPort client(1000);
    const auto make = [&](long interfaceId) { return mFactory.createProxy(interfaceId, 1, 1000); };
    EXPECT_NE(dynamic_cast<MediaPlayerServiceCallBackRemoteProxy*>(make(kPlayerCallBackId)),
              nullptr);
    EXPECT_NE(dynamic_cast<MediaPlayerServiceNotifyRemoteProxy*>(make(kPlayerNotifyId)), nullptr);
}

TEST_F(Factory, MakesNothingById) {
    void* instance = nullptr;
    mFactory.createInstance(62, &instance);
    EXPECT_EQ(instance, nullptr);
    EXPECT_EQ(mFactory.createAdapter(62, nullptr, nullptr), nullptr);
    EXPECT_EQ(mFactory.getRRIdentity(), -1);
}

TEST_F(Factory, ServesAtItsPortOnceInitialised) {
    int argc = 0;
    const QCoreApplication application(argc, nullptr);
    EXPECT_TRUE(mFactory.initialize());
    EXPECT_EQ(mFactory.getRRIdentity(), 1008);
    MediaServiceFactory second;
    ::testing::internal::CaptureStdout();
    EXPECT_FALSE(second.initialize());
    EXPECT_EQ(::testing::internal::GetCapturedStdout(), "[Error]Socket Server create failed!\n");
    EXPECT_EQ(second.getRRIdentity(), -1);
}

} // namespace
