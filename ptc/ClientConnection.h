// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/IProxy.h"
#include "ptc/ISender.h"

#include <map>
#include <memory>
#include <vector>

namespace PTC {

/** The way to one client process. What sends goes before what it sends through. */
struct ClientConnection {
    std::unique_ptr<ISender> pSender;
    std::vector<std::unique_ptr<IProxyBase>> proxies;
};

/** By the client's module id. */
using ClientConnections = std::map<long, ClientConnection>;

} // namespace PTC
