// SPDX-License-Identifier: MIT
#include <csignal>
#include <sstream>

#include <nlohmann/json.hpp>

#include "tests/cli/support/LibraryTest.h"

using testing::HasSubstr;
using testing::IsEmpty;

namespace {

class ToolWatches : public LibraryTest {};

TEST_F(ToolWatches, ThePlayerAndTheImporter) {
    Tool monitor(withIdentity({"monitor"}), Tool::Output::pipe);
    EXPECT_TRUE(monitor.waitFor("player    status  "));
    Tool play(withIdentity({"play", sample::shortSound()}));
    EXPECT_TRUE(monitor.waitFor("player    opened  " + sample::shortSound() +
                                ": 0 video, 1 audio, 0 text, 0:01.0, seekable\n"));
    EXPECT_TRUE(monitor.waitFor("-> playing, at 0:0"));
    EXPECT_TRUE(monitor.waitFor("player    end  at 0:01.0\n"));
    EXPECT_EQ(play.waitForExit(), 0);
    run({"import", sample::shortSound()});
    EXPECT_TRUE(monitor.waitFor("importer  finished  " + sample::shortSound() + "\n"));
    run({"import", sample::noise()}, 1);
    EXPECT_TRUE(monitor.waitFor("importer  finished  failed: not media"));
    monitor.signal(SIGINT);
    EXPECT_EQ(monitor.waitForExit(), 130);
    EXPECT_THAT(monitor.errors(), IsEmpty());
}

TEST_F(ToolWatches, ForProgramsToo) {
    Tool monitor(withIdentity({"monitor", "--json"}));
    EXPECT_TRUE(monitor.waitFor("\"status\""));
    run({"play", sample::noise()}, 1);
    run({"import", sample::shortSound()});
    EXPECT_TRUE(monitor.waitFor("\"finished\""));
    EXPECT_TRUE(monitor.waitFor("\n"));
    monitor.signal(SIGTERM);
    EXPECT_EQ(monitor.waitForExit(), 143);
    std::istringstream lines(monitor.output());
    std::vector<nlohmann::json> events;
    for (std::string line; std::getline(lines, line);)
        events.push_back(nlohmann::json::parse(line));
    ASSERT_GE(events.size(), 2U);
    EXPECT_EQ(events.front().at("service"), "player");
    EXPECT_EQ(events.back().at("service"), "importer");
    EXPECT_EQ(events.back().at("text"), sample::shortSound());
}

TEST_F(ToolWatches, UntilTheDaemonEnds) {
    Tool monitor(withIdentity({"monitor"}));
    EXPECT_TRUE(monitor.waitFor("player    status"));
    run({"poweroff"});
    EXPECT_EQ(monitor.waitForExit(), 4);
    EXPECT_THAT(monitor.errors(), HasSubstr("the daemon has ended"));
    EXPECT_EQ(mpDaemon->waitForExit(), 0);
}

class ToolPowersOff : public ToolTest {
protected:
    /** Somebody types `answer` when asked. */
    int answer(const char* answer) {
        Tool tool(withIdentity({"poweroff"}), Tool::Output::terminal);
        EXPECT_TRUE(tool.waitFor("[y/N] "));
        tool.press(answer);
        return tool.waitForExit();
    }
};

TEST_F(ToolPowersOff, TheDaemonWhenThatIsConfirmed) {
    EXPECT_EQ(answer("\n"), 1);
    EXPECT_EQ(answer("n\n"), 1);
    EXPECT_EQ(answer("x\n"), 1);
    EXPECT_TRUE(mpDaemon->isRunning());
    EXPECT_EQ(answer("y\n"), 0);
    EXPECT_EQ(mpDaemon->waitForExit(), 0);
}

TEST_F(ToolPowersOff, TheDaemonWithoutAskingWhereItIsToldTo) {
    Tool tool(withIdentity({"poweroff", "-y"}), Tool::Output::terminal);
    EXPECT_EQ(tool.waitForExit(), 0);
    EXPECT_THAT(tool.output(), IsEmpty());
    EXPECT_EQ(mpDaemon->waitForExit(), 0);
}

} // namespace
