// SPDX-License-Identifier: MIT
#include "main/CommandLine.h"

#include <cstdlib>
#include <optional>
#include <string>
#include <vector>

#include <gmock/gmock.h>

using ::testing::HasSubstr;
using ::testing::internal::CaptureStderr;
using ::testing::internal::CaptureStdout;
using ::testing::internal::GetCapturedStderr;
using ::testing::internal::GetCapturedStdout;

namespace {

CommandLine read(std::vector<std::string> arguments) {
    std::vector<char*> argv{const_cast<char*>("QNSMediaService")};
    for (std::string& argument : arguments)
        argv.push_back(argument.data());
    return readCommandLine(static_cast<int>(argv.size()), argv.data());
}

TEST(CommandLine, WithoutOptionsStartsTheService) {
    const CommandLine result = read({});
    EXPECT_EQ(result.exitStatus, std::nullopt);
    EXPECT_FALSE(result.choosesPlatform);
    EXPECT_EQ(readCommandLine(0, nullptr).exitStatus, std::nullopt);
}

TEST(CommandLine, ClientsMayReconnectOnlyWhenAskedFor) {
    EXPECT_FALSE(read({"-platform", "offscreen"}).reconnectsClients);
    const CommandLine result = read({"--reconnect-clients", "-platform", "offscreen"});
    EXPECT_TRUE(result.reconnectsClients);
    EXPECT_TRUE(result.choosesPlatform);
    EXPECT_EQ(result.exitStatus, std::nullopt);
}

TEST(CommandLine, HelpIsPrintedAndThatIsAll) {
    for (const char* option : {"--help", "-h"}) {
        CaptureStdout();
        EXPECT_EQ(read({option}).exitStatus, 0);
        EXPECT_THAT(GetCapturedStdout(), HasSubstr("Usage: QNSMediaService"));
    }
}

TEST(CommandLine, TheVersionIsPrintedAndThatIsAll) {
    CaptureStdout();
    EXPECT_EQ(read({"--version"}).exitStatus, 0);
    EXPECT_EQ(GetCapturedStdout(), "QNSMediaService " QNS_VERSION "\n");
}

TEST(CommandLine, WhatNobodyKnowsIsRefused) {
    for (const char* argument : {"--halp", "-x", "film.mp4", "", "-", "--", "---platform"}) {
        CaptureStderr();
        EXPECT_EQ(read({"-platform", "offscreen", argument}).exitStatus, 2) << argument;
        EXPECT_THAT(GetCapturedStderr(), HasSubstr(std::string(": ") + argument + " (try --help)"));
    }
}

TEST(CommandLine, AQtOptionNeedsItsValue) {
    CaptureStderr();
    EXPECT_EQ(read({"-platform"}).exitStatus, 2);
    EXPECT_THAT(GetCapturedStderr(), HasSubstr("option without its value: -platform"));
}

TEST(CommandLine, QtOptionsAreLeftToQt) {
    EXPECT_EQ(read({"-style", "--help", "-reverse", "--plugin", "x"}).exitStatus, std::nullopt);
}

TEST(CommandLine, APlatformMayBeChosenWithOneDashOrTwo) {
    EXPECT_TRUE(read({"-platform", "offscreen"}).choosesPlatform);
    EXPECT_TRUE(read({"--platform", "offscreen"}).choosesPlatform);
    EXPECT_FALSE(read({"-style", "-platform"}).choosesPlatform);
}

class Platform : public ::testing::Test {
protected:
    Platform() {
        for (const char* variable : {"DISPLAY", "WAYLAND_DISPLAY", "QT_QPA_PLATFORM"})
            ::unsetenv(variable);
    }
    ~Platform() override {
        ::unsetenv("DISPLAY");
        ::unsetenv("WAYLAND_DISPLAY");
        ::setenv("QT_QPA_PLATFORM", "offscreen", 1);
    }

    static std::string chosen() {
        choosePlatform();
        const char* platform = std::getenv("QT_QPA_PLATFORM");
        return platform != nullptr ? platform : "Qt's own";
    }
};

TEST_F(Platform, WithoutADisplayDrawsNowhere) {
    EXPECT_EQ(chosen(), "offscreen");
}

TEST_F(Platform, EmptyVariablesAreNone) {
    for (const char* variable : {"DISPLAY", "WAYLAND_DISPLAY", "QT_QPA_PLATFORM"})
        ::setenv(variable, "", 1);
    EXPECT_EQ(chosen(), "offscreen");
}

TEST_F(Platform, WithADisplayIsQtsOwn) {
    ::setenv("DISPLAY", ":0", 1);
    EXPECT_EQ(chosen(), "Qt's own");
    ::unsetenv("DISPLAY");
    ::setenv("WAYLAND_DISPLAY", "wayland-0", 1);
    EXPECT_EQ(chosen(), "Qt's own");
}

TEST_F(Platform, TheEnvironmentsChoiceStays) {
    ::setenv("QT_QPA_PLATFORM", "minimal", 1);
    EXPECT_EQ(chosen(), "minimal");
}

} // namespace
