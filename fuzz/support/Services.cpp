// SPDX-License-Identifier: MIT
#include "fuzz/support/Services.h"

#include <QCoreApplication>

#include <algorithm>
#include <utility>

#include "define/ObjectIds.h"
#include "discoverer/MediaDiscovererService.h"
#include "discoverer/MediaDiscovererServiceAdapter.h"
#include "discoverer/MediaDiscovererServiceCallBackRemoteProxy.h"
#include "fuzz/support/Require.h"
#include "importer/MediaImporterService.h"
#include "importer/MediaImporterServiceAdapter.h"
#include "importer/MediaImporterServiceCallBackRemoteProxy.h"
#include "importer/MediaImporterServiceNotifyRemoteProxy.h"
#include "player/MediaPlayerService.h"
#include "player/MediaPlayerServiceAdapter.h"
#include "player/MediaPlayerServiceCallBackRemoteProxy.h"
#include "player/MediaPlayerServiceNotifyRemoteProxy.h"
#include "ptc/Event.h"
#include "ptc/LTReceiver.h"

using namespace MediaServiceDefine;

namespace fuzz {

namespace {

/** What queued signals need. */
void startApplication() {
    static char name[] = "fuzz";
    static char* arguments[] = {name, nullptr};
    static int count = 1;
    static QCoreApplication instance(count, arguments);
}

template<typename Proxy>
std::unique_ptr<PTC::IProxyBase> makeProxy(long id) {
    return std::make_unique<Proxy>(id);
}

std::unique_ptr<PTC::IProxyBase> makeProxy(long interfaceId, long proxyId) {
    switch (interfaceId) {
    case kDiscovererCallBackId:
        return makeProxy<MediaDiscovererServiceCallBackRemoteProxy>(proxyId);
    case kImporterCallBackId:
        return makeProxy<MediaImporterServiceCallBackRemoteProxy>(proxyId);
    case kImporterNotifyId:
        return makeProxy<MediaImporterServiceNotifyRemoteProxy>(proxyId);
    case kPlayerCallBackId:
        return makeProxy<MediaPlayerServiceCallBackRemoteProxy>(proxyId);
    default:
        require(interfaceId == kPlayerNotifyId);
        return makeProxy<MediaPlayerServiceNotifyRemoteProxy>(proxyId);
    }
}

/** The warm-up pauses for seconds, and does nothing that an open does not do. */
std::unique_ptr<MediaPlayerService> makePlayerWithoutWarmUp() {
    auto service = std::make_unique<MediaPlayerService>();
    QObject::disconnect(service.get(), SIGNAL(initialize_signal()), nullptr, nullptr);
    return service;
}

} // namespace

class Services::DoneAdapter : public PTC::IAdapterBase {
public:
    explicit DoneAdapter(Services& services) : mServices(services) {}

    long getId() override { return kDoneObjectId; }
    void setTarget(void*) override {}
    void receive(PTC::Event* event) override {
        if (event->methodId == kDoneMethod)
            mServices.done();
    }

private:
    Services& mServices;
};

Services::Services(Ledger& ledger)
    : mLedger(ledger), mpReceiver(std::make_unique<LTReceiver>(kThreadedReceiverId)) {
    startApplication();
    add<MediaDiscovererServiceAdapter, IMediaDiscovererService>(
        kDiscovererAdapterId, std::make_unique<MediaDiscovererService>());
    add<MediaImporterServiceAdapter, IMediaImporterService>(
        kImporterAdapterId, std::make_unique<MediaImporterService>());
    add<MediaPlayerServiceAdapter, IMediaPlayerService>(kPlayerAdapterId,
                                                        makePlayerWithoutWarmUp());
    mpReceiver->addAdapter(new DoneAdapter(*this));
}

Services::~Services() {
    mpReceiver.reset(); // what calls goes before what is called
    runQueued();
}

template<class Adapter, class Interface, class Service>
void Services::add(long adapterId, std::unique_ptr<Service> service) {
    auto adapter = std::make_unique<Adapter>(adapterId);
    adapter->setProxyFactory(this);
    adapter->setTarget(static_cast<Interface*>(service.release()));
    mHolders.push_back(adapter.get());
    mpReceiver->addAdapter(adapter.release());
}

void Services::receive(PTC::Event* event) {
    mpReceiver->recv(event);
}

void Services::done() {
    const std::lock_guard lock(mMutex);
    ++mDone;
    mChanged.notify_all();
}

void Services::waitUntilDone(int times) {
    std::unique_lock lock(mMutex);
    mChanged.wait(lock, [&] { return mDone >= times; });
}

void Services::runQueued() {
    QCoreApplication::sendPostedEvents();
}

void Services::endProxy(std::size_t index) {
    if (mProxies.empty())
        return;
    const auto ended = mProxies.begin() + static_cast<std::ptrdiff_t>(index % mProxies.size());
    // Nobody uses it: the worker is idle, and this is the main thread.
    for (PTC::IProxyHolder* const holder : mHolders)
        require(holder->letGo(**ended));
    mProxies.erase(ended);
}

PTC::IProxyBase* Services::createProxy(long interfaceId, long proxyId, long clientIdentity) {
    if (clientIdentity < kFirstClientIdentity || clientIdentity > kLastClientIdentity)
        return nullptr;
    auto proxy = makeProxy(interfaceId, proxyId);
    proxy->setSender(mLedger.senderOf(interfaceId));
    mLedger.connected(interfaceId);
    mProxies.push_back(std::move(proxy));
    return mProxies.back().get();
}

} // namespace fuzz
