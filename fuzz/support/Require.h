// SPDX-License-Identifier: MIT
#pragma once

#include <cstdlib>

namespace fuzz {

/** What must hold whatever the input is: the fuzzer keeps the input with which it does not. */
inline void require(bool holds) {
    if (!holds)
        std::abort();
}

} // namespace fuzz
