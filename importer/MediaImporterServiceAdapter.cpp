// SPDX-License-Identifier: MIT
#include "importer/MediaImporterServiceAdapter.h"

#include "define/ImporterMethods.h"
#include "define/ObjectIds.h"
#include "pack/ArgumentReader.h"
#include "ptc/Event.h"

using namespace MediaServiceDefine;

namespace {

void deserialize_import_param(_tagImportParam& param, ArgumentReader& reader) {
    reader.read(param.iClientID);
    reader.read(param.strParam1);
    reader.read(param.strParam2);
}

} // namespace

void MediaImporterServiceAdapter::receive(PTC::Event* event) {
    using Service = IMediaImporterService;
    static constexpr Method kMethods[] = {
        {ImporterMethod::initializeImporter, call<&Service::initializeImporter>},
        {ImporterMethod::import, call<&Service::import, deserialize_import_param>},
        {ImporterMethod::cancel, call<&Service::cancel>},
        {ImporterMethod::getImporterStatus, call<&Service::getImporterStatus>},
        {ImporterMethod::unregisterCallBack, call<&Service::unregisterCallBack>},
        {ImporterMethod::unregisterNotify, call<&Service::unregisterNotify>},
        {ImporterMethod::registerCallBack,
         registerCallBack<&Service::registerCallBack, kImporterCallBackId>},
        {ImporterMethod::registerNotify,
         registerNotify<&Service::registerNotify, kImporterNotifyId, PTC::RecordObjectId::bits32>},
    };
    dispatch(kMethods, *event);
}
