// SPDX-License-Identifier: MIT
#include "main/MediaServiceFactory.h"

#include <QCoreApplication>
#include <arpa/inet.h>
#include <chrono>
#include <future>
#include <gmock/gmock.h>
#include <memory>
#include <netinet/in.h>
#include <poll.h>
#include <sys/socket.h>

#include "base/UniqueFd.h"
#include "define/DiscovererMethods.h"
#include "define/ImporterMethods.h"
#include "define/ObjectIds.h"
#include "define/PlayerMethods.h"
#include "discoverer/IMediaDiscovererService.h"
#include "discoverer/MediaDiscovererServiceCallBackRemoteProxy.h"
#include "importer/IMediaImporterService.h"
#include "importer/IMediaImporterServiceNotify.h"
#include "importer/MediaImporterServiceCallBackRemoteProxy.h"
#include "importer/MediaImporterServiceNotifyRemoteProxy.h"
#include "pack/CSimpleBuffer.h"
#include "player/IMediaPlayerService.h"
#include "player/IMediaPlayerServiceNotify.h"
#include "player/MediaPlayerServiceCallBackRemoteProxy.h"
#include "player/MediaPlayerServiceNotifyRemoteProxy.h"
#include "ptc/Event.h"
#include "ptc/IProxy.h"
#include "ptc/ISender.h"
#include "ptc/SocketRemoteSender.h"

using namespace MediaServiceDefine;
using testing::Mock;
using testing::StrictMock;

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
    /** Another process at the same port. */
    static void restart(std::unique_ptr<ClientPort>& client, int port) {
        client.reset();
        client = std::make_unique<ClientPort>(port);
    }

    MediaServiceFactory mFactory;
};

TEST(ModuleIds, FollowTheTable) {
    for (long identity = 1000; identity <= 1005; ++identity)
        EXPECT_EQ(toModuleId(identity), identity - 999);
    EXPECT_EQ(toModuleId(1006), 8);
    EXPECT_EQ(toModuleId(1007), 7);
    EXPECT_EQ(toModuleId(999), 8);
    EXPECT_EQ(toModuleId(1008), 8);
    EXPECT_EQ(toModuleId(0), 8);
    EXPECT_EQ(toModuleId(-1), 8);
    static_assert(toModuleId(1007) == 7);
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
    EXPECT_EQ(mFactory.createProxy(kImporterCallBackId, 1, 1003), nullptr);
    EXPECT_EQ(mFactory.findSender(4), nullptr);
    ClientPort client(1003);
    EXPECT_NE(mFactory.createProxy(kPlayerCallBackId, 1, 1003), nullptr);
}

TEST_F(Factory, KeepsTheSenderOfAClientThatHasEnded) {
    auto client = std::make_unique<ClientPort>(1000);
    ASSERT_NE(mFactory.createProxy(kPlayerCallBackId, 5, 1000), nullptr);
    PTC::ISender* const sender = mFactory.findSender(1);
    EXPECT_EQ(client->connections(), 1);
    restart(client, 1000);
    EXPECT_NE(mFactory.createProxy(kPlayerCallBackId, 5, 1000), nullptr);
    EXPECT_EQ(mFactory.findSender(1), sender);
    EXPECT_EQ(client->connections(), 0);
}

TEST_F(Factory, ReplacesTheSenderOfAClientThatHasEndedWhereAskedFor) {
    MediaServiceFactory factory(true);
    auto client = std::make_unique<ClientPort>(1000);
    ClientPort other(1001);
    ASSERT_NE(factory.createProxy(kPlayerCallBackId, 5, 1000), nullptr);
    ASSERT_NE(factory.createProxy(kPlayerCallBackId, 5, 1001), nullptr);
    EXPECT_EQ(other.connections(), 1);
    restart(client, 1000);
    EXPECT_NE(factory.createProxy(kPlayerCallBackId, 5, 1000), nullptr);
    EXPECT_EQ(client->connections(), 1);
    EXPECT_NE(factory.createProxy(kPlayerNotifyId, 6, 1000), nullptr);
    EXPECT_NE(factory.createProxy(kPlayerNotifyId, 6, 1001), nullptr);
    EXPECT_EQ(client->connections() + other.connections(), 0);
}

TEST_F(Factory, MakesTheProxyOfTheInterface) {
    ClientPort client(1000);
    const auto make = [&](long interfaceId) { return mFactory.createProxy(interfaceId, 1, 1000); };
    EXPECT_NE(dynamic_cast<MediaDiscovererServiceCallBackRemoteProxy*>(make(kDiscovererCallBackId)),
              nullptr);
    EXPECT_NE(dynamic_cast<MediaImporterServiceCallBackRemoteProxy*>(make(kImporterCallBackId)),
              nullptr);
    EXPECT_NE(dynamic_cast<MediaImporterServiceNotifyRemoteProxy*>(make(kImporterNotifyId)),
              nullptr);
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

TEST_F(Factory, MakesNoProxiesOfServicesThatItDoesNotHave) {
    ClientPort client(1000);
    for (const long interfaceId : {kDiscovererAdapterId, kImporterAdapterId, kPlayerAdapterId, 0L})
        EXPECT_EQ(mFactory.createProxy(interfaceId, 1, 1000), nullptr) << interfaceId;
    EXPECT_EQ(client.connections(), 0);
}

/** A factory that serves; services need the application's event loop to be there. */
class ServingFactory : public ::testing::Test {
protected:
    int mArgc = 0;
    const QCoreApplication mApplication{mArgc, nullptr};
    MediaServiceFactory mFactory;
};

TEST_F(ServingFactory, ServesAtItsPortOnceInitialised) {
    EXPECT_TRUE(mFactory.initialize());
    EXPECT_EQ(mFactory.getRRIdentity(), 1008);
}

TEST_F(ServingFactory, WithoutItsPortSaysSoAndServesWhenTriedAgain) {
    auto other = std::make_unique<ClientPort>(1008);
    ::testing::internal::CaptureStdout();
    EXPECT_FALSE(mFactory.initialize());
    EXPECT_EQ(::testing::internal::GetCapturedStdout(), "[Error]Socket Server create failed!\n");
    EXPECT_EQ(mFactory.getRRIdentity(), -1);
    other.reset();
    EXPECT_TRUE(mFactory.initialize());
    EXPECT_EQ(mFactory.getRRIdentity(), 1008);
}

TEST_F(ServingFactory, SetsTheAllocationOfArgumentBlocks) {
    CSimpleBuffer operations;
    operations.simplebuffer_system_init(
        100, [](unsigned long) -> void* { return nullptr; }, [](void*) {});
    EXPECT_TRUE(mFactory.initialize());
    simplebuffer buffer{};
    EXPECT_NE(operations.simplebuffer_checksize(&buffer, 1), nullptr);
    EXPECT_EQ(buffer.alloc, 1u + 4u);
    operations.simplebuffer_destroy(&buffer);
}

TEST_F(ServingFactory, MayBeInitializedTwice) {
    EXPECT_TRUE(mFactory.initialize());
    EXPECT_TRUE(mFactory.initialize());
    EXPECT_EQ(mFactory.getRRIdentity(), 1008);
}

/** The services' places. Each tells its end. */
class DiscovererMock : public IMediaDiscovererService {
public:
    ~DiscovererMock() override { died(); }
    MOCK_METHOD(void, died, ());
    MOCK_METHOD(void, initializeDiscoverer, (int), (override));
    MOCK_METHOD(void, openDiscoverer, (_tagFileName), (override));
    MOCK_METHOD(void, closeDiscoverer, (int), (override));
    MOCK_METHOD(void, getMetadata, (int), (override));
    MOCK_METHOD(void, getImage, (_tagImageParam), (override));
    MOCK_METHOD(void, getSupportedExtensions, (int), (override));
    MOCK_METHOD(void, registerCallBack, (IMediaDiscovererServiceCallBack*), (override));
    MOCK_METHOD(void, unregisterCallBack, (int), (override));
};

class ImporterMock : public IMediaImporterService {
public:
    ~ImporterMock() override { died(); }
    MOCK_METHOD(void, died, ());
    MOCK_METHOD(void, initializeImporter, (int), (override));
    MOCK_METHOD(void, import, (_tagImportParam), (override));
    MOCK_METHOD(void, cancel, (int), (override));
    MOCK_METHOD(void, getImporterStatus, (int), (override));
    MOCK_METHOD(void, registerCallBack, (IMediaImporterServiceCallBack*), (override));
    MOCK_METHOD(void, registerNotify, (_tagIMediaImporterServiceNotify), (override));
    MOCK_METHOD(void, unregisterCallBack, (int), (override));
    MOCK_METHOD(void, unregisterNotify, (int), (override));
};

class PlayerMock : public IMediaPlayerService {
public:
    ~PlayerMock() override { died(); }
    MOCK_METHOD(void, died, ());
    MOCK_METHOD(void, initializePlayer, (int), (override));
    MOCK_METHOD(void, openPlayer, (_tagFileName), (override));
    MOCK_METHOD(void, closePlayer, (int), (override));
    MOCK_METHOD(void, play, (int), (override));
    MOCK_METHOD(void, pause, (int), (override));
    MOCK_METHOD(void, seek, (_tagSeekParam), (override));
    MOCK_METHOD(void, getPlayerStatus, (int), (override));
    MOCK_METHOD(void, setRepeat, (_tagRepeatParam), (override));
    MOCK_METHOD(void, powerOffMediaPlayer, (int), (override));
    MOCK_METHOD(void, registerCallBack, (IMediaPlayerServiceCallBack*), (override));
    MOCK_METHOD(void, registerNotify, (_tagIMediaPlayerServiceNotify), (override));
    MOCK_METHOD(void, unregisterCallBack, (int), (override));
    MOCK_METHOD(void, unregisterNotify, (int), (override));
    MOCK_METHOD(void, setSystemFormat, (_emMediaServiceSystemFormat), (override));
};

/** Sends requests whose argument is a client id below 128. */
class Client {
public:
    Client() { EXPECT_TRUE(mSender.initialize(kServiceIdentity)); }

    template<typename Method>
    void request(long objectId, Method method, char clientId) {
        mSender.send(new PTC::Event(objectId, static_cast<long>(method), &clientId, sizeof clientId,
                                    true, false));
    }

private:
    SocketRemoteSender mSender{kThreadedReceiverId};
};

TEST(RegisteredServices, AreServedUnderTheirIdsAndDeletedWithTheFactory) {
    auto* const discoverer = new StrictMock<DiscovererMock>;
    auto* const importer = new StrictMock<ImporterMock>;
    auto* const player = new StrictMock<PlayerMock>;
    {
        MediaServiceFactory factory;
        factory.RegisterObject(kPlayerAdapterId, static_cast<IMediaPlayerService*>(player));
        factory.RegisterObject(kImporterAdapterId, static_cast<IMediaImporterService*>(importer));
        factory.RegisterObject(kDiscovererAdapterId,
                               static_cast<IMediaDiscovererService*>(discoverer));
        for (const long second : {kPlayerAdapterId, kImporterAdapterId, kDiscovererAdapterId})
            factory.RegisterObject(second, &factory);            // comes too late
        factory.RegisterObject(kDiscovererCallBackId, &factory); // there is no such service
        ASSERT_TRUE(factory.initialize());

        std::promise<void> done;
        EXPECT_CALL(*discoverer, getMetadata(1));
        EXPECT_CALL(*importer, cancel(2));
        EXPECT_CALL(*player, play(3)).WillOnce([&done] { done.set_value(); });
        Client client;
        client.request(kDiscovererAdapterId, DiscovererMethod::getMetadata, 1);
        client.request(kImporterAdapterId, ImporterMethod::cancel, 2);
        client.request(kPlayerAdapterId, PlayerMethod::play, 3);
        EXPECT_EQ(done.get_future().wait_for(std::chrono::seconds(30)), std::future_status::ready);
        EXPECT_TRUE(Mock::VerifyAndClearExpectations(player)) << "alive up to here";
        EXPECT_CALL(*discoverer, died());
        EXPECT_CALL(*importer, died());
        EXPECT_CALL(*player, died());
    }
}

TEST(RegisteredServices, AreTheirOwnersUntilTheFactoryIsInitialised) {
    StrictMock<PlayerMock> player;
    {
        MediaServiceFactory().RegisterObject(kPlayerAdapterId,
                                             static_cast<IMediaPlayerService*>(&player));
    }
    EXPECT_CALL(player, died());
}

} // namespace
