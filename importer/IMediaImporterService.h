// SPDX-License-Identifier: MIT
#pragma once

#include "define/ImporterDefine.h"

class IMediaImporterServiceCallBack;
struct _tagIMediaImporterServiceNotify;

/**
 * The importer as its clients see it: one importer for all of them. An `int` argument is the
 * client id. Nothing is returned: answers go through the client's callback object, and an answer
 * means that the request was accepted, not that it was carried out.
 *
 * The order of the virtual operations is part of the binary interface.
 */
class IMediaImporterService {
public:
    virtual ~IMediaImporterService() = default;

    virtual void initializeImporter(int iClientID) = 0;

    /** What comes of it is told to the notify objects. */
    virtual void import(MediaServiceDefine::_tagImportParam param) = 0;

    /** Ends all imports, whichever client asked for them. */
    virtual void cancel(int iClientID) = 0;
    virtual void getImporterStatus(int iClientID) = 0;

    /** Answered by setImporterClientID(). The object is not owned; null is ignored. */
    virtual void registerCallBack(IMediaImporterServiceCallBack* callback) = 0;

    /** The first object registered for a client stays. A null object is ignored. */
    virtual void registerNotify(_tagIMediaImporterServiceNotify notify) = 0;
    virtual void unregisterCallBack(int iClientID) = 0;
    virtual void unregisterNotify(int iClientID) = 0;
};
