// SPDX-License-Identifier: MIT
#include "main/MediaServiceFactory.h"

#include <cstdlib>
#include <type_traits>

#include "define/ObjectIds.h"
#include "discoverer/MediaDiscovererService.h"
#include "discoverer/MediaDiscovererServiceAdapter.h"
#include "discoverer/MediaDiscovererServiceCallBackRemoteProxy.h"
#include "importer/MediaImporterService.h"
#include "importer/MediaImporterServiceAdapter.h"
#include "importer/MediaImporterServiceCallBackRemoteProxy.h"
#include "importer/MediaImporterServiceNotifyRemoteProxy.h"
#include "pack/CSimpleBuffer.h"
#include "player/MediaPlayerService.h"
#include "player/MediaPlayerServiceAdapter.h"
#include "player/MediaPlayerServiceCallBackRemoteProxy.h"
#include "player/MediaPlayerServiceNotifyRemoteProxy.h"
#include "ptc/LTReceiver.h"
#include "ptc/SocketRemoteReceiver.h"
#include "ptc/SocketRemoteSender.h"

using namespace MediaServiceDefine;

namespace {

constexpr uint64_t kMinimumAllocateUnit = 4;

using ProxyPointer = std::unique_ptr<PTC::IProxyBase>;

template<typename Proxy>
ProxyPointer makeProxy(long id) {
    return std::make_unique<Proxy>(id);
}

struct ProxyMaker {
    long interfaceId;
    ProxyPointer (*make)(long id);
};

constexpr ProxyMaker kProxyMakers[] = {
    {kDiscovererCallBackId, makeProxy<MediaDiscovererServiceCallBackRemoteProxy>},
    {kImporterCallBackId, makeProxy<MediaImporterServiceCallBackRemoteProxy>},
    {kImporterNotifyId, makeProxy<MediaImporterServiceNotifyRemoteProxy>},
    {kPlayerCallBackId, makeProxy<MediaPlayerServiceCallBackRemoteProxy>},
    {kPlayerNotifyId, makeProxy<MediaPlayerServiceNotifyRemoteProxy>},
};

const ProxyMaker* findProxyMaker(long interfaceId) {
    for (const ProxyMaker& maker : kProxyMakers)
        if (maker.interfaceId == interfaceId)
            return &maker;
    return nullptr;
}

} // namespace

void* myMalloc(unsigned long size) {
    return std::malloc(size);
}

void myFree(void* memory) {
    std::free(memory);
}

MediaServiceFactory::MediaServiceFactory(bool reconnectsClients) {
    if (reconnectsClients)
        mEndedClients.emplace();
}

MediaServiceFactory::~MediaServiceFactory() {
    // Its threads call createProxy(), and its adapters end the services.
    mpRemoteReceiver.reset();
    mpIdleReceiver.reset();
}

bool MediaServiceFactory::initialize() {
    InstanceFactory::initialize();
    CSimpleBuffer().simplebuffer_system_init(kMinimumAllocateUnit, myMalloc, myFree);
    if (mpThreadedReceiver == nullptr)
        buildServices();
    return mpRemoteReceiver != nullptr || startServer();
}

void MediaServiceFactory::buildServices() {
    mpIdleReceiver = std::make_unique<LTReceiver>(kThreadedReceiverId);
    mpThreadedReceiver = mpIdleReceiver.get();
    addService<MediaDiscovererServiceAdapter, MediaDiscovererService>(kDiscovererAdapterId,
                                                                      mpDiscovererService);
    addService<MediaImporterServiceAdapter, MediaImporterService>(kImporterAdapterId,
                                                                  mpImporterService);
    addService<MediaPlayerServiceAdapter, MediaPlayerService>(kPlayerAdapterId, mpPlayerService);
}

template<class Adapter, class Service, class Interface>
void MediaServiceFactory::addService(long adapterId, Interface*& service) {
    if (service == nullptr)
        service = new Service;
    auto adapter = std::make_unique<Adapter>(adapterId);
    adapter->setProxyFactory(this);
    adapter->setTarget(service);
    if (mEndedClients)
        mEndedClients->addHolder(*adapter);
    mpThreadedReceiver->addAdapter(adapter.release());
}

bool MediaServiceFactory::startServer() {
    auto server = std::make_unique<SocketRemoteReceiver>(kSocketReceiverId);
    // Before the server listens, so that no packet comes too early for its receiver.
    server->addReceiver(mpIdleReceiver.release());
    if (!server->initialize(kServiceIdentity)) {
        server->releaseReceiver(kThreadedReceiverId).release(); // the same object, by its base
        mpIdleReceiver.reset(mpThreadedReceiver);
        return false;
    }
    mpRemoteReceiver = std::move(server);
    return true;
}

void MediaServiceFactory::createInstance(long, void**) {}

void MediaServiceFactory::RegisterObject(long id, void* service) {
    const auto keep = [service](auto*& kept) {
        if (kept == nullptr)
            kept = static_cast<std::remove_reference_t<decltype(kept)>>(service);
    };
    if (id == kDiscovererAdapterId)
        keep(mpDiscovererService);
    else if (id == kImporterAdapterId)
        keep(mpImporterService);
    else if (id == kPlayerAdapterId)
        keep(mpPlayerService);
}

void* MediaServiceFactory::createAdapter(long, PTC::IReceiver*, void*) {
    return nullptr;
}

PTC::IProxyBase* MediaServiceFactory::createProxy(long interfaceId, long proxyId,
                                                  long clientIdentity) {
    const ProxyMaker* maker = findProxyMaker(interfaceId);
    if (maker == nullptr)
        return nullptr;
    if (mEndedClients)
        mEndedClients->release(mConnections);
    PTC::ISender* sender = senderFor(clientIdentity);
    if (sender == nullptr)
        return nullptr;
    ProxyPointer proxy = maker->make(proxyId);
    proxy->setSender(sender);
    PTC::IProxyBase* result = proxy.get();
    addProxy(toModuleId(clientIdentity), std::move(proxy));
    return result;
}

PTC::ISender* MediaServiceFactory::senderFor(long clientIdentity) {
    const long moduleId = toModuleId(clientIdentity);
    if (PTC::ISender* sender = findSender(moduleId))
        return sender;
    auto sender = std::make_unique<SocketRemoteSender>(moduleId);
    if (!sender->initialize(clientIdentity))
        return nullptr;
    addSender(sender.release());
    return findSender(moduleId);
}
