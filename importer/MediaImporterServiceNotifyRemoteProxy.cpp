// SPDX-License-Identifier: MIT
#include "importer/MediaImporterServiceNotifyRemoteProxy.h"

#include "define/ImporterMethods.h"
#include "pack/PackedArguments.h"
#include "ptc/CallbackReply.h"

using MediaServiceDefine::_tagMediaImporterNotify;
using MediaServiceDefine::ImporterNotify;

namespace {

// The type in the smallest form, all other numbers not: clients count on both.
PackedArguments serialize_mediaImporterNotify_param(const _tagMediaImporterNotify& notification) {
    PackedArguments arguments;
    arguments.integer(notification.iNotifyType)
        .int32(notification.iRet)
        .text(notification.strText1)
        .text(notification.strText2)
        .text(notification.strText3);
    for (const int value : notification.iValue)
        arguments.int32(value);
    return arguments;
}

} // namespace

MediaImporterServiceNotifyRemoteProxy::MediaImporterServiceNotifyRemoteProxy(long id)
    : PTC::CallbackProxy(id, true) {}

void MediaImporterServiceNotifyRemoteProxy::mediaImporterNotify(
    _tagMediaImporterNotify notification) {
    PTC::sendArguments(*this, static_cast<long>(ImporterNotify::mediaImporterNotify),
                       serialize_mediaImporterNotify_param(notification));
}
