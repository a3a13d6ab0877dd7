// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <cstdint>
#include <deque>
#include <random>

#include "tests/daemon/support/Life.h"

namespace load {

/**
 * A client process that asks at random, and keeps account of the answers that come in the order
 * of its requests. What the daemon answers when it has done something comes between these, and is
 * somebody else's account. For one thread.
 */
class Link : public Life {
public:
    Link(long identity, unsigned seed) : Life(identity), mRandom(seed) {}

    /** A number below `end`. */
    unsigned below(unsigned end) { return static_cast<unsigned>(mRandom() % end); }

    /** True in `percent` of 100 cases. */
    bool happens(unsigned percent) { return below(100) < percent; }

    /** Sends a request whose answer, if it has one, has no fixed place among the others. */
    void ask(const WireService& service, long method, const wire::Bytes& arguments);

    /** Sends a request that is answered with this result, behind those that were sent before. */
    void askFor(const WireService& service, long method, const wire::Bytes& arguments,
                long answerMethod, std::int32_t result);

    /** This packet must be the next of the answers in order. */
    void take(const wire::Packet& packet);

    /** How many answers in order are still to come. */
    [[nodiscard]] std::size_t owed() const { return mOwed.size(); }

    /** Requests up to now. */
    [[nodiscard]] std::size_t asked() const { return mAsked; }

private:
    std::mt19937 mRandom;
    std::deque<wire::Packet> mOwed;
    std::size_t mAsked = 0;
};

} // namespace load
