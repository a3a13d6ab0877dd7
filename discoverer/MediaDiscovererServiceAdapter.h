// SPDX-License-Identifier: MIT
#pragma once

#include "discoverer/IMediaDiscovererService.h"
#include "discoverer/IMediaDiscovererServiceCallBack.h"
#include "ptc/ServiceAdapter.h"

/**
 * Decodes the requests of discoverer clients and calls the service, its target, which it owns. A
 * request that lacks fields is passed on with their defaults.
 */
class MediaDiscovererServiceAdapter
    : public PTC::ServiceAdapter<IMediaDiscovererService, IMediaDiscovererServiceCallBack> {
public:
    using ServiceAdapter::ServiceAdapter;

    /** Method ids outside the discoverer's are ignored. */
    void receive(PTC::Event* event) override;
};
