// SPDX-License-Identifier: MIT
#include "importer/MediaImporterServiceCallBackRemoteProxy.h"

#include "define/ImporterMethods.h"
#include "pack/PackedArguments.h"
#include "ptc/CallbackReply.h"

using MediaServiceDefine::_tagMediaImporterStatus;
using MediaServiceDefine::ImporterCallBack;

namespace {

PackedArguments serialize_getImporterStatusCallBack_param(const _tagMediaImporterStatus& status) {
    PackedArguments arguments;
    arguments.int32(status.iStatus)
        .int32(status.iReserved)
        .int64(status.llValue1)
        .int64(status.llValue2);
    return arguments;
}

} // namespace

MediaImporterServiceCallBackRemoteProxy::MediaImporterServiceCallBackRemoteProxy(long id)
    : PTC::CallbackProxy(id, true) {}

void MediaImporterServiceCallBackRemoteProxy::setImporterClientID(int iClientID) {
    send(ImporterCallBack::setImporterClientID, iClientID);
}

void MediaImporterServiceCallBackRemoteProxy::initializeImporterCallBack(int iResult) {
    send(ImporterCallBack::initializeImporter, iResult);
}

void MediaImporterServiceCallBackRemoteProxy::importCallBack(int iResult) {
    send(ImporterCallBack::import, iResult);
}

void MediaImporterServiceCallBackRemoteProxy::cancelCallBack(int iResult) {
    send(ImporterCallBack::cancel, iResult);
}

void MediaImporterServiceCallBackRemoteProxy::getImporterStatusCallBack(
    _tagMediaImporterStatus status) {
    PTC::sendArguments(*this, static_cast<long>(ImporterCallBack::getImporterStatus),
                       serialize_getImporterStatusCallBack_param(status));
}

void MediaImporterServiceCallBackRemoteProxy::send(ImporterCallBack method, int value) {
    PTC::sendInteger(*this, static_cast<long>(method), value);
}
