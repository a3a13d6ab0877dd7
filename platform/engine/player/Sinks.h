// SPDX-License-Identifier: MIT
#pragma once

#include "gst/Types.h"

namespace engine {

/**
 * Elements that show pictures and play sound: the device's where there are any, else such as
 * only keep real time. What works is found out once per process, at the first call. `window` is a
 * native handle, or null. Engine threads.
 */
gst::Element makeVideoSink(void* window);
gst::Element makeAudioSink();

} // namespace engine
