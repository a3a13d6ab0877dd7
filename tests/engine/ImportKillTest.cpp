// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <array>
#include <chrono>
#include <csignal>
#include <fcntl.h>
#include <random>
#include <set>
#include <sstream>
#include <sys/wait.h>
#include <thread>
#include <unistd.h>

#include "base/UniqueFd.h"
#include "tests/engine/TestImporter.h"

using namespace LibMediaPlayer;
namespace fs = std::filesystem;

namespace {

constexpr int kKills = 60;
constexpr int kFiles = 120;

/** The program that imports, and what it says. */
class Victim {
public:
    explicit Victim(const std::vector<std::string>& arguments) {
        std::array<int, 2> ends{};
        if (::pipe2(ends.data(), O_CLOEXEC) != 0)
            throw std::runtime_error("no pipe");
        mOutput.reset(ends[0]);
        const qns::UniqueFd input(ends[1]);
        std::vector<char*> texts{const_cast<char*>(QNS_IMPORT_VICTIM)};
        for (const std::string& argument : arguments)
            texts.push_back(const_cast<char*>(argument.c_str()));
        texts.push_back(nullptr);
        mProcess = ::vfork();
        if (mProcess == 0) {
            ::dup2(input.get(), STDOUT_FILENO);
            ::execv(QNS_IMPORT_VICTIM, texts.data());
            ::_exit(127);
        }
    }

    void awaitLines(long count) {
        while (std::count(mText.begin(), mText.end(), '\n') < count && readSome()) {
        }
    }

    /** Kills it, and returns the lines that it has written whole. */
    std::vector<std::string> kill() {
        ::kill(mProcess, SIGKILL);
        int status = 0;
        ::waitpid(mProcess, &status, 0);
        while (readSome()) {
        }
        mText.resize(mText.rfind('\n') + 1);
        std::vector<std::string> lines;
        std::istringstream stream(mText);
        for (std::string line; std::getline(stream, line);)
            lines.push_back(line);
        return lines;
    }

private:
    bool readSome() {
        std::array<char, 4096> part{};
        const ssize_t size = ::read(mOutput.get(), part.data(), part.size());
        mText.append(part.data(), static_cast<std::size_t>(std::max<ssize_t>(size, 0)));
        return size > 0;
    }

    qns::UniqueFd mOutput;
    std::string mText;
    pid_t mProcess = -1;
};

class KilledImport : public testing::Test {
protected:
    KilledImport() {
        for (int number = 0; number < kFiles; ++number) {
            const fs::path file = mFolder / ("in/" + std::to_string(number) + ".mp4");
            writeFile(file, contentOf(file.filename()));
            mArguments.push_back(file.string());
        }
        mArguments.insert(mArguments.begin(), mData.string());
    }

    /** What tells files apart, from a few bytes to a few hundred thousand. */
    static std::string contentOf(const std::string& name) {
        std::string content;
        for (int line = 0; line < std::stoi(name) * std::stoi(name) * 4; ++line)
            content += name;
        return content;
    }

    [[nodiscard]] std::string ask(const std::string& query) const {
        fs::create_directories(mData / "mediaplayer");
        return askDatabase(mData / "mediaplayer/media.db", query);
    }

    [[nodiscard]] std::set<std::string> rows() const {
        std::set<std::string> paths;
        std::istringstream lines(ask("SELECT path FROM media"));
        for (std::string line; std::getline(lines, line);)
            paths.insert(line);
        return paths;
    }

    void expectOnlyWholeFiles() const {
        if (!fs::exists(mData / "media/Films"))
            return;
        for (const fs::directory_entry& file : fs::directory_iterator(mData / "media/Films"))
            EXPECT_TRUE(readFile(file.path()) == contentOf(file.path().filename())) << file.path();
    }

    /** Those that were told as done; files and rows may be more. */
    void expectKept(const std::vector<std::string>& told) const {
        if (ask("SELECT count(*) FROM sqlite_master") == "0") {
            EXPECT_TRUE(told.empty());
            return;
        }
        EXPECT_EQ(ask("PRAGMA integrity_check"), "ok");
        const std::set<std::string> known = rows();
        for (const std::string& path : told)
            EXPECT_EQ(known.count(path), 1U) << path;
        for (const std::string& path : known)
            EXPECT_TRUE(fs::exists(path)) << path;
    }

    /** After the next start there are as many files as rows. */
    void expectCleanAfterStart() const {
        TestImporter importer(mData, anyMedium());
        EXPECT_EQ(importer.import(mFolder / "in/1.mp4", "Last").result, kOk);
        std::set<std::string> files;
        for (const fs::directory_entry& entry : fs::recursive_directory_iterator(mData / "media")) {
            if (!entry.is_directory())
                files.insert(entry.path().string());
        }
        std::set<std::string> copies;
        for (const std::string& path : rows()) {
            if (path.find("/media/") != std::string::npos)
                copies.insert(path);
        }
        EXPECT_EQ(files, copies);
        EXPECT_EQ(ask("SELECT count(*) FROM copying"), "0");
    }

    void reset() const { fs::remove_all(mData); }

    TestFolder mFolder;
    fs::path mData = mFolder / "data";
    std::vector<std::string> mArguments;
};

} // namespace

TEST_F(KilledImport, LosesNothingThatWasToldAsDoneAndLeavesNothingHalfDone) {
    const unsigned int seed = std::random_device()();
    SCOPED_TRACE("seed " + std::to_string(seed));
    std::mt19937 random(seed);
    std::size_t done = 0;
    for (int round = 0; round < kKills; ++round) {
        Victim victim(mArguments);
        victim.awaitLines(static_cast<long>(random() % kFiles));
        // The moment is what is tested: any will do.
        std::this_thread::sleep_for(std::chrono::microseconds(random() % 30'000));
        const auto told = victim.kill();
        done += told.size();
        expectOnlyWholeFiles();
        expectKept(told);
        expectCleanAfterStart();
        // Every third goes on with what the others have left: copies that take an older one's
        // place.
        if (round % 3 == 2)
            reset();
    }
    EXPECT_GT(done, 0U);
    EXPECT_LT(done, std::size_t{kKills} * kFiles);
}
