// SPDX-License-Identifier: MIT
#pragma once

#include <utility>

namespace PTC {

/**
 * Runs `call` where nobody could handle its exceptions: on the threads of the framework. Lets
 * none out; returns whether the call ended without one.
 */
template<typename Call>
bool barrier(Call&& call) noexcept {
    try {
        std::forward<Call>(call)();
        return true;
    } catch (...) {
        return false;
    }
}

} // namespace PTC
