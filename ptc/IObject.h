// SPDX-License-Identifier: MIT
#pragma once

namespace PTC {

/** Root of everything that the framework addresses by number. */
class IObject {
public:
    virtual ~IObject() = default;
    virtual long getId() = 0;
};

} // namespace PTC
