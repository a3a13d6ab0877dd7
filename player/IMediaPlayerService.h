// SPDX-License-Identifier: MIT
#pragma once

#include "define/PlayerDefine.h"

class IMediaPlayerServiceCallBack;
struct _tagIMediaPlayerServiceNotify;

/**
 * The player as its clients see it: one player for all of them. An `int` argument is the client
 * id. Nothing is returned: answers go through the client's callback object, and an answer means
 * that the request was accepted, not that it was carried out.
 *
 * The order of the virtual operations is part of the binary interface.
 */
class IMediaPlayerService {
public:
    virtual ~IMediaPlayerService() = default;

    /** Warms the engine up; takes two seconds. */
    virtual void initializePlayer(int iClientID) = 0;

    /** Opens a path or URI. An empty name closes what is open, and is refused. */
    virtual void openPlayer(MediaServiceDefine::_tagFileName fileName) = 0;
    virtual void closePlayer(int iClientID) = 0;
    virtual void play(int iClientID) = 0;
    virtual void pause(int iClientID) = 0;
    virtual void seek(MediaServiceDefine::_tagSeekParam param) = 0;

    /** Answered with status 2 until an open has succeeded. */
    virtual void getPlayerStatus(int iClientID) = 0;
    virtual void setRepeat(MediaServiceDefine::_tagRepeatParam param) = 0;

    /** Ends the daemon. */
    virtual void powerOffMediaPlayer(int iClientID) = 0;

    /** Answered by setPlayerClientID(). The object is not owned; null is ignored. */
    virtual void registerCallBack(IMediaPlayerServiceCallBack* callback) = 0;

    /** The first object registered for a client stays. A null object is ignored. */
    virtual void registerNotify(_tagIMediaPlayerServiceNotify notify) = 0;
    virtual void unregisterCallBack(int iClientID) = 0;
    virtual void unregisterNotify(int iClientID) = 0;

    /** The display that the next open is for: zero is 50 Hz, anything else 60 Hz. */
    virtual void setSystemFormat(MediaServiceDefine::_emMediaServiceSystemFormat format) = 0;
};
