// SPDX-License-Identifier: MIT
#include "player/Timeline.h"

#include <algorithm>

namespace engine {

void Timeline::add(const Span& span) {
    if (mCount > 0 && last().base == span.base) {
        mSpans[mCount - 1] = span;
        return;
    }
    if (mCount == mSpans.size()) {
        std::rotate(mSpans.begin(), mSpans.begin() + 1, mSpans.end());
        --mCount;
    }
    mSpans[mCount++] = span;
}

Nanoseconds Timeline::positionAt(Nanoseconds runningTime) const {
    if (isEmpty())
        return runningTime;
    std::size_t index = mCount - 1;
    while (index > 0 && mSpans[index].base > runningTime)
        --index;
    const Span& span = mSpans[index];
    return span.position + std::max(runningTime - span.base, Nanoseconds::zero());
}

} // namespace engine
