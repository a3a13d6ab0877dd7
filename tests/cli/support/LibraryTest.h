// SPDX-License-Identifier: MIT
#pragma once

#include <cstdlib>
#include <filesystem>
#include <string>
#include <utility>
#include <vector>

#include "tests/cli/support/ToolTest.h"

/** The tool and the daemon with a media library of their own. */
class LibraryTest : public ToolTest {
protected:
    void SetUp() override {
        std::string pattern = testing::TempDir() + "/qns-library-XXXXXX";
        mFolder = ::mkdtemp(pattern.data());
        std::filesystem::create_directory(dataFolder());
        ::setenv("QNS_HV_DATA", dataFolder().c_str(), 1);
        ToolTest::SetUp();
    }
    void TearDown() override {
        ToolTest::TearDown();
        std::filesystem::remove_all(mFolder);
    }

    [[nodiscard]] std::filesystem::path dataFolder() const { return mFolder / "data"; }

    /** Runs the tool, which must end with this status, and returns what it has written. */
    std::string run(std::vector<std::string> arguments, int status = 0) {
        // What only reads the database needs no identity.
        if (arguments.front() != "library")
            arguments = withIdentity(std::move(arguments));
        Tool tool(std::move(arguments));
        EXPECT_EQ(tool.waitForExit(), status) << tool.errors();
        mErrors = tool.errors();
        return tool.output();
    }

    std::filesystem::path mFolder;
    std::string mErrors;
};
