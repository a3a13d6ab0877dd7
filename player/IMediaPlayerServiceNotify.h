// SPDX-License-Identifier: MIT
#pragma once

#include "define/PlayerDefine.h"

/** What the player tells one client unasked. Called on threads of the engine. */
class IMediaPlayerServiceNotify {
public:
    virtual ~IMediaPlayerServiceNotify() = default;

    virtual void mediaPlayerNotify(MediaServiceDefine::_tagMediaPlayerNotify notification) = 0;
};

/** A notify object and the client that registers it. */
struct _tagIMediaPlayerServiceNotify {
    IMediaPlayerServiceNotify* pNotify = nullptr; ///< not owned; may be null
    int iClientID = 0;
};
