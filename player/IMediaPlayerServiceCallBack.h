// SPDX-License-Identifier: MIT
#pragma once

#include "define/PlayerDefine.h"

/**
 * What the player answers to one client. Results are 0 for accepted and 1 for refused. Any
 * thread may call these; nothing is reported back.
 *
 * The order of the virtual operations is part of the binary interface.
 */
class IMediaPlayerServiceCallBack {
public:
    virtual ~IMediaPlayerServiceCallBack() = default;

    /** The answer to a registration: the id that all requests of the client must carry. */
    virtual void setPlayerClientID(int iClientID) = 0;
    virtual void initializePlayerCallBack(int iResult) = 0;
    virtual void openPlayerCallBack(int iResult) = 0;
    virtual void closePlayerCallBack(int iResult) = 0;
    virtual void playCallBack(int iResult) = 0;
    virtual void pauseCallBack(int iResult) = 0;
    virtual void seekCallBack(int iResult) = 0;
    virtual void getPlayerStatusCallBack(MediaServiceDefine::_tagMediaPlayerStatus status) = 0;
    virtual void setRepeatCallBack(int iResult) = 0;
    virtual void powerOffMediaPlayerCallBack() = 0;
};
