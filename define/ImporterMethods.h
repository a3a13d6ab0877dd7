// SPDX-License-Identifier: MIT
#pragma once

/** Method ids of the importer's three interfaces, as they stand in packets. */
namespace MediaServiceDefine {

/** Requests. The registrations come last although the interface has them before. */
enum class ImporterMethod : long {
    initializeImporter = 1,
    import = 2,
    cancel = 3,
    getImporterStatus = 4,
    unregisterCallBack = 5,
    unregisterNotify = 6,
    registerCallBack = 7,
    registerNotify = 8
};

/** Callbacks to a client. */
enum class ImporterCallBack : long {
    setImporterClientID = 1,
    initializeImporter = 2,
    import = 3,
    cancel = 4,
    getImporterStatus = 5
};

/** Notifications to a client. */
enum class ImporterNotify : long { mediaImporterNotify = 1 };

} // namespace MediaServiceDefine
