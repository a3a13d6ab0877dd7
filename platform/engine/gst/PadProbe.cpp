// SPDX-License-Identifier: MIT
#include "gst/PadProbe.h"

#include <memory>

#include "handle/Barrier.h"
#include "handle/CallbackData.h"

namespace gst {

namespace {

using Data = handle::CallbackData<PadProbe::Function>;

GstPadProbeReturn callFunction(GstPad*, GstPadProbeInfo* info, gpointer data) {
    return handle::guarded(GST_PAD_PROBE_OK, [&] {
        return static_cast<Data*>(data)->use([&](auto& function) { return function(*info); });
    });
}

void deleteData(gpointer data) {
    delete static_cast<Data*>(data);
}

} // namespace

PadProbe::PadProbe(Pad pad, GstPadProbeType what, Function function) : mPad(std::move(pad)) {
    auto data = std::make_unique<Data>(std::move(function));
    mId = gst_pad_add_probe(mPad.get(), what, callFunction, data.release(), deleteData);
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
