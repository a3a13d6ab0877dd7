// SPDX-License-Identifier: MIT
// docs/library.md is right: its commands print what it says, over a library that was imported,
// and its tables have the columns that it names.
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <cstdlib>
#include <fstream>
#include <future>
#include <sstream>

#include "importer/LookProbe.h"
#include "tests/engine/CommandOutput.h"
#include "tests/engine/Samples.h"
#include "tests/engine/TestImporter.h"
#include "worker/Media.h"

using namespace LibMediaPlayer;
namespace fs = std::filesystem;

namespace {

constexpr char kDataOfPage[] = "/var/lib/qnsmedia";

std::vector<std::string> linesOf(std::istream& stream) {
    std::vector<std::string> lines;
    for (std::string line; std::getline(stream, line);)
        lines.push_back(line);
    return lines;
}

std::vector<std::string> pageLines() {
    std::ifstream page(QNS_SOURCE_DIR "/docs/library.md");
    EXPECT_TRUE(page);
    return linesOf(page);
}

/** A command of the page, and what it says that is printed. */
struct Example {
    std::string command;
    std::string output;
};

std::vector<Example> examples() {
    std::vector<Example> found;
    bool inside = false;
    for (const std::string& line : pageLines()) {
        if (line.rfind("```", 0) == 0)
            inside = line == "```sh";
        else if (inside && line.rfind("$ ", 0) == 0)
            found.push_back({line.substr(2), {}});
        else if (inside)
            found.back().output += line + "\n";
    }
    return found;
}

/** Names in the first column of the table below that headline. */
std::vector<std::string> columnsOnPage(const std::string& headline) {
    std::vector<std::string> names;
    bool inside = false;
    for (const std::string& line : pageLines()) {
        if (line.rfind('#', 0) == 0)
            inside = line == headline;
        else if (inside && line.rfind("| `", 0) == 0)
            names.push_back(line.substr(3, line.find('`', 3) - 3));
    }
    return names;
}

class LibraryPage : public testing::Test {
protected:
    void SetUp() override {
        std::promise<void> drawing;
        TestImporter importer(mData, importer::probeByLook, nullptr, [&](const std::string& path) {
            drawing.set_value();
            return worker::drawThumbnail(path);
        });
        import(importer, "sound.mp3", "winter.mp3", "Music",
               "-metadata title='Winter Birds' -metadata artist='Ana Müller' "
               "-metadata album=Seasons -metadata date=2021");
        import(importer, "sound.mp3", "summer.mp3", "Music",
               "-metadata title='Summer Rain' -metadata artist='Ben Ito' -metadata album=Seasons");
        import(importer, "film.mp4", "day.mp4", "Films",
               "-metadata title='A Day Out' -metadata artist=Zoe");
        drawing.get_future().wait();
        importer.destroy();
    }

    static std::string replaced(std::string text, const std::string& from, const std::string& to) {
        for (std::size_t at = 0; (at = text.find(from, at)) != std::string::npos; at += to.size())
            text.replace(at, from.size(), to);
        return text;
    }

    /** With this test's folders in the place of the device's. */
    [[nodiscard]] std::string here(const std::string& text) const {
        return replaced(replaced(text, "/tmp/", mFolder.path().string() + "/"), kDataOfPage,
                        mData.string());
    }

    /** In the database's folder, where the page's first command goes. */
    [[nodiscard]] std::string outputHere(const std::string& command) const {
        return outputOf("cd '" + (mData / "mediaplayer").string() + "' && { " + command +
                        "\n} 2>&1");
    }

    TestFolder mFolder;
    const fs::path mData = mFolder / "data";

private:
    void import(TestImporter& importer, const std::string& sample, const std::string& name,
                const std::string& folder, const std::string& tags) const {
        const fs::path file = mFolder / name;
        const std::string command = "ffmpeg -v error -nostdin -i '" + samplePath(sample).string() +
                                    "' -map_metadata -1 -c copy " + tags + " '" + file.string() +
                                    "'";
        ASSERT_EQ(std::system(command.c_str()), 0) << command;
        ASSERT_EQ(importer.import(file, folder).result, kOk);
    }
};

} // namespace

TEST_F(LibraryPage, EachCommandPrintsWhatThePageShows) {
    const auto all = examples();
    EXPECT_GT(all.size(), 15U);
    for (const Example& example : all)
        EXPECT_EQ(outputHere(here(example.command)), here(example.output)) << example.command;
    EXPECT_GT(fs::file_size(mFolder / "A Day Out.jpg"), 0U);
}

TEST_F(LibraryPage, NamesEveryColumnOfEveryTable) {
    std::istringstream tables(
        outputHere("sqlite3 -readonly media.db \"SELECT name FROM pragma_table_list WHERE schema ="
                   " 'main' AND type = 'table' AND name NOT LIKE 'sqlite%'\""));
    const auto names = linesOf(tables);
    EXPECT_EQ(names.size(), 6U);
    for (const std::string& table : names) {
        std::istringstream columns(outputHere(
            "sqlite3 -readonly media.db \"SELECT name FROM pragma_table_info('" + table + "')\""));
        EXPECT_THAT(columnsOnPage("### `" + table + "`"),
                    testing::ElementsAreArray(linesOf(columns)))
            << table;
    }
}
