// SPDX-License-Identifier: MIT
#include "discoverer/MediaDiscovererServiceAdapter.h"

#include "define/DiscovererMethods.h"
#include "define/ObjectIds.h"
#include "pack/ArgumentReader.h"
#include "ptc/Event.h"
#include "ptc/FileNameArgument.h"

using namespace MediaServiceDefine;

namespace {

void deserialize_getImage_param(_tagImageParam& param, ArgumentReader& reader) {
    reader.read(param.iClientID);
    reader.read(param.iWidth);
    reader.read(param.iHeight);
    reader.read(param.lPosition);
    reader.read(param.strImagePath);
    reader.read(param.strNoticePath);
}

} // namespace

void MediaDiscovererServiceAdapter::receive(PTC::Event* event) {
    using Service = IMediaDiscovererService;
    static constexpr Method kMethods[] = {
        {DiscovererMethod::initializeDiscoverer, call<&Service::initializeDiscoverer>},
        {DiscovererMethod::openDiscoverer, call<&Service::openDiscoverer, PTC::readFileName>},
        {DiscovererMethod::closeDiscoverer, call<&Service::closeDiscoverer>},
        {DiscovererMethod::getMetadata, call<&Service::getMetadata>},
        {DiscovererMethod::getImage, call<&Service::getImage, deserialize_getImage_param>},
        {DiscovererMethod::getSupportedExtensions, call<&Service::getSupportedExtensions>},
        {DiscovererMethod::unregisterCallBack, call<&Service::unregisterCallBack>},
        {DiscovererMethod::registerCallBack,
         registerCallBack<&Service::registerCallBack, kDiscovererCallBackId>},
    };
    dispatch(kMethods, *event);
}
