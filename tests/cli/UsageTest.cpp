// SPDX-License-Identifier: MIT
#include "tests/cli/support/ToolTest.h"

using testing::HasSubstr;
using testing::IsEmpty;
using testing::StartsWith;

namespace {

void expectUsageError(const std::vector<std::string>& arguments) {
    Tool tool(arguments);
    EXPECT_EQ(tool.waitForExit(), 2) << testing::PrintToString(arguments);
    EXPECT_THAT(tool.output(), IsEmpty());
    EXPECT_FALSE(tool.errors().empty());
}

TEST(ToolUsage, HelpTellsTheCommandsAndTheExitCodes) {
    Tool tool({"--help"});
    EXPECT_EQ(tool.waitForExit(), 0);
    for (const char* word : {"play", "status", "--identity", "--timeout", "Exit status", "128 + N"})
        EXPECT_THAT(tool.output(), HasSubstr(word));
    EXPECT_THAT(tool.errors(), IsEmpty());
}

TEST(ToolUsage, EveryCommandHasHelp) {
    for (const char* command :
         {"play", "status", "info", "image", "extensions", "import", "monitor", "poweroff"}) {
        Tool tool({command, "--help"});
        EXPECT_EQ(tool.waitForExit(), 0);
        EXPECT_THAT(tool.output(), HasSubstr("Example: qnsmedia " + std::string(command)));
    }
}

TEST(ToolUsage, TellsItsVersion) {
    Tool tool({"--version"});
    EXPECT_EQ(tool.waitForExit(), 0);
    EXPECT_THAT(tool.output(), StartsWith("qnsmedia "));
}

TEST(ToolUsage, WrongUsageIsTwo) {
    expectUsageError({});
    expectUsageError({"dance"});
    expectUsageError({"play"});
    expectUsageError({"play", "a", "b"});
    expectUsageError({"status", "--yaml"});
    expectUsageError({"--identity", "999", "status"});
    expectUsageError({"--identity", "x", "status"});
    expectUsageError({"--timeout", "0", "status"});
    expectUsageError({"--timeout", "86401", "status"});
}

TEST(ToolUsage, AMissingDaemonIsThree) {
    for (const auto& arguments : {std::vector<std::string>{"status"}, {"play", "/film.mp4"}}) {
        Tool tool(arguments);
        EXPECT_EQ(tool.waitForExit(), 3);
        EXPECT_THAT(tool.errors(), StartsWith("qnsmedia: the daemon is not running"));
        EXPECT_THAT(tool.output(), IsEmpty());
    }
}

TEST(ToolUsage, ADaemonThatGivesNoAnswerIsFour) {
    const auto daemon = listenOn(kDaemonPort);
    Tool tool({"--timeout", "0.1", "status"});
    EXPECT_EQ(tool.waitForExit(), 4);
    EXPECT_THAT(tool.errors(), HasSubstr("no answer"));
}

} // namespace
