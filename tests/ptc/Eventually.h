// SPDX-License-Identifier: MIT
#pragma once

#include "tests/ptc/Gate.h"

#include <chrono>
#include <thread>

/** Waits until something that announces itself nowhere has become true. */
template<typename Condition>
[[nodiscard]] bool eventually(Condition&& condition) {
    const auto end = std::chrono::steady_clock::now() + kPatience;
    while (!condition()) {
        if (std::chrono::steady_clock::now() > end)
            return false;
        std::this_thread::sleep_for(std::chrono::milliseconds(1));
    }
    return true;
}
