// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstddef>

#include "player/Time.h"

namespace engine {

/**
 * Tells positions in the medium from running time, which only grows while the pipeline plays. A
 * loop makes several spans: each begins at a running time of its own at the same position.
 */
class Timeline {
public:
    struct Span {
        Nanoseconds base{};     ///< running time at which the span begins
        Nanoseconds position{}; ///< position in the medium there
    };

    void clear() { mCount = 0; }
    [[nodiscard]] bool isEmpty() const { return mCount == 0; }

    /** The newest spans are kept; only those are ever still to be played. */
    void add(const Span& span);

    [[nodiscard]] Nanoseconds positionAt(Nanoseconds runningTime) const;
    [[nodiscard]] const Span& last() const { return mSpans[mCount - 1]; }

private:
    std::array<Span, 8> mSpans{};
    std::size_t mCount = 0;
};

} // namespace engine
