// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

class PackedArguments;

namespace PTC {

class CallbackProxy;

/** Sends what has been packed to the proxy's object. Any thread may call these. */
void sendArguments(CallbackProxy& proxy, long methodId, PackedArguments arguments);

/** Sends one number in its 32-bit form, as most callbacks do. */
void sendInteger(CallbackProxy& proxy, long methodId, int32_t value);

} // namespace PTC
