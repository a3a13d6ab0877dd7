// SPDX-License-Identifier: MIT
#pragma once

#include "player/IMediaPlayerServiceNotify.h"
#include "ptc/CallbackProxy.h"

/** Sends the player's notifications to a notify object in a client process. */
class MediaPlayerServiceNotifyRemoteProxy : public IMediaPlayerServiceNotify,
                                            public PTC::CallbackProxy {
public:
    /** `id` is the notify object's id inside the client process. */
    explicit MediaPlayerServiceNotifyRemoteProxy(long id);

    void mediaPlayerNotify(MediaServiceDefine::_tagMediaPlayerNotify notification) override;
};
