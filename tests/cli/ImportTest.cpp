// SPDX-License-Identifier: MIT
#include <csignal>
#include <filesystem>
#include <fstream>

#include <nlohmann/json.hpp>

#include "tests/cli/support/LibraryTest.h"

using testing::AllOf;
using testing::EndsWith;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
using testing::StartsWith;

namespace fs = std::filesystem;

namespace {

class ToolImports : public LibraryTest {
protected:
    /** Sound as long as a file of that kind can tell, of which only the beginning is on the disk.
     */
    fs::path longSound() {
        fs::path path = mFolder / "long.wav";
        fs::copy_file(sample::shortSound(), path);
        std::fstream file(path, std::ios::in | std::ios::out | std::ios::binary);
        constexpr std::uint32_t kSize = 3'000'000'000U;
        writeSize(file, 4, kSize - 8);
        file.seekg(0);
        std::string head(4096, '\0');
        file.read(head.data(), static_cast<std::streamsize>(head.size()));
        file.clear();
        const std::size_t data = head.find("data");
        writeSize(file, data + 4, kSize - static_cast<std::uint32_t>(data) - 8);
        file.close();
        fs::resize_file(path, kSize);
        return path;
    }

private:
    static void writeSize(std::fstream& file, std::size_t at, std::uint32_t size) {
        file.seekp(static_cast<std::streamoff>(at));
        for (int shift = 0; shift < 32; shift += 8)
            file.put(static_cast<char>(size >> shift & 0xff));
    }
};

TEST_F(ToolImports, AFileWhereItLies) {
    EXPECT_THAT(run({"import", sample::film()}),
                AllOf(StartsWith("Imported 1 file, "), Not(HasSubstr("failed"))));
    EXPECT_THAT(mErrors, IsEmpty());
    EXPECT_THAT(run({"library", "list"}), AllOf(HasSubstr("0:10.0"), HasSubstr("A film")));
}

TEST_F(ToolImports, ACopyIntoAFolderOfTheLibrary) {
    const auto told = nlohmann::json::parse(
        run({"import", "--json", "--to", "films/new", sample::filmWithUnicodeName()}));
    ASSERT_EQ(told.at("imported").size(), 1U) << told;
    const fs::path copy = told.at("imported").at(0).at("path").get<std::string>();
    EXPECT_EQ(copy, dataFolder() / "media/films/new" /
                        fs::path(sample::filmWithUnicodeName()).filename());
    EXPECT_EQ(fs::file_size(copy), fs::file_size(sample::filmWithUnicodeName()));
}

TEST_F(ToolImports, FilesOfTheSameNameSideBySide) {
    for (const char* name : {"a", "b", "c"}) {
        fs::create_directory(mFolder / name);
        fs::copy_file(sample::shortSound(), mFolder / name / "same.wav");
    }
    const auto told = nlohmann::json::parse(run({"import", "--json", "--to", "x", mFolder / "a",
                                                 mFolder / "b", mFolder / "c" / "same.wav"}));
    std::vector<std::string> names;
    for (const auto& file : told.at("imported"))
        names.push_back(fs::path(file.at("path").get<std::string>()).filename());
    EXPECT_THAT(names, testing::ElementsAre("same.wav", "same (2).wav", "same (3).wav"));
}

TEST_F(ToolImports, WhatAFolderHoldsThatCanBePlayed) {
    fs::create_directories(mFolder / "deep/er/.hidden");
    fs::copy_file(sample::shortSound(), mFolder / "deep/one.WAV");
    fs::copy_file(sample::shortSound(), mFolder / "deep/er/two.wav");
    fs::copy_file(sample::shortSound(), mFolder / "deep/er/.hidden/three.wav");
    std::ofstream(mFolder / "deep/notes.doc") << "no medium";
    fs::create_directory_symlink(mFolder, mFolder / "deep/circle");
    EXPECT_THAT(run({"import", mFolder / "deep"}), StartsWith("Imported 2 files, "));
    EXPECT_THAT(mErrors, IsEmpty());
}

TEST_F(ToolImports, AndTellsWhatFailedAndWhy) {
    EXPECT_THAT(
        run({"import", sample::film(), "/no/such.mp4", sample::noise(), mFolder / "none"}, 1),
        AllOf(StartsWith("Imported 1 file, "), HasSubstr("; 3 files failed")));
    EXPECT_THAT(mErrors, HasSubstr("qnsmedia: /no/such.mp4: not found\n"));
    EXPECT_THAT(mErrors, HasSubstr("qnsmedia: " + sample::noise() + ": not media"));
}

TEST_F(ToolImports, AndTellsOfAFolderThatLeavesTheLibrary) {
    EXPECT_THAT(run({"import", sample::film(), "--to", "../outside"}, 1),
                HasSubstr("1 file failed"));
    EXPECT_THAT(mErrors, HasSubstr("../outside"));
    EXPECT_THAT(run({"library", "list"}), IsEmpty());
}

TEST_F(ToolImports, AFileOnlyOnceHoweverOftenItIsNamed) {
    fs::create_symlink(sample::film(), mFolder / "link.mp4");
    EXPECT_THAT(run({"import", sample::film(), sample::film(), mFolder / "link.mp4"}),
                StartsWith("Imported 1 file, "));
}

TEST_F(ToolImports, AndShowsAProgressBarInATerminal) {
    Tool tool(withIdentity({"import", longSound(), "--to", "long"}), Tool::Output::terminal);
    EXPECT_TRUE(tool.waitFor("0/1 files, "));
    EXPECT_TRUE(tool.waitFor(" MB of 3.0 GB, "));
    EXPECT_TRUE(tool.waitFor("/s, 0:"));
    EXPECT_TRUE(tool.waitFor(" left"));
    tool.signal(SIGINT);
    EXPECT_EQ(tool.waitForExit(), 130);
    EXPECT_THAT(tool.output(), EndsWith("; 1 file cancelled\r\n"));
    EXPECT_TRUE(fs::is_empty(dataFolder() / "media/long"));
}

TEST_F(ToolImports, SeveralFilesThatAreCancelledTogether) {
    const fs::path sound = longSound();
    Tool tool(withIdentity({"import", sound, sample::film(), "--to", "long"}),
              Tool::Output::terminal);
    EXPECT_TRUE(tool.waitFor(" MB of 3.0 GB, "));
    tool.signal(SIGTERM);
    EXPECT_EQ(tool.waitForExit(), 143);
    EXPECT_THAT(tool.output(), HasSubstr("Imported 0 files, 0 B, in "));
    EXPECT_THAT(tool.output(), EndsWith("; 2 files cancelled\r\n"));
    EXPECT_THAT(tool.errors(), IsEmpty());
}

TEST_F(ToolImports, UntilTheDaemonEnds) {
    Tool tool(withIdentity({"import", longSound(), "--to", "long"}), Tool::Output::terminal);
    EXPECT_TRUE(tool.waitFor(" MB of 3.0 GB, "));
    mpDaemon->signal(SIGKILL);
    EXPECT_EQ(tool.waitForExit(), 4);
    EXPECT_THAT(tool.errors(), HasSubstr("the daemon has ended"));
    EXPECT_EQ(mpDaemon->waitForExit(), 137);
}

} // namespace
