// SPDX-License-Identifier: MIT
#pragma once

#include "define/DiscovererDefine.h"

class IMediaDiscovererServiceCallBack;

/**
 * The discoverer as its clients see it: tells what a media file is and makes pictures of it. An
 * `int` argument is the client id. Nothing is returned: answers go through the client's callback
 * object.
 *
 * Ten clients at a time have a slot of their own for one open file; the requests of any further
 * client are refused until one of the ten has unregistered.
 *
 * The order of the virtual operations is part of the binary interface.
 */
class IMediaDiscovererService {
public:
    virtual ~IMediaDiscovererService() = default;

    /** Makes the slot ready for an open, whatever became of the last one. */
    virtual void initializeDiscoverer(int iClientID) = 0;

    /** Answered with 0, the engine's return code, or 5 when a file is open already. */
    virtual void openDiscoverer(MediaServiceDefine::_tagFileName fileName) = 0;
    virtual void closeDiscoverer(int iClientID) = 0;
    virtual void getMetadata(int iClientID) = 0;

    /**
     * A client that names a notice path finds the word "notice" there before it is answered. The
     * path is that of the last request, whichever client made it.
     */
    virtual void getImage(MediaServiceDefine::_tagImageParam param) = 0;
    virtual void getSupportedExtensions(int iClientID) = 0;

    /** Answered by setDiscovererClientID(). The object is not owned; null is ignored. */
    virtual void registerCallBack(IMediaDiscovererServiceCallBack* callback) = 0;

    /** Frees the client's slot, and leaves the file that is open on it to the next client. */
    virtual void unregisterCallBack(int iClientID) = 0;
};
