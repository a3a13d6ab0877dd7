// SPDX-License-Identifier: MIT
#pragma once

/** Method ids of the discoverer's two interfaces, as they stand in packets. */
namespace MediaServiceDefine {

/** Requests. The registrations stand the other way round than in the interface. */
enum class DiscovererMethod : long {
    initializeDiscoverer = 1,
    openDiscoverer = 2,
    closeDiscoverer = 3,
    getMetadata = 4,
    getImage = 5,
    getSupportedExtensions = 6,
    unregisterCallBack = 7,
    registerCallBack = 8
};

/** Callbacks to a client. */
enum class DiscovererCallBack : long {
    setDiscovererClientID = 1,
    initializeDiscoverer = 2,
    openDiscoverer = 3,
    closeDiscoverer = 4,
    getMetadata = 5,
    getImage = 6,
    getSupportedExtensions = 7
};

} // namespace MediaServiceDefine
