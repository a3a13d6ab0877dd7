// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <optional>

#include "ptc/EndedClients.h"
#include "ptc/InstanceFactory.h"

class IMediaDiscovererService;
class IMediaImporterService;
class IMediaPlayerService;
class LTReceiver;

/** The C heap, as the encoding layer's buffers take it. */
void* myMalloc(unsigned long size);
void myFree(void* memory);

/**
 * Builds the whole serving side at start-up, and makes the proxies through which services talk
 * back to clients. initialize() runs on the main thread, createProxy() on the receiver's worker.
 *
 * A client module has one sender for the factory's whole life, unless clients may reconnect:
 * then each registration of a client first clears up after those that have ended.
 */
class MediaServiceFactory : public PTC::InstanceFactory {
public:
    explicit MediaServiceFactory(bool reconnectsClients = false);
    ~MediaServiceFactory() override;

    /**
     * Builds receiver, services, adapters and server. False when the server could not start; all
     * else stays, and another call tries to start the server again.
     */
    bool initialize() override;

    /** No objects are made by id here. */
    void createInstance(long id, void** instance) override;

    /**
     * Puts `service`, an IMediaDiscovererService for id 51, an IMediaImporterService for id 56 or
     * an IMediaPlayerService for id 62, in the place of the one that initialize() would make. The
     * first one stays; other ids are ignored. initialize() takes ownership.
     */
    virtual void RegisterObject(long id, void* service);

    /** Adapters are made in initialize() only: null. */
    void* createAdapter(long id, PTC::IReceiver* receiver, void* target) override;

    /**
     * A proxy of interface `interfaceId` for object `proxyId` of the client at port
     * `clientIdentity`, connecting to the client when its module has no sender yet. Null for an
     * unknown interface, and when the client cannot be reached. The factory owns the proxy: to
     * its end, or to that of a client that may reconnect.
     */
    PTC::IProxyBase* createProxy(long interfaceId, long proxyId, long clientIdentity) override;

private:
    template<class Adapter, class Service, class Interface>
    void addService(long adapterId, Interface*& service);
    void buildServices();
    bool startServer();
    PTC::ISender* senderFor(long clientIdentity);

    // Services are owned by their adapters.
    IMediaDiscovererService* mpDiscovererService = nullptr;
    IMediaImporterService* mpImporterService = nullptr;
    IMediaPlayerService* mpPlayerService = nullptr;
    LTReceiver* mpThreadedReceiver = nullptr;   ///< owned by one of the next two
    std::unique_ptr<LTReceiver> mpIdleReceiver; ///< while no server runs

    std::optional<PTC::EndedClients> mEndedClients; ///< only where clients may reconnect
};
