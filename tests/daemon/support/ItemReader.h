// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <cstdint>
#include <string>
#include <utility>

#include "tests/daemon/support/WireFormat.h"

/** Reads the items of an argument block one after another, each by its own tag. */
class ItemReader {
public:
    explicit ItemReader(wire::Bytes bytes) : mBytes(std::move(bytes)) {}

    /** An integer in any of its forms; anything else fails the test. */
    std::int64_t integer();

    /** A raw without the zero at its end. */
    std::string text();

private:
    int next();
    std::int64_t number(std::size_t width, bool isSigned);

    wire::Bytes mBytes;
    std::size_t mOffset = 0;
};
