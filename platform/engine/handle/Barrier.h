// SPDX-License-Identifier: MIT
#pragma once

#include <utility>

namespace handle {

/** Runs what a C library or a foreign thread called: nothing is thrown into the caller. */
template<typename Result, typename Function>
Result guarded(Result fallback, Function&& function) noexcept {
    try {
        return std::forward<Function>(function)();
    } catch (...) {
        return fallback;
    }
}

template<typename Function>
void guarded(Function&& function) noexcept {
    try {
        std::forward<Function>(function)();
    } catch (...) {
    }
}

} // namespace handle
