// SPDX-License-Identifier: MIT
#pragma once

#include "player/IMediaPlayerServiceCallBack.h"
#include "ptc/CallbackProxy.h"

namespace MediaServiceDefine {
enum class PlayerCallBack : long;
}

/** Sends the player's answers to a callback object in a client process. */
class MediaPlayerServiceCallBackRemoteProxy : public IMediaPlayerServiceCallBack,
                                              public PTC::CallbackProxy {
public:
    /** `id` is the callback object's id inside the client process. */
    explicit MediaPlayerServiceCallBackRemoteProxy(long id);

    void setPlayerClientID(int iClientID) override;
    void initializePlayerCallBack(int iResult) override;
    void openPlayerCallBack(int iResult) override;
    void closePlayerCallBack(int iResult) override;
    void playCallBack(int iResult) override;
    void pauseCallBack(int iResult) override;
    void seekCallBack(int iResult) override;
    void getPlayerStatusCallBack(MediaServiceDefine::_tagMediaPlayerStatus status) override;
    void setRepeatCallBack(int iResult) override;

    /** Sends four zero bytes that are not encoded. */
    void powerOffMediaPlayerCallBack() override;

private:
    void send(MediaServiceDefine::PlayerCallBack method, int value);
};
