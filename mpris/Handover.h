// SPDX-License-Identifier: MIT
#pragma once

#include <exception>
#include <functional>
#include <memory>
#include <utility>

#include "cli/EventLoop.h"

namespace mpris {

/** What becomes of something that was asked for: null, or the error. */
using Reply = std::function<void(std::exception_ptr error)>;

/**
 * Brings what the library tells on its own thread to the loop's. What arrives there after this
 * object has gone is dropped, so that it can outlive nothing that it uses. Made and destroyed on
 * the loop's thread; its functions may be called by any, for as long as the loop exists.
 */
class Handover {
public:
    explicit Handover(EventLoop& loop) : mLoop(loop) {}
    Handover(const Handover&) = delete;
    Handover& operator=(const Handover&) = delete;

    /** A function that calls `call` with the same arguments on the loop's thread. */
    template<typename... Arguments, typename Call>
    auto to(Call call) const {
        return [this, call = std::move(call)](Arguments... arguments) {
            mLoop.post([here = std::weak_ptr<void>(mpHere), call, arguments...] {
                if (!here.expired())
                    call(arguments...);
            });
        };
    }

private:
    EventLoop& mLoop;
    const std::shared_ptr<void> mpHere = std::make_shared<char>();
};

} // namespace mpris
