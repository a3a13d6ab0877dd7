// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/IObject.h"

namespace PTC {

class IReceiver;

/** The end of a process's transport: takes packets and routes them to local receivers. */
class IRemoteReceiver : public IObject {
public:
    virtual bool initialize(long identity) = 0;
    virtual long getIdentity() = 0;

    /** Takes ownership, unless the id is present already: then nothing happens. */
    virtual void addReceiver(IReceiver* receiver) = 0;
};

} // namespace PTC
