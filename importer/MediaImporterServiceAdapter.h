// SPDX-License-Identifier: MIT
#pragma once

#include "importer/IMediaImporterService.h"
#include "importer/IMediaImporterServiceCallBack.h"
#include "importer/IMediaImporterServiceNotify.h"
#include "ptc/ServiceAdapter.h"

/**
 * Decodes the requests of importer clients and calls the service, its target, which it owns. A
 * request that lacks fields is passed on with their defaults: the service knows no such client.
 */
class MediaImporterServiceAdapter
    : public PTC::ServiceAdapter<IMediaImporterService, IMediaImporterServiceCallBack,
                                 IMediaImporterServiceNotify> {
public:
    using ServiceAdapter::ServiceAdapter;

    /** Method ids outside the importer's are ignored. */
    void receive(PTC::Event* event) override;
};
