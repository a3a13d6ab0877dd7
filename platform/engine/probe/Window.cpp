// SPDX-License-Identifier: MIT
#include "probe/Window.h"

namespace probe {

std::string_view Window::at(std::int64_t place, std::size_t least) {
    const auto end = mBegin + static_cast<std::int64_t>(mCount);
    if (place < mBegin || place + static_cast<std::int64_t>(least) > end)
        moveTo(place);
    const auto offset = static_cast<std::size_t>(place - mBegin);
    return {mBytes.data() + offset, mCount - offset};
}

void Window::moveTo(std::int64_t place) {
    mBegin = place;
    mCount = mInput.readAt(place, mBytes.data(), mBytes.size());
}

} // namespace probe
