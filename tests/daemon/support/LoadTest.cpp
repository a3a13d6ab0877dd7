// SPDX-License-Identifier: MIT
#include "tests/daemon/support/LoadTest.h"

#include <cstdio>
#include <cstdlib>
#include <random>
#include <string>

using namespace std::chrono_literals;
using std::chrono::duration;

namespace {

#ifdef __SANITIZE_THREAD__
constexpr bool kSignalsComeAtOnce = false; // busy threads have them wait
#else
constexpr bool kSignalsComeAtOnce = true;
#endif

/** The engine's pool of threads keeps some that have nothing to do. */
constexpr std::size_t kMostSpareThreads = 2;

unsigned seed() {
    const char* text = std::getenv("QNS_LOAD_SEED");
    return text ? static_cast<unsigned>(std::strtoul(text, nullptr, 10)) : std::random_device()();
}

} // namespace

void LoadTest::SetUp() {
    startLoad(options());
}

DaemonOptions LoadTest::options() const {
    DaemonOptions options;
    options.output = DaemonOptions::Output::discarded;
    options.environment["QNS_HV_DATA"] = mFolder.path("data");
    return options;
}

void LoadTest::startLoad(const DaemonOptions& options) {
    const unsigned number = seed();
    std::printf("QNS_LOAD_SEED=%u\n", number);
    mSyslog.keepOnly("onSystemSingleCaught");
    mLoad.reset();
    start(options);
    mLoad.emplace(mFolder.path(""), number);
    mLoad->begin();
}

LoadTest::Holdings LoadTest::holdings() const {
    return {mpDaemon->residentBytes(), mpDaemon->threadCount(), mpDaemon->descriptorCount()};
}

void LoadTest::expectReturnTo(const Holdings& before) const {
    EXPECT_TRUE(mpDaemon->waitForResources(before.descriptors, before.threads + kMostSpareThreads))
        << holdings().descriptors << " descriptors, " << before.descriptors << " before; "
        << holdings().threads << " threads, " << before.threads << " before";
}

void LoadTest::run(std::chrono::milliseconds time) {
    const auto before = mLoad->asked();
    const auto start = patience::Clock::now();
    mLoad->run(time);
    const duration<double> needed = patience::Clock::now() - start;
    const auto asked = mLoad->asked() - before;
    const auto held = holdings();
    std::printf("%zu requests, %.0f a second, %zu notifications to each client; %zu KiB, "
                "%zu threads, %zu descriptors\n",
                asked, static_cast<double>(asked) / needed.count(), mLoad->told(),
                held.bytes / 1024, held.threads, held.descriptors);
    std::fflush(stdout);
}

void LoadTest::endDuringLoad(std::chrono::milliseconds after) {
    mLoad->runInto(
        [this] {
            const auto start = patience::Clock::now();
            mpDaemon->signal(SIGTERM);
            EXPECT_EQ(mpDaemon->waitForEnd(), 0);
            const auto needed = patience::Clock::now() - start;
            EXPECT_TRUE(!kSignalsComeAtOnce || needed < patience::stretched(1s));
        },
        after);
    EXPECT_THAT(mSyslog.messages("onSystemSingleCaught"),
                testing::ElementsAre("MediaPlayerService 101: main::onSystemSingleCaught"));
}
