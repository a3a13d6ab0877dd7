// SPDX-License-Identifier: MIT
#include <csignal>
#include <cstdio>
#include <optional>
#include <utility>

#include "tests/cli/support/ToolTest.h"

using testing::HasSubstr;

namespace {

constexpr const char* kLeft = "\x1b[D";
constexpr const char* kRight = "\x1b[C";
constexpr const char* kDown = "\x1b[B";

/** The tool in a terminal, playing a film of ten seconds. */
class ToolKeys : public ToolTest {
protected:
    void SetUp() override {
        ToolTest::SetUp();
        if (HasFatalFailure())
            return;
        mTool.emplace(withIdentity({"play", sample::film()}), Tool::Output::terminal);
        ASSERT_TRUE(mTool->waitFor("playing"));
    }

    void TearDown() override {
        mTool.reset();
        ToolTest::TearDown();
    }

    /** The last complete line of the status, such as "playing  0:01.2 / 0:10.0  A-". */
    [[nodiscard]] std::string line() const {
        const std::string& all = mTool->output();
        const std::size_t end = all.rfind("\x1b[K");
        const std::size_t begin = all.rfind('\r', end);
        return all.substr(begin + 1, end - begin - 1);
    }

    /** In seconds. */
    [[nodiscard]] double position() const {
        const std::string text = line();
        int minutes = 0;
        double seconds = 0;
        const std::size_t number = text.find_first_of("0123456789");
        EXPECT_EQ(std::sscanf(text.c_str() + number, "%d:%lf", &minutes, &seconds), 2) << text;
        return 60 * minutes + seconds;
    }

    void waitForPosition(double from, double to) {
        mTool->waitUntil([=] { return position() >= from && position() < to; });
    }

    bool waitForLine(std::string_view text) {
        return mTool->waitUntil([=] { return line().find(text) != std::string::npos; });
    }

    void pause() {
        mTool->press(" ");
        waitForLine("paused");
    }

    std::optional<Tool> mTool;
};

TEST_F(ToolKeys, SpacePausesAndResumes) {
    pause();
    mTool->press(" ");
    waitForLine("playing");
}

TEST_F(ToolKeys, ArrowsSeek) {
    pause();
    const double start = position();
    mTool->press(kRight);
    waitForPosition(start + 4.9, start + 5.2);
    mTool->press(kLeft);
    waitForPosition(start - 0.2, start + 0.2);
    mTool->press(kRight);
    waitForPosition(start + 4.9, start + 5.2);
    mTool->press(kDown);
    waitForPosition(0, 0.2);
}

TEST_F(ToolKeys, AAndBLoopUntilOneOfThemIsPressedAgain) {
    waitForPosition(0.5, 10);
    mTool->press("a");
    waitForLine("A-");
    const double start = position();
    waitForPosition(start + 0.7, 10);
    mTool->press("b");
    waitForLine("A-B");
    double last = position();
    mTool->waitUntil([&] { return position() < std::exchange(last, position()) - 0.3; });
    EXPECT_GE(position(), start - 0.3);
    mTool->press("b");
    mTool->waitUntil([&] { return line().find("A-") == std::string::npos; });
    waitForPosition(start + 2, 10);
}

TEST_F(ToolKeys, BWithoutAAndUnknownKeysDoNothing) {
    mTool->press("bxyz\x1b\x1bOP\x7f");
    waitForPosition(1, 10);
    EXPECT_THAT(line(), Not(HasSubstr("A-")));
}

TEST_F(ToolKeys, QQuitsAndClosesTheMedium) {
    mTool->press("q");
    EXPECT_EQ(mTool->waitForExit(), 0);
    EXPECT_THAT(mTool->output(), HasSubstr("stopped\r\n"));
    expectClosed();
}

TEST_F(ToolKeys, ControlCIsTheSignal) {
    mTool->press("\x03");
    EXPECT_EQ(mTool->waitForExit(), 130);
    expectClosed();
}

TEST_F(ToolKeys, ATerminalThatHangsUpEndsIt) {
    mTool->closeOutput();
    EXPECT_THAT(mTool->waitForExit(), testing::AnyOf(1, 128 + SIGHUP));
    expectClosed();
}

TEST_F(ToolKeys, TheTerminalIsGivenBackAsItWas) {
    EXPECT_EQ(mTool->terminal().c_lflag & (ICANON | ECHO), 0U);
    mTool->press("q");
    EXPECT_EQ(mTool->waitForExit(), 0);
    EXPECT_EQ(mTool->terminal().c_lflag & (ICANON | ECHO), static_cast<unsigned>(ICANON | ECHO));
}

} // namespace
