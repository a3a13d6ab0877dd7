// SPDX-License-Identifier: MIT
#pragma once

#include <functional>

#include "gst/Types.h"

namespace gst {

/**
 * Watches what passes a pad until the object goes. The function runs on streaming threads, and a
 * call that has begun may outlast the object; it must own what it uses.
 */
class PadProbe {
public:
    using Function = std::function<GstPadProbeReturn(const GstPadProbeInfo&)>;

    PadProbe() = default;
    PadProbe(Pad pad, GstPadProbeType what, Function function);
    ~PadProbe() { remove(); }

    PadProbe(PadProbe&& other) noexcept;
    PadProbe& operator=(PadProbe&& other) noexcept;
    PadProbe(const PadProbe&) = delete;
    PadProbe& operator=(const PadProbe&) = delete;

private:
    void remove();

    Pad mPad;
    gulong mId = 0;
};

} // namespace gst
