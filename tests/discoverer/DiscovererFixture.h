// SPDX-License-Identifier: MIT
#pragma once

#include <QCoreApplication>

#include <algorithm>
#include <memory>
#include <thread>
#include <utility>
#include <vector>

#include <gmock/gmock.h>

#include "discoverer/MediaDiscovererController.h"
#include "discoverer/MediaDiscovererService.h"
#include "discoverer/MediaDiscovererServiceAdapter.h"
#include "discoverer/MediaDiscovererServiceCallBackRemoteProxy.h"
#include "log/Logging.h"
#include "ptc/Event.h"
#include "ptc/IFactory.h"
#include "tests/discoverer/EngineMock.h"
#include "tests/support/PlatformDouble.h"
#include "tests/support/RecordingSender.h"
#include "tests/support/TestFolder.h"

/** Numbers of the requests, as they stand in packets. */
enum RequestId : long {
    kInitialize = 1,
    kOpen = 2,
    kClose = 3,
    kGetMetadata = 4,
    kGetImage = 5,
    kGetExtensions = 6,
    kUnregister = 7,
    kRegister = 8
};

/** The application object that queued signals need; this thread is the main thread. */
inline void needApplication() {
    static char name[] = "discoverer_test";
    static char* arguments[] = {name, nullptr};
    static int count = 1;
    static QCoreApplication instance(count, arguments);
}

/** A line of one of the discoverer's modules, as it comes to the system log. */
inline platform_double::LogLine serviceLine(const std::string& text) {
    return {6, "MediaDiscovererService 101: MediaDiscovererService::" + text};
}
inline platform_double::LogLine controllerLine(const std::string& text) {
    return {3, "MediaDiscovererController 410: " + text};
}

/** Makes real proxies that send to one recording sender. */
class RecordingProxyFactory : public PTC::IProxyFactory {
public:
    explicit RecordingProxyFactory(PTC::ISender& sender) : mSender(sender) {}

    PTC::IProxyBase* createProxy(long, long proxyId, long) override {
        mProxies.push_back(std::make_unique<MediaDiscovererServiceCallBackRemoteProxy>(proxyId));
        mProxies.back()->setSender(&mSender);
        return mProxies.back().get();
    }

    /** The proxy of the client with this id. */
    PTC::IProxyBase& proxyOf(int clientId) {
        return *mProxies.at(static_cast<std::size_t>(clientId) - 1);
    }

private:
    PTC::ISender& mSender;
    std::vector<std::unique_ptr<PTC::CallbackProxy>> mProxies;
};

/**
 * The whole discoverer as the daemon wires it, from encoded requests to the events for clients,
 * with mocks as the engine. Client 1 has the callback object 100 and the discoverer 0, a client n
 * that registerClient() adds the object 99 + n.
 *
 * request() comes from this thread, so that the controller acts before it returns;
 * requestFromWorker() comes from another one, and what it queues waits for runQueued().
 */
class DiscovererFixture : public testing::Test {
protected:
    using Engine = testing::NiceMock<DiscovererMock>;

    DiscovererFixture() {
        needApplication();
        INIT_LOGGING(L"discoverer_test");
        engineFactory() = {};
    }
    ~DiscovererFixture() override {
        mAdapter.reset();
        UNINIT_LOGGING();
        EXPECT_TRUE(mSender.allForClients());
    }

    void SetUp() override {
        use(new MediaDiscovererService);
        registerClient();
        forget();
    }

    void use(MediaDiscovererService* service) {
        mpService = service;
        mAdapter = std::make_unique<MediaDiscovererServiceAdapter>(51);
        mAdapter->setProxyFactory(&mProxies);
        mAdapter->setTarget(static_cast<IMediaDiscovererService*>(service));
    }

    void registerClient() { request(kRegister, int64(100 + mClients++) + int64(1000)); }
    void registerAllOthers() {
        while (mClients < kDiscovererCount)
            registerClient();
        forget();
    }

    void forget() {
        mSender.take();
        platform_double::takeLog();
    }

    void request(long method, const Bytes& bytes) {
        auto* const data = new char[bytes.size()];
        std::copy(bytes.begin(), bytes.end(), data);
        PTC::Event event(51, method, data, static_cast<long>(bytes.size()), true, false);
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

    static Engine& engine(std::size_t discoverer = 0) {
        return *engineFactory().given.at(discoverer);
    }

    static Bytes openRequest(int clientId, std::string_view name) {
        return int32(clientId) + text(name);
    }

    /** The paths are names in the test's folder; an empty name is an empty path. */
    Bytes imageRequest(int clientId, std::string_view image, std::string_view notice = "",
                       int64_t position = 0, int32_t width = 4, int32_t height = 2) const {
        return int32(clientId) + int32(width) + int32(height) + int64(position) +
               longText(image.empty() ? "" : mFolder.path(image)) +
               longText(notice.empty() ? "" : mFolder.path(notice));
    }

    /** A text of 31 bytes and more, or an empty one. */
    static Bytes longText(std::string_view value) {
        if (value.size() < 31)
            return text(value);
        Bytes bytes = tagged(0xDA, value.size() + 1, 2);
        bytes.insert(bytes.end(), value.begin(), value.end());
        bytes.push_back(0);
        return bytes;
    }

    TestFolder mFolder;
    RecordingSender mSender;
    RecordingProxyFactory mProxies{mSender};
    int mClients = 0;
    MediaDiscovererService* mpService = nullptr; ///< owned by the adapter
    std::unique_ptr<MediaDiscovererServiceAdapter> mAdapter;
};
