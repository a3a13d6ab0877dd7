// SPDX-License-Identifier: MIT
#pragma once

#include <functional>

#include "gst/Types.h"

namespace gst {

/**
 * A function connected to a signal of an element until the object goes. It runs on the thread
 * that emits, and a call that has begun may outlast the object; it must own what it uses.
 */
class Signal {
public:
    Signal() = default;
    ~Signal() { disconnect(); }

    Signal(Signal&& other) noexcept;
    Signal& operator=(Signal&& other) noexcept;
    Signal(const Signal&) = delete;
    Signal& operator=(const Signal&) = delete;

    static Signal padAdded(const Element& element, std::function<void(const Pad&)> function);
    static Signal noMorePads(const Element& element, std::function<void()> function);

private:
    Signal(Element element, gulong id) : mElement(std::move(element)), mId(id) {}
    void disconnect();

    Element mElement;
    gulong mId = 0;
};

} // namespace gst
