// SPDX-License-Identifier: MIT
#include "discoverer/MediaDiscovererService.h"

#include <chrono>
#include <functional>
#include <future>
#include <string>

#include "tests/discoverer/DiscovererFixture.h"
#include "tests/support/OutputCapture.h"

using testing::Ge;
using testing::SizeIs;

namespace {

constexpr int kRounds = 300;

class DiscovererThreads : public DiscovererFixture {
protected:
    /** The main thread serves until the worker has ended, and then what is left. */
    void serveWhile(const std::function<void()>& worker) {
        OutputCapture output;
        auto done = std::async(std::launch::async, worker);
        while (done.wait_for(std::chrono::seconds(0)) != std::future_status::ready)
            runQueued();
        runQueued();
        output.text();
    }
};

} // namespace

TEST_F(DiscovererThreads, RequestsAndTheMainThreadDoNotDisturbEachOther) {
    registerClient();
    forget();
    serveWhile([this] {
        for (int round = 0; round < kRounds; ++round) {
            const int client = 1 + round % 2;
            request(kOpen, openRequest(client, "/" + std::to_string(round)));
            request(kGetMetadata, int32(client));
            request(kGetImage, imageRequest(client, "image", round % 3 == 0 ? "notice" : ""));
            request(kGetExtensions, int32(client));
            request(round % 5 == 0 ? kInitialize : kClose, int32(client));
        }
    });
    EXPECT_THAT(mSender.take(), SizeIs(5 * kRounds)) << "every request has one answer";
}

TEST_F(DiscovererThreads, ClientsMayComeAndGoWhileTheEngineWorksForThem) {
    int lastClient = 1;
    serveWhile([&] {
        for (int round = 0; round < kRounds; ++round) {
            request(kOpen, openRequest(lastClient, "/a"));
            request(kGetMetadata, int32(lastClient));
            request(kGetImage, imageRequest(lastClient, "image"));
            request(kUnregister, int32(lastClient));
            registerClient();
            ++lastClient;
        }
    });
    const auto sent = mSender.take();
    EXPECT_THAT(sent, SizeIs(Ge(static_cast<std::size_t>(kRounds)))) << "at least the ids";
    EXPECT_THAT(answersTo(kInitialize, int32(lastClient)), SizeIs(1));
}
