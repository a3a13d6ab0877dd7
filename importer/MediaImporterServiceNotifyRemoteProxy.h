// SPDX-License-Identifier: MIT
#pragma once

#include "importer/IMediaImporterServiceNotify.h"
#include "ptc/CallbackProxy.h"

/** Sends the importer's notifications to a notify object in a client process. */
class MediaImporterServiceNotifyRemoteProxy : public IMediaImporterServiceNotify,
                                              public PTC::CallbackProxy {
public:
    /** `id` is the notify object's id inside the client process. */
    explicit MediaImporterServiceNotifyRemoteProxy(long id);

    void mediaImporterNotify(MediaServiceDefine::_tagMediaImporterNotify notification) override;
};
