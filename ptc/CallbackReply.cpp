// SPDX-License-Identifier: MIT
#include "ptc/CallbackReply.h"

#include "pack/PackedArguments.h"
#include "ptc/CallbackProxy.h"

#include <utility>

namespace PTC {

void sendArguments(CallbackProxy& proxy, long methodId, PackedArguments arguments) {
    proxy.invokeMethod(methodId, arguments.data(), static_cast<long>(arguments.size()));
}

void sendInteger(CallbackProxy& proxy, long methodId, int32_t value) {
    PackedArguments arguments;
    arguments.int32(value);
    sendArguments(proxy, methodId, std::move(arguments));
}

} // namespace PTC
