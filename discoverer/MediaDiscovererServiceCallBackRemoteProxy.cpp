// SPDX-License-Identifier: MIT
#include "discoverer/MediaDiscovererServiceCallBackRemoteProxy.h"

#include "define/DiscovererMethods.h"
#include "pack/PackedArguments.h"
#include "ptc/CallbackReply.h"

using namespace MediaServiceDefine;

namespace {

// Clients read the flags as integers, and the length of each block a second time behind it.
PackedArguments serialize_getMetaDataCallBack_param(const _tagMediaMetaInfo& info) {
    PackedArguments arguments;
    arguments.int32(info.iResult)
        .int32(info.iRet)
        .text(info.systemInfo.strNarrowInfo)
        .text(info.systemInfo.strWideInfo)
        .integer(info.systemInfo.bFlag1)
        .integer(info.systemInfo.bFlag2)
        .int64(info.systemInfo.lDuration)
        .raw(info.pVideoData, static_cast<uint64_t>(info.iVideoDataSize))
        .int32(info.iVideoDataSize)
        .int32(info.iVideoCount)
        .raw(info.pAudioData, static_cast<uint64_t>(info.iAudioDataSize))
        .int32(info.iAudioDataSize)
        .int32(info.iAudioCount);
    return arguments;
}

PackedArguments serialize_getImageCallBack_param(const _tagMediaImageInfo& info) {
    PackedArguments arguments;
    arguments.int32(info.iResult).int32(info.iRet).text(info.strFileName).text(info.strImagePath);
    return arguments;
}

PackedArguments
serialize_getSupportedExtensionsCallBack_param(const _tagSupportedExtensions& extensions) {
    PackedArguments arguments;
    arguments.text(extensions.strExtensions)
        .int32(extensions.iReserved)
        .int32(extensions.iExtensionValue);
    return arguments;
}

} // namespace

MediaDiscovererServiceCallBackRemoteProxy::MediaDiscovererServiceCallBackRemoteProxy(long id)
    : PTC::CallbackProxy(id, true) {}

void MediaDiscovererServiceCallBackRemoteProxy::setDiscovererClientID(int iClientID) {
    send(DiscovererCallBack::setDiscovererClientID, iClientID);
}

void MediaDiscovererServiceCallBackRemoteProxy::initializeDiscovererCallBack(int iResult) {
    send(DiscovererCallBack::initializeDiscoverer, iResult);
}

void MediaDiscovererServiceCallBackRemoteProxy::openDiscovererCallBack(int iResult) {
    send(DiscovererCallBack::openDiscoverer, iResult);
}

void MediaDiscovererServiceCallBackRemoteProxy::closeDiscovererCallBack(int iResult) {
    send(DiscovererCallBack::closeDiscoverer, iResult);
}

void MediaDiscovererServiceCallBackRemoteProxy::getMetaDataCallBack(_tagMediaMetaInfo info) {
    PTC::sendArguments(*this, static_cast<long>(DiscovererCallBack::getMetadata),
                       serialize_getMetaDataCallBack_param(info));
}

void MediaDiscovererServiceCallBackRemoteProxy::getImageCallBack(_tagMediaImageInfo info) {
    PTC::sendArguments(*this, static_cast<long>(DiscovererCallBack::getImage),
                       serialize_getImageCallBack_param(info));
}

void MediaDiscovererServiceCallBackRemoteProxy::getSupportedExtensionsCallBack(
    _tagSupportedExtensions extensions) {
    PTC::sendArguments(*this, static_cast<long>(DiscovererCallBack::getSupportedExtensions),
                       serialize_getSupportedExtensionsCallBack_param(extensions));
}

void MediaDiscovererServiceCallBackRemoteProxy::send(DiscovererCallBack method, int value) {
    PTC::sendInteger(*this, static_cast<long>(method), value);
}
