// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/IProxy.h"

#include <cstdint>

namespace PTC {

/** Sends callbacks and notifications to one object of a client. Any thread may call it. */
class CallbackProxy : public IProxyBase {
public:
    /** Only the low 32 bits of `id` count. `isRemote` goes into every event. */
    CallbackProxy(long id, bool isRemote);

    long getId() override;
    void setSender(ISender* sender) override;

    /** `data` stays with the caller. A sender must have been set. A failure is silent. */
    virtual void invokeMethod(long methodId, void* data, long size);

private:
    int32_t mId;
    bool mIsRemote;
    ISender* mpSender = nullptr;
};

} // namespace PTC
