// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <cstdint>
#include <string_view>
#include <vector>

#include "probe/FileInput.h"

namespace probe {

/** An input seen in pieces, for those who look at little of much. For one thread. */
class Window {
public:
    /** Reads so many bytes at once. */
    Window(FileInput& input, std::size_t size) : mInput(input), mBytes(size) {}

    [[nodiscard]] std::int64_t inputSize() const { return mInput.size(); } ///< bytes

    /**
     * The bytes from a place on, at least so many, the window's size at most; fewer only where the
     * input ends. Valid until the next call.
     */
    std::string_view at(std::int64_t place, std::size_t least);

private:
    void moveTo(std::int64_t place);

    FileInput& mInput;
    std::vector<char> mBytes;
    std::int64_t mBegin = 0;
    std::size_t mCount = 0;
};

} // namespace probe
