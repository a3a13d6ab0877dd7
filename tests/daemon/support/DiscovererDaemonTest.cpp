// SPDX-License-Identifier: MIT
#include "tests/daemon/support/DiscovererDaemonTest.h"

namespace {

/** One for each client that can be served, and the importer's. */
constexpr int kDiscoverers = 11;

const std::string kServiceName = "MediaDiscovererService 101: MediaDiscovererService::";

/** The priorities that begin a line. */
constexpr const char* kInformation = "<134>";
constexpr const char* kError = "<131>";

} // namespace

void DiscovererDaemonTest::SetUp() {
    startDiscoverers();
}

void DiscovererDaemonTest::startDiscoverers(const std::set<int>& refused) {
    auto options = withEngineDouble();
    options.environment["QNS_DISCOVERER_DOUBLE"] = mDiscoverers.address();
    start(options);
    for (int number = 0; number < kDiscoverers; ++number)
        mDiscoverers.expectCall("discoverer " + std::to_string(number) + " create",
                                refused.count(number) != 0 ? "null" : "return 0");
    ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
}

void DiscovererClientTest::SetUp() {
    ASSERT_NO_FATAL_FAILURE(startDiscoverers());
    mId = mClient.registerCallBack(kObject);
}

void DiscovererClientTest::open(const std::string& file) {
    mClient.open(mId, file);
    mDiscoverers.expectCall("discoverer 0 open " +
                            script::quoted(std::wstring(file.begin(), file.end())));
    mClient.expectResult(kObject, discoverer::kOpenCallBack, 0);
}

void DiscovererClientTest::expectServiceLog(const std::vector<std::string>& events) {
    EXPECT_TRUE(mSyslog.waitForLine(kServiceName, events.size()));
    std::vector<std::string> lines;
    for (const auto& event : events)
        lines.push_back(kServiceName + event);
    EXPECT_EQ(mSyslog.messages(kServiceName), lines);
    EXPECT_THAT(mSyslog.lines(kServiceName), testing::Each(testing::StartsWith(kInformation)));
}

void DiscovererClientTest::expectEngineFailure(const std::string& event) {
    const std::string line = "MediaDiscovererController 410: " + event;
    EXPECT_TRUE(mSyslog.waitForLine(line));
    EXPECT_THAT(mSyslog.messages(line), testing::ElementsAre(line));
    EXPECT_THAT(mSyslog.lines(line), testing::Each(testing::StartsWith(kError)));
}
