// SPDX-License-Identifier: MIT
#include "tests/daemon/support/Patience.h"

#include <algorithm>
#include <cstdlib>

namespace patience {

namespace {

#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
constexpr double kBuildFactor = 5;
#else
constexpr double kBuildFactor = 1;
#endif

double environmentFactor() {
    const char* text = std::getenv("QNS_TEST_PATIENCE");
    const double value = text == nullptr ? 1 : std::atof(text);
    return value > 0 ? value : 1;
}

} // namespace

double factor() {
    static const double product = kBuildFactor * environmentFactor();
    return product;
}

std::chrono::milliseconds stretched(std::chrono::milliseconds promised) {
    return std::chrono::milliseconds(static_cast<long>(promised.count() * factor()));
}

Clock::time_point deadline() {
    using namespace std::chrono_literals;
    return Clock::now() + stretched(20s);
}

int pollTimeout(Clock::time_point deadline) {
    const auto left = std::chrono::ceil<std::chrono::milliseconds>(deadline - Clock::now()).count();
    return static_cast<int>(std::clamp<long>(left, 0, 3'600'000));
}

} // namespace patience
