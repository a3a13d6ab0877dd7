// SPDX-License-Identifier: MIT
#include "player/MediaPlayerServiceNotifyRemoteProxy.h"

#include "define/PlayerMethods.h"
#include "pack/PackedArguments.h"
#include "ptc/CallbackReply.h"

using MediaServiceDefine::_tagMediaPlayerNotify;
using MediaServiceDefine::PlayerNotify;

namespace {

// Type and parameters in the smallest form, the result not: clients count on both.
PackedArguments serialize_mediaPlayerNotify_param(const _tagMediaPlayerNotify& notification) {
    PackedArguments arguments;
    arguments.integer(notification.iNotifyType)
        .int32(notification.iNotifyResult)
        .text(notification.strNotifyText)
        .integer(notification.iNotifyParam1)
        .integer(notification.iNotifyParam2)
        .integer(notification.iNotifyParam3)
        .uint64(notification.ulNotifyValue1)
        .uint64(notification.ulNotifyValue2)
        .int64(notification.lNotifyValue);
    return arguments;
}

} // namespace

MediaPlayerServiceNotifyRemoteProxy::MediaPlayerServiceNotifyRemoteProxy(long id)
    : PTC::CallbackProxy(id, true) {}

void MediaPlayerServiceNotifyRemoteProxy::mediaPlayerNotify(_tagMediaPlayerNotify notification) {
    PTC::sendArguments(*this, static_cast<long>(PlayerNotify::mediaPlayerNotify),
                       serialize_mediaPlayerNotify_param(notification));
}
