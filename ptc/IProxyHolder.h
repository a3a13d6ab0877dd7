// SPDX-License-Identifier: MIT
#pragma once

namespace PTC {

class IProxyBase;

/** Keeps proxies that another owns. */
class IProxyHolder {
public:
    virtual ~IProxyHolder() = default;

    /**
     * Lets go of a proxy whose client has ended: what was registered through it is unregistered,
     * as if the client had asked. False while a thread that has looked it up before may still
     * use it; then ask again later. Called by the thread that dispatches events.
     */
    [[nodiscard]] virtual bool letGo(IProxyBase& proxy) = 0;
};

} // namespace PTC
