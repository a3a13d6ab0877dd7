// SPDX-License-Identifier: MIT
#pragma once

#include <QCoreApplication>

#include <memory>
#include <thread>
#include <vector>

#include <gmock/gmock.h>

#include "player/MediaPlayerService.h"
#include "player/MediaPlayerServiceAdapter.h"
#include "player/MediaPlayerServiceCallBackRemoteProxy.h"
#include "player/MediaPlayerServiceNotifyRemoteProxy.h"
#include "ptc/Event.h"
#include "ptc/IFactory.h"
#include "tests/player/EngineMock.h"
#include "tests/support/PlatformDouble.h"
#include "tests/support/RecordingSender.h"

/** Numbers of the requests, as they stand in packets. */
enum RequestId : long {
    kInitialize = 1,
    kOpen = 2,
    kClose = 3,
    kPlay = 4,
    kPause = 5,
    kSeek = 6,
    kGetStatus = 7,
    kSetRepeat = 8,
    kPowerOff = 9,
    kUnregisterCallBack = 10,
    kUnregisterNotify = 11,
    kSetFormat = 12,
    kRegisterCallBack = 13,
    kRegisterNotify = 14
};

/** The application object that queued signals and quit() need; this thread is the main thread. */
inline QCoreApplication& application() {
    static char name[] = "player_test";
    static char* arguments[] = {name, nullptr};
    static int count = 1;
    static QCoreApplication instance(count, arguments);
    return instance;
}

/** Makes real proxies that send to one recording sender. */
class RecordingProxyFactory : public PTC::IProxyFactory {
public:
    explicit RecordingProxyFactory(PTC::ISender& sender) : mSender(sender) {}

    PTC::IProxyBase* createProxy(long interfaceId, long proxyId, long) override {
        if (interfaceId == 63)
            return keep(std::make_unique<MediaPlayerServiceCallBackRemoteProxy>(proxyId));
        return keep(std::make_unique<MediaPlayerServiceNotifyRemoteProxy>(proxyId));
    }

private:
    PTC::IProxyBase* keep(std::unique_ptr<PTC::CallbackProxy> proxy) {
        proxy->setSender(&mSender);
        mProxies.push_back(std::move(proxy));
        return mProxies.back().get();
    }

    PTC::ISender& mSender;
    std::vector<std::unique_ptr<PTC::CallbackProxy>> mProxies;
};

/**
 * The whole player as the daemon wires it, from encoded requests to the events for clients,
 * with a mock as the engine. A client with callback object 100 is registered as number 1.
 *
 * request() comes from this thread, so that the controller acts before it returns;
 * requestFromWorker() comes from another one, and what it queues waits for runQueued().
 */
class PlayerFixture : public testing::Test {
protected:
    using Player = testing::NiceMock<PlayerMock>;

    PlayerFixture() {
        application();
        engineFactory().next = mpEngine = new Player;
        mpService = new MediaPlayerService;
        mAdapter->setProxyFactory(&mProxies);
        mAdapter->setTarget(static_cast<IMediaPlayerService*>(mpService));
        request(kRegisterCallBack, int64(100) + int64(1000));
        mSender.take();
        platform_double::takeLog();
    }
    ~PlayerFixture() override { EXPECT_TRUE(mSender.allForClients()); }

    void request(long method, const Bytes& bytes) {
        auto* const data = new char[bytes.size()];
        std::copy(bytes.begin(), bytes.end(), data);
        PTC::Event event(62, method, data, static_cast<long>(bytes.size()), true, false);
        mAdapter->receive(&event);
        delete[] event.data;
    }

    /** What the request made the service send at once. */
    std::vector<SentEvent> answersTo(long method, const Bytes& bytes) {
        request(method, bytes);
        return mSender.take();
    }

    void requestFromWorker(long method, const Bytes& bytes) {
        std::thread([&] { request(method, bytes); }).join();
    }

    static void runQueued() { QCoreApplication::sendPostedEvents(); }

    void registerNotify(long objectId, int clientId) {
        request(kRegisterNotify, int64(objectId) + int64(1000) + int32(clientId));
    }

    void notify(LibMediaPlayer::MediaPlayerNotify notification) { mpEngine->notify(notification); }

    RecordingSender mSender;
    RecordingProxyFactory mProxies{mSender};
    Player* mpEngine = nullptr;              ///< owned by the controller
    MediaPlayerService* mpService = nullptr; ///< owned by the adapter
    std::unique_ptr<MediaPlayerServiceAdapter> mAdapter =
        std::make_unique<MediaPlayerServiceAdapter>(62);
};
