// SPDX-License-Identifier: MIT
#pragma once

#include "player/IMediaPlayerService.h"
#include "player/IMediaPlayerServiceCallBack.h"
#include "player/IMediaPlayerServiceNotify.h"
#include "ptc/ServiceAdapter.h"

/**
 * Decodes the requests of player clients and calls the service, its target, which it owns. A
 * request that lacks fields is passed on with their defaults: the service knows no such client.
 */
class MediaPlayerServiceAdapter
    : public PTC::ServiceAdapter<IMediaPlayerService, IMediaPlayerServiceCallBack,
                                 IMediaPlayerServiceNotify> {
public:
    using ServiceAdapter::ServiceAdapter;

    /** Method ids outside the player's are ignored. */
    void receive(PTC::Event* event) override;
};
