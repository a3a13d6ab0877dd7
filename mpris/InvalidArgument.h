// SPDX-License-Identifier: MIT
#pragma once

#include <stdexcept>

namespace mpris {

/** What was asked for cannot be understood. */
class InvalidArgument : public std::invalid_argument {
public:
    using std::invalid_argument::invalid_argument;
};

} // namespace mpris
