// SPDX-License-Identifier: MIT
// Playing has to go on in time whatever else the engine is asked for meanwhile.
#include <algorithm>
#include <atomic>
#include <filesystem>
#include <memory>
#include <string>
#include <thread>
#include <vector>

#include <gtest/gtest.h>

#include "LibMediaPlayer/IMediaDiscoverer.h"
#include "LibMediaPlayer/InterfaceFactory.h"
#include "tests/engine/BusyElsewhere.h"
#include "tests/engine/FrameWatch.h"
#include "tests/engine/Samples.h"
#include "tests/engine/TestPlayer.h"

using namespace LibMediaPlayer;

namespace {

constexpr int kDiscoverers = 10;
constexpr Seconds kFrameTime = 0.04_s;

/** Later than this, one sees it. */
constexpr Seconds kMostDelay = 2 * kSlowness * kFrameTime;

/** Discoverers that read and draw all samples over and over, each on a thread of its own. */
class Discoverers {
public:
    Discoverers() {
        std::string pattern = testing::TempDir() + "/qns-stutter-XXXXXX";
        mFolder = ::mkdtemp(pattern.data());
        for (int number = 0; number < kDiscoverers; ++number)
            mThreads.emplace_back([this, number] { work(number); });
    }
    ~Discoverers() {
        mStops = true;
        for (std::thread& thread : mThreads)
            thread.join();
        std::filesystem::remove_all(mFolder);
    }
    Discoverers(const Discoverers&) = delete;
    Discoverers& operator=(const Discoverers&) = delete;

    [[nodiscard]] int drawn() const { return mDrawn; }

private:
    void work(int number) {
        const std::unique_ptr<IMediaDiscoverer> pDiscoverer(InterfaceFactory::createDiscoverer());
        const auto target = (mFolder / (std::to_string(number) + ".jpg")).wstring();
        while (!mStops) {
            for (const Sample& sample : timedSamples()) {
                MediaMetaInfo info;
                if (mStops || pDiscoverer->open(samplePath(sample.name).wstring()) != kOk)
                    break;
                pDiscoverer->metadata(info);
                if (info.videoCount > 0 &&
                    pDiscoverer->makeImage(info.system.duration / 2, 320, 0, target) == kOk)
                    ++mDrawn;
            }
        }
    }

    std::filesystem::path mFolder;
    std::atomic<bool> mStops{false};
    std::atomic<int> mDrawn{0};
    std::vector<std::thread> mThreads; ///< last, so that they find everything else
};

/** Between when a frame was due and when it was put out, by the one that was the most in time. */
Seconds worstDelay(const std::vector<FrameWatch::Frame>& frames) {
    std::vector<Seconds> beginnings;
    for (const FrameWatch::Frame& frame : frames)
        beginnings.push_back(Seconds(frame.moment.time_since_epoch()) - frame.runningTime);
    const auto [first, last] = std::minmax_element(beginnings.begin(), beginnings.end());
    return beginnings.empty() ? Seconds{} : *last - *first;
}

} // namespace

TEST(Playback, DoesNotStutterWhileTenDiscoverersWork) {
    FrameWatch watch;
    TestPlayer player;
    ASSERT_EQ(player.open(samplePath("film.mp4")).result, kOk);
    const Discoverers discoverers;
    const BusyElsewhere others;
    player.play();
    player.await(kNotifyEnd);
    const Seconds disturbance = others.elapsed();

    const auto pictures = watch.rendered(true);
    const auto sound = watch.rendered(false);
    EXPECT_GE(discoverers.drawn(), kDiscoverers);
    EXPECT_GE(static_cast<double>(pictures.size()) + disturbance / kFrameTime,
              4.0_s / kFrameTime - 1);
    EXPECT_LT(worstDelay(pictures).count(), (kMostDelay + disturbance).count());
    EXPECT_LT(worstDelay(sound).count(), (kMostDelay + disturbance).count());
}
