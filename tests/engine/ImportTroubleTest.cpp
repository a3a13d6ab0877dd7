// SPDX-License-Identifier: MIT
#include <SQLiteCpp/SQLiteCpp.h>
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <fstream>
#include <memory>
#include <sys/stat.h>

#include "tests/engine/Mount.h"
#include "tests/engine/TestImporter.h"

using namespace LibMediaPlayer;
using testing::ElementsAre;
using testing::HasSubstr;
using testing::IsEmpty;
using testing::Not;
namespace fs = std::filesystem;

namespace {

class ImportInTrouble : public testing::Test {
protected:
    [[nodiscard]] fs::path data() const { return mFolder / "data"; }
    [[nodiscard]] fs::path library() const { return data() / "media"; }
    [[nodiscard]] fs::path database() const { return data() / "mediaplayer/media.db"; }
    fs::path source(const std::string& name, std::size_t size = 1000) const {
        writeFile(mFolder / name, std::string(size, 'x'));
        return mFolder / name;
    }
    /** Names beside the database that do not belong to it. */
    [[nodiscard]] std::vector<std::string> setAside() const {
        std::vector<std::string> names = listFolder(database().parent_path());
        names.erase(std::remove_if(names.begin(), names.end(),
                                   [](const std::string& name) {
                                       return name.find("damaged") == std::string::npos;
                                   }),
                    names.end());
        return names;
    }

    TestFolder mFolder;
};

} // namespace

TEST_F(ImportInTrouble, AFullDiskIsToldAtOnceAndNothingStays) {
    const Mount disk = Mount::memory(data(), 2'000'000);
    TestImporter importer(data(), anyMedium());
    const auto answer = importer.import(source("large.mp4", 3'000'000), "Films");
    EXPECT_EQ(answer.result, kNoSpace);
    EXPECT_THAT(answer.text, HasSubstr(L"No space left"));
    EXPECT_EQ(importer.import(source("small.mp4"), "Films").result, kOk);
    EXPECT_THAT(listFolder(library()), ElementsAre(".importing/", "Films/", "Films/small.mp4"));
    EXPECT_EQ(askDatabase(database(), "SELECT count(*) FROM media"), "1");
}

TEST_F(ImportInTrouble, ADiskThatFillsUpUnderABurstKeepsWhatWasToldAsDone) {
    const Mount disk = Mount::memory(data(), 4'000'000);
    TestImporter importer(data(), anyMedium());
    constexpr int kCount = 100;
    for (int number = 0; number < kCount; ++number)
        importer.queue(source(std::to_string(number) + ".mp4", 100'000), "Films");
    int done = 0;
    for (int number = 0; number < kCount; ++number) {
        const auto answer = importer.awaitFinished();
        EXPECT_THAT(answer.result, testing::AnyOf(kOk, kNoSpace));
        done += answer.result == kOk ? 1 : 0;
    }
    EXPECT_GT(done, 0);
    EXPECT_LT(done, kCount);
    EXPECT_EQ(listFolder(library() / "Films").size(), static_cast<std::size_t>(done));
    EXPECT_EQ(askDatabase(database(), "SELECT count(*) FROM media"), std::to_string(done));
    fs::remove(library() / "Films/0.mp4");
    fs::remove(library() / "Films/1.mp4");
    EXPECT_EQ(importer.import(source("next.mp4"), "Films").result, kOk);
}

TEST_F(ImportInTrouble, ADiskWithoutRoomForARowIsTold) {
    const Mount disk = Mount::memory(data(), 1'000'000);
    TestImporter importer(data(), anyMedium());
    EXPECT_EQ(importer.import(source("a.mp4")).result, kOk);
    std::ofstream(data() / "filler") << std::string(1'000'000, 'x');
    int result = kOk;
    std::wstring text;
    for (int number = 0; result == kOk && number < 1000; ++number) {
        const auto answer = importer.import(source(std::to_string(number) + ".mp4"));
        result = answer.result;
        text = answer.text;
    }
    EXPECT_EQ(result, kNoSpace);
    EXPECT_THAT(text, HasSubstr(L"no space left for the media database"));
    fs::remove(data() / "filler");
    EXPECT_EQ(importer.import(source("b.mp4")).result, kOk);
    EXPECT_EQ(askDatabase(database(), "PRAGMA integrity_check"), "ok");
}

TEST_F(ImportInTrouble, AReadOnlyDatabaseIsToldAndWorksOnceItMayBeWritten) {
    TestImporter(data(), anyMedium()).import(source("a.mp4"), "Films");
    auto lock = std::make_unique<Mount>(Mount::readOnly(data()));
    TestImporter importer(data(), anyMedium());
    const auto answer = importer.import(source("b.mp4"));
    EXPECT_EQ(answer.result, kAccessDenied);
    EXPECT_THAT(answer.text, HasSubstr(L"media database"));
    EXPECT_EQ(importer.import(source("b.mp4"), "Films").result, kAccessDenied);
    lock.reset();
    EXPECT_EQ(importer.import(source("b.mp4"), "Films").result, kOk);
    EXPECT_EQ(askDatabase(database(), "SELECT count(*) FROM media"), "2");
}

TEST_F(ImportInTrouble, ALockedDatabaseIsToldAndWorksOnceItIsFree) {
    TestImporter importer(data(), anyMedium());
    importer.import(source("a.mp4"));
    {
        SQLite::Database other(database().string(), SQLite::OPEN_READWRITE);
        other.exec("BEGIN IMMEDIATE");
        const auto answer = importer.import(source("b.mp4"), "Films");
        EXPECT_EQ(answer.result, kNotAvailable);
        EXPECT_THAT(answer.text, HasSubstr(L"locked by another program"));
        EXPECT_THAT(listFolder(library()), ElementsAre(".importing/", "Films/"));
    }
    EXPECT_EQ(importer.import(source("b.mp4"), "Films").result, kOk);
    EXPECT_EQ(askDatabase(database(), "SELECT count(*) FROM media"), "2");
}

TEST_F(ImportInTrouble, WhatIsNoDatabaseIsSetAsideAndANewOneBegins) {
    writeFile(database(), "not a database, but somebody's text");
    TestImporter importer(data(), anyMedium());
    const fs::path file = source("a.mp4");
    const auto answer = importer.import(file);
    ASSERT_EQ(setAside().size(), 1U);
    const std::string name = setAside().front();
    EXPECT_THAT(name, testing::StartsWith("media.db.damaged-"));
    EXPECT_EQ(readFile(database().parent_path() / name), "not a database, but somebody's text");
    EXPECT_EQ(answer.result, kDamaged);
    EXPECT_THAT(answer.text, HasSubstr(wide(name)));
    EXPECT_EQ(importer.import(file).result, kOk);
    EXPECT_EQ(askDatabase(database(), "SELECT count(*) FROM media"), "1");
}

TEST_F(ImportInTrouble, ADatabaseThatIsDamagedInsideIsSetAsideAndANewOneBegins) {
    TestImporter(data(), anyMedium()).import(source("a.mp4"));
    constexpr std::streamoff kPage = 4096;
    {
        std::fstream file(database(), std::ios::in | std::ios::out | std::ios::binary);
        file.seekp(kPage);
        file << std::string(fs::file_size(database()) - kPage, '?');
    }
    TestImporter importer(data(), anyMedium());
    const auto answer = importer.import(source("b.mp4"));
    EXPECT_EQ(answer.result, kDamaged);
    EXPECT_THAT(answer.text, HasSubstr(L"set aside as"));
    EXPECT_THAT(setAside(), Not(IsEmpty()));
    EXPECT_EQ(importer.import(source("b.mp4")).result, kOk);
    EXPECT_EQ(askDatabase(database(), "PRAGMA integrity_check"), "ok");
}

TEST_F(ImportInTrouble, ADatabaseOfANewerVersionIsLeftAlone) {
    TestImporter(data(), anyMedium()).import(source("a.mp4"));
    askDatabase(database(), "PRAGMA user_version = 99");
    TestImporter importer(data(), anyMedium());
    const auto answer = importer.import(source("b.mp4"));
    EXPECT_EQ(answer.result, kNotAvailable);
    EXPECT_THAT(answer.text, HasSubstr(L"newer version"));
    EXPECT_EQ(askDatabase(database(), "PRAGMA user_version; SELECT count(*) FROM media"), "99\n1");
    EXPECT_THAT(setAside(), IsEmpty());
}

TEST_F(ImportInTrouble, WhatAnInterruptedRunHasLeftIsRemovedAtTheNextStart) {
    TestImporter(data(), anyMedium()).import(source("a.mp4"), "Films");
    writeFile(library() / ".importing/7", "half");
    writeFile(library() / "Films/published.mp4", "no row");
    writeFile(library() / "Films/replaced.mp4", "somebody else's by now");
    struct stat status {};
    ASSERT_EQ(::stat((library() / "Films/published.mp4").c_str(), &status), 0);
    askDatabase(database(), "INSERT INTO copying VALUES ('" +
                                (library() / "Films/published.mp4").string() + "', " +
                                std::to_string(status.st_ino) + "), ('" +
                                (library() / "Films/replaced.mp4").string() + "', 1), ('" +
                                (library() / "Films/gone.mp4").string() + "', 2)");
    TestImporter importer(data(), anyMedium());
    importer.import(source("b.mp4"));
    EXPECT_THAT(listFolder(library()),
                ElementsAre(".importing/", "Films/", "Films/a.mp4", "Films/replaced.mp4"));
    EXPECT_EQ(askDatabase(database(), "SELECT count(*) FROM copying"), "0");
}

TEST_F(ImportInTrouble, ACopyThatReplacedAnotherBeforeItsRowWasWrittenGetsItAtTheNextStart) {
    TestImporter(data(), anyMedium()).import(source("a.mp4"), "Films");
    const fs::path copy = library() / "Films/a.mp4";
    fs::remove(copy);
    writeFile(copy, "newer");
    struct stat status {};
    ASSERT_EQ(::stat(copy.c_str(), &status), 0);
    askDatabase(database(), "INSERT INTO copying VALUES ('" + copy.string() + "', " +
                                std::to_string(status.st_ino) + ")");
    TestImporter importer(data(), anyMedium(L"TITLE=Newer\n"));
    importer.import(source("b.mp4"));
    EXPECT_EQ(askDatabase(database(),
                          "SELECT size, title FROM media WHERE path = '" + copy.string() + "'"),
              "5|Newer");
    EXPECT_EQ(readFile(copy), "newer");
}
