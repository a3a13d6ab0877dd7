// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/IObject.h"

namespace PTC {

class ISender;

/** Stands for an object in another process. */
class IProxyBase : public IObject {
public:
    /** The sender must outlive the proxy. */
    virtual void setSender(ISender* sender) = 0;
};

} // namespace PTC
