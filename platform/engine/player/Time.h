// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>

namespace engine {

using Nanoseconds = std::chrono::nanoseconds;
using SteadyClock = std::chrono::steady_clock;
using TimePoint = SteadyClock::time_point;

inline constexpr TimePoint kNever = TimePoint::max();

} // namespace engine
