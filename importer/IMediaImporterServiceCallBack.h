// SPDX-License-Identifier: MIT
#pragma once

#include "define/ImporterDefine.h"

/**
 * What the importer answers to one client. Results are 0 for accepted and 1 for refused. Any
 * thread may call these; nothing is reported back.
 *
 * The order of the virtual operations is part of the binary interface.
 */
class IMediaImporterServiceCallBack {
public:
    virtual ~IMediaImporterServiceCallBack() = default;

    /** The answer to a registration: the id that all requests of the client must carry. */
    virtual void setImporterClientID(int iClientID) = 0;
    virtual void initializeImporterCallBack(int iResult) = 0;
    virtual void importCallBack(int iResult) = 0;
    virtual void cancelCallBack(int iResult) = 0;
    virtual void getImporterStatusCallBack(MediaServiceDefine::_tagMediaImporterStatus status) = 0;
};
