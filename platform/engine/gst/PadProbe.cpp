// SPDX-License-Identifier: MIT
#include "gst/PadProbe.h"

#include <memory>

#include "handle/Barrier.h"

namespace gst {

namespace {

GstPadProbeReturn callFunction(GstPad*, GstPadProbeInfo* info, gpointer function) {
    return handle::guarded(GST_PAD_PROBE_OK,
                           [&] { return (*static_cast<PadProbe::Function*>(function))(*info); });
}

void deleteFunction(gpointer function) {
    delete static_cast<PadProbe::Function*>(function);
}

} // namespace

PadProbe::PadProbe(Pad pad, GstPadProbeType what, Function function) : mPad(std::move(pad)) {
    auto owned = std::make_unique<Function>(std::move(function));
    mId = gst_pad_add_probe(mPad.get(), what, callFunction, owned.release(), deleteFunction);
}

PadProbe::PadProbe(PadProbe&& other) noexcept
    : mPad(std::move(other.mPad)), mId(std::exchange(other.mId, 0)) {}

PadProbe& PadProbe::operator=(PadProbe&& other) noexcept {
    if (this != &other) {
        remove();
        mPad = std::move(other.mPad);
        mId = std::exchange(other.mId, 0);
    }
    return *this;
}

void PadProbe::remove() {
    if (mId != 0)
        gst_pad_remove_probe(mPad.get(), std::exchange(mId, 0));
}

} // namespace gst
