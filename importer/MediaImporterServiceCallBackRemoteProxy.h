// SPDX-License-Identifier: MIT
#pragma once

#include "importer/IMediaImporterServiceCallBack.h"
#include "ptc/CallbackProxy.h"

namespace MediaServiceDefine {
enum class ImporterCallBack : long;
}

/** Sends the importer's answers to a callback object in a client process. */
class MediaImporterServiceCallBackRemoteProxy : public IMediaImporterServiceCallBack,
                                                public PTC::CallbackProxy {
public:
    /** `id` is the callback object's id inside the client process. */
    explicit MediaImporterServiceCallBackRemoteProxy(long id);

    void setImporterClientID(int iClientID) override;
    void initializeImporterCallBack(int iResult) override;
    void importCallBack(int iResult) override;
    void cancelCallBack(int iResult) override;
    void getImporterStatusCallBack(MediaServiceDefine::_tagMediaImporterStatus status) override;

private:
    void send(MediaServiceDefine::ImporterCallBack method, int value);
};
