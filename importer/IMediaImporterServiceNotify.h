// SPDX-License-Identifier: MIT
#pragma once

#include "define/ImporterDefine.h"

/** What the importer tells one client unasked. Called on the main thread. */
class IMediaImporterServiceNotify {
public:
    virtual ~IMediaImporterServiceNotify() = default;

    virtual void mediaImporterNotify(MediaServiceDefine::_tagMediaImporterNotify notification) = 0;
};

/** A notify object and the client that registers it. */
struct _tagIMediaImporterServiceNotify {
    IMediaImporterServiceNotify* pNotify = nullptr; ///< not owned; may be null
    int iClientID = 0;
};
