// SPDX-License-Identifier: MIT
#include "gst/Signal.h"

#include <memory>

#include "handle/Barrier.h"
#include "handle/CallbackData.h"

namespace gst {

namespace {

using PadFunction = std::function<void(const Pad&)>;
using PlainFunction = std::function<void()>;

void callPadFunction(GstElement*, GstPad* pad, gpointer data) {
    handle::guarded([&] {
        static_cast<handle::CallbackData<PadFunction>*>(data)->use(
            [&](auto& function) { function(Pad(kRef, pad)); });
    });
}

void callPlainFunction(GstElement*, gpointer data) {
    handle::guarded([&] {
        static_cast<handle::CallbackData<PlainFunction>*>(data)->use(
            [&](auto& function) { function(); });
    });
}

template<typename Function>
void deleteData(gpointer data, GClosure*) {
    delete static_cast<handle::CallbackData<Function>*>(data);
}

template<typename Function>
gulong connect(const Element& element, const char* signal, GCallback callback, Function function) {
    auto data = std::make_unique<handle::CallbackData<Function>>(std::move(function));
    return g_signal_connect_data(element.get(), signal, callback, data.release(),
                                 deleteData<Function>, GConnectFlags{});
}

} // namespace

Signal Signal::padAdded(const Element& element, PadFunction function) {
    return {element,
            connect(element, "pad-added", G_CALLBACK(callPadFunction), std::move(function))};
}

Signal Signal::noMorePads(const Element& element, PlainFunction function) {
    return {element,
            connect(element, "no-more-pads", G_CALLBACK(callPlainFunction), std::move(function))};
}

Signal::Signal(Signal&& other) noexcept
    : mElement(std::move(other.mElement)), mId(std::exchange(other.mId, 0)) {}

Signal& Signal::operator=(Signal&& other) noexcept {
    if (this != &other) {
        disconnect();
        mElement = std::move(other.mElement);
        mId = std::exchange(other.mId, 0);
    }
    return *this;
}

void Signal::disconnect() {
    if (mId != 0)
        g_signal_handler_disconnect(mElement.get(), std::exchange(mId, 0));
}

} // namespace gst
