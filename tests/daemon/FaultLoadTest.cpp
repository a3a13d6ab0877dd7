// SPDX-License-Identifier: MIT
#include <csignal>

#include "tests/daemon/support/LoadTest.h"
#include "tests/daemon/support/MediaClient.h"
#include "tests/daemon/support/SampleMedia.h"
#include "tests/engine/Mount.h"

using namespace std::chrono_literals;

namespace {

/** Eight clients at once, and something around the daemon that is not as it should be. */
class FaultLoad : public LoadTest {
protected:
    void SetUp() override {}
};

TEST_F(FaultLoad, WithoutRoomForTheLibraryIsAnsweredAsEver) {
    const auto disk = Mount::memory(mFolder.path("data"), 200'000);
    startLoad(options());
    run(1s);
}

TEST_F(FaultLoad, WithoutRoomForLogFilesIsAnsweredAsEver) {
    const auto disk = Mount::memory("/var/log", 8192);
    startLoad(options());
    run(1s);
}

TEST_F(FaultLoad, WithALocaleThatIsNotThereIsAnsweredAsEver) {
    auto foreign = options();
    foreign.environment["LC_ALL"] = "xx_XX.UTF-8";
    startLoad(foreign);
    run(1s);
}

TEST_F(FaultLoad, ThatIsKilledInTheMiddleLosesOnlyWhatWasNotTold) {
    for (int life = 0; life < 2; ++life) {
        startLoad(options());
        mLoad->runInto(
            [this] {
                mpDaemon->signal(SIGKILL);
                EXPECT_EQ(mpDaemon->waitForExit(), 128 + SIGKILL);
            },
            1s);
    }
    mLoad.reset();
    start(options());
    MediaClient client(1000);
    EXPECT_EQ(client.import(sample::film()), 0);
    EXPECT_EQ(client.import(sample::shortSound(), "Sounds"), 0);
    EXPECT_EQ(client.play(sample::film()), 0);
}

} // namespace
