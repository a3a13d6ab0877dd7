// SPDX-License-Identifier: MIT
#pragma once

#include "discoverer/IMediaDiscovererServiceCallBack.h"
#include "ptc/CallbackProxy.h"

namespace MediaServiceDefine {
enum class DiscovererCallBack : long;
}

/** Sends the discoverer's answers to a callback object in a client process. */
class MediaDiscovererServiceCallBackRemoteProxy : public IMediaDiscovererServiceCallBack,
                                                  public PTC::CallbackProxy {
public:
    /** `id` is the callback object's id inside the client process. */
    explicit MediaDiscovererServiceCallBackRemoteProxy(long id);

    void setDiscovererClientID(int iClientID) override;
    void initializeDiscovererCallBack(int iResult) override;
    void openDiscovererCallBack(int iResult) override;
    void closeDiscovererCallBack(int iResult) override;
    void getMetaDataCallBack(MediaServiceDefine::_tagMediaMetaInfo info) override;
    void getImageCallBack(MediaServiceDefine::_tagMediaImageInfo info) override;
    void
    getSupportedExtensionsCallBack(MediaServiceDefine::_tagSupportedExtensions extensions) override;

private:
    void send(MediaServiceDefine::DiscovererCallBack method, int value);
};
