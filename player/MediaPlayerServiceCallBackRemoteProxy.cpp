// SPDX-License-Identifier: MIT
#include "player/MediaPlayerServiceCallBackRemoteProxy.h"

#include "define/PlayerMethods.h"
#include "pack/PackedArguments.h"
#include "ptc/CallbackReply.h"

using MediaServiceDefine::_tagMediaPlayerStatus;
using MediaServiceDefine::PlayerCallBack;

namespace {

PackedArguments serialize_getPlayerStatusCallBack_param(const _tagMediaPlayerStatus& status) {
    PackedArguments arguments;
    arguments.int32(status.iStatus)
        .int32(status.iReserved)
        .int64(status.lStatusValue1)
        .int64(status.lStatusValue2);
    return arguments;
}

} // namespace

MediaPlayerServiceCallBackRemoteProxy::MediaPlayerServiceCallBackRemoteProxy(long id)
    : PTC::CallbackProxy(id, true) {}

void MediaPlayerServiceCallBackRemoteProxy::setPlayerClientID(int iClientID) {
    send(PlayerCallBack::setPlayerClientID, iClientID);
}

void MediaPlayerServiceCallBackRemoteProxy::initializePlayerCallBack(int iResult) {
    send(PlayerCallBack::initializePlayer, iResult);
}

void MediaPlayerServiceCallBackRemoteProxy::openPlayerCallBack(int iResult) {
    send(PlayerCallBack::openPlayer, iResult);
}

void MediaPlayerServiceCallBackRemoteProxy::closePlayerCallBack(int iResult) {
    send(PlayerCallBack::closePlayer, iResult);
}

void MediaPlayerServiceCallBackRemoteProxy::playCallBack(int iResult) {
    send(PlayerCallBack::play, iResult);
}

void MediaPlayerServiceCallBackRemoteProxy::pauseCallBack(int iResult) {
    send(PlayerCallBack::pause, iResult);
}

void MediaPlayerServiceCallBackRemoteProxy::seekCallBack(int iResult) {
    send(PlayerCallBack::seek, iResult);
}

void MediaPlayerServiceCallBackRemoteProxy::getPlayerStatusCallBack(_tagMediaPlayerStatus status) {
    PTC::sendArguments(*this, static_cast<long>(PlayerCallBack::getPlayerStatus),
                       serialize_getPlayerStatusCallBack_param(status));
}

void MediaPlayerServiceCallBackRemoteProxy::setRepeatCallBack(int iResult) {
    send(PlayerCallBack::setRepeat, iResult);
}

void MediaPlayerServiceCallBackRemoteProxy::powerOffMediaPlayerCallBack() {
    int nothing = 0;
    invokeMethod(static_cast<long>(PlayerCallBack::powerOffMediaPlayer), &nothing, sizeof(nothing));
}

void MediaPlayerServiceCallBackRemoteProxy::send(PlayerCallBack method, int value) {
    PTC::sendInteger(*this, static_cast<long>(method), value);
}
