// SPDX-License-Identifier: MIT
#include <cstdio>
#include <ctime>

#include "tests/daemon/support/LoadTest.h"

using namespace std::chrono_literals;

namespace {

/** The time as a program tells it that has the double. */
std::time_t secondsOfLateProgram() {
    FILE* const program = ::popen("LD_PRELOAD=" QNS_CLOCK_DOUBLE " date +%s", "r");
    long seconds = 0;
    EXPECT_EQ(std::fscanf(program, "%ld", &seconds), 1);
    EXPECT_EQ(::pclose(program), 0);
    return seconds;
}

class Clock : public LoadTest {
protected:
    void SetUp() override {
        auto late = options();
        late.environment["LD_PRELOAD"] = QNS_CLOCK_DOUBLE;
        startLoad(late);
    }
};

TEST(ClockDouble, IsLate) {
    EXPECT_LT(secondsOfLateProgram(), std::time(nullptr));
}

TEST_F(Clock, ThatIsSetBackAllTheTimeHarmsNobody) {
    run(2s);
}

} // namespace
