// SPDX-License-Identifier: MIT
#pragma once

#include "define/DiscovererDefine.h"

/**
 * What the discoverer answers to one client. Any thread may call these; nothing is reported back.
 *
 * The order of the virtual operations is part of the binary interface.
 */
class IMediaDiscovererServiceCallBack {
public:
    virtual ~IMediaDiscovererServiceCallBack() = default;

    /** The answer to a registration: the id that all requests of the client must carry. */
    virtual void setDiscovererClientID(int iClientID) = 0;
    virtual void initializeDiscovererCallBack(int iResult) = 0;
    virtual void openDiscovererCallBack(int iResult) = 0;
    virtual void closeDiscovererCallBack(int iResult) = 0;

    /** The record's blocks are not used any more when the call has returned. */
    virtual void getMetaDataCallBack(MediaServiceDefine::_tagMediaMetaInfo info) = 0;
    virtual void getImageCallBack(MediaServiceDefine::_tagMediaImageInfo info) = 0;
    virtual void
    getSupportedExtensionsCallBack(MediaServiceDefine::_tagSupportedExtensions extensions) = 0;
};
