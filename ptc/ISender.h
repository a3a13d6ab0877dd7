// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/IObject.h"

namespace PTC {

struct Event;

/** Carries events to another process. */
class ISender : public IObject {
public:
    /** Takes ownership of the event, not of its argument block. */
    virtual void send(Event* event) = 0;
};

/** A sender that knows the process that it talks to. */
class IRemoteSender : public ISender {
public:
    virtual bool initialize(long identity) = 0;
    virtual void setId(long id) = 0;
};

} // namespace PTC
