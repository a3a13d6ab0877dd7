// SPDX-License-Identifier: MIT
#include "player/MediaPlayerServiceAdapter.h"

#include "define/ObjectIds.h"
#include "define/PlayerMethods.h"
#include "pack/ArgumentReader.h"
#include "ptc/Event.h"
#include "ptc/FileNameArgument.h"

using namespace MediaServiceDefine;

namespace {

void deserialize_seek_param(_tagSeekParam& param, ArgumentReader& reader) {
    reader.read(param.iClientID);
    reader.read(param.iSeekMode);
    reader.read(param.lPosition);
    reader.read(param.bSeekOption);
}

void deserialize_setRepeat_param(_tagRepeatParam& param, ArgumentReader& reader) {
    reader.read(param.iClientID);
    reader.read(param.bRepeat);
    reader.read(param.lRepeatStart);
    reader.read(param.lRepeatEnd);
}

} // namespace

void MediaPlayerServiceAdapter::receive(PTC::Event* event) {
    using Service = IMediaPlayerService;
    static constexpr Method kMethods[] = {
        {PlayerMethod::initializePlayer, call<&Service::initializePlayer>},
        {PlayerMethod::openPlayer, call<&Service::openPlayer, PTC::readFileName>},
        {PlayerMethod::closePlayer, call<&Service::closePlayer>},
        {PlayerMethod::play, call<&Service::play>},
        {PlayerMethod::pause, call<&Service::pause>},
        {PlayerMethod::seek, call<&Service::seek, deserialize_seek_param>},
        {PlayerMethod::getPlayerStatus, call<&Service::getPlayerStatus>},
        {PlayerMethod::setRepeat, call<&Service::setRepeat, deserialize_setRepeat_param>},
        {PlayerMethod::powerOffMediaPlayer, call<&Service::powerOffMediaPlayer>},
        {PlayerMethod::unregisterCallBack, call<&Service::unregisterCallBack>},
        {PlayerMethod::unregisterNotify, call<&Service::unregisterNotify>},
        {PlayerMethod::setSystemFormat, call<&Service::setSystemFormat>},
        {PlayerMethod::registerCallBack,
         registerCallBack<&Service::registerCallBack, kPlayerCallBackId>},
        {PlayerMethod::registerNotify, registerNotify<&Service::registerNotify, kPlayerNotifyId>},
    };
    dispatch(kMethods, *event);
}
