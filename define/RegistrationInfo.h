// SPDX-License-Identifier: MIT
#pragma once

/** What a client sends to register its callback object. */
struct _tagCallBackInfo {
    long lObjectID = 0; ///< the callback object inside the client process
    long lIdentity = 0; ///< the client process: 1000 to 1007, also its loopback port
};

/** What a client sends to register its notify object. */
struct _tagNotifyInfo {
    long lObjectID = 0;
    long lIdentity = 0;
    int iClientID = 0; ///< the id that the client got through its callback object
};
