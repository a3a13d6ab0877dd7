// SPDX-License-Identifier: MIT
#include "player/FrameGate.h"

#include <gtest/gtest.h>

using engine::FrameGate;
using engine::Nanoseconds;

namespace {

/** How many of the frames of one second, at that rate, stamped in steps, pass. */
int countPassing(FrameGate& gate, int filmRate, Nanoseconds step = Nanoseconds(1)) {
    int count = 0;
    for (int frame = 0; frame < filmRate; ++frame) {
        const Nanoseconds time = Nanoseconds(std::chrono::seconds(1)) * frame / filmRate;
        count += gate.passes(time / step.count() * step.count());
    }
    return count;
}

} // namespace

TEST(FrameGate, LetsEveryFrameOfASlowerFilmThrough) {
    for (const int rate : {1, 24, 25, 30, 48, 50, 60}) {
        FrameGate gate(60);
        EXPECT_EQ(countPassing(gate, rate), rate);
    }
}

TEST(FrameGate, LetsAFilmOfTheDisplaysRateThroughThoughItsTimesAreRounded) {
    FrameGate gate(60);
    EXPECT_EQ(countPassing(gate, 60, std::chrono::milliseconds(1)), 60);
}

TEST(FrameGate, ThinsAFasterFilmOutToTheDisplaysRate) {
    for (const int rate : {72, 90, 100, 120, 240, 1000}) {
        FrameGate gate(60);
        EXPECT_NEAR(countPassing(gate, rate), 60, 1) << rate;
    }
    FrameGate gate(50);
    EXPECT_NEAR(countPassing(gate, 60), 50, 1);
}

TEST(FrameGate, BeginsAnewAfterAStepBack) {
    FrameGate gate(60);
    EXPECT_TRUE(gate.passes(std::chrono::seconds(10)));
    EXPECT_TRUE(gate.passes(std::chrono::seconds(1)));
    EXPECT_TRUE(gate.passes(std::chrono::seconds(2)));
}

TEST(FrameGate, DoesNotMakeUpForAPause) {
    FrameGate gate(60);
    EXPECT_TRUE(gate.passes(Nanoseconds(0)));
    // Were the time without frames saved up, this burst would pass whole.
    int count = 0;
    for (int frame = 0; frame < 10; ++frame)
        count += gate.passes(std::chrono::seconds(5) + std::chrono::milliseconds(frame));
    EXPECT_LE(count, 2);
}
