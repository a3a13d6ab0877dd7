// SPDX-License-Identifier: MIT
#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <fstream>
#include <future>

#include "LibMediaPlayer/InterfaceFactory.h"
#include "importer/LookProbe.h"
#include "tests/engine/Samples.h"
#include "tests/engine/TestImporter.h"

using namespace LibMediaPlayer;
using testing::ElementsAre;
using testing::HasSubstr;
namespace fs = std::filesystem;

namespace {

class Import : public testing::Test {
protected:
    [[nodiscard]] fs::path library() const { return mFolder / "data/media"; }
    [[nodiscard]] fs::path database() const { return mFolder / "data/mediaplayer/media.db"; }
    [[nodiscard]] std::string ask(const std::string& query) const {
        return askDatabase(database(), query);
    }
    fs::path source(const std::string& name, const std::string& content = "content") const {
        writeFile(mFolder / name, content);
        return mFolder / name;
    }

    TestFolder mFolder;
    TestImporter mImporter{mFolder / "data", anyMedium(L"TITLE=Yes\nARTIST=No\n")};
};

} // namespace

TEST_F(Import, AFileThatIsCataloguedStaysWhereItLies) {
    const fs::path file = source("a.mp4");
    const auto answer = mImporter.import(file);
    EXPECT_EQ(answer.result, kOk);
    EXPECT_EQ(answer.text, wide(file));
    EXPECT_EQ(ask("SELECT path, source, size, title, artist FROM media"),
              file.string() + "|" + file.string() + "|7|Yes|No");
    EXPECT_FALSE(fs::exists(library()));
}

TEST_F(Import, AFileForAFolderIsCopiedWithItsTime) {
    const fs::path file = source("a.mp4");
    fs::last_write_time(file, fs::file_time_type::clock::now() - std::chrono::hours(1000));
    const auto answer = mImporter.import(file, "Films/New");
    const fs::path copy = library() / "Films/New/a.mp4";
    EXPECT_EQ(answer.result, kOk);
    EXPECT_EQ(answer.text, wide(copy));
    EXPECT_EQ(readFile(copy), "content");
    EXPECT_EQ(fs::last_write_time(copy), fs::last_write_time(file));
    EXPECT_EQ(ask("SELECT path, source FROM media"), copy.string() + "|" + file.string());
    EXPECT_EQ(ask("SELECT count(*) FROM copying"), "0");
    EXPECT_TRUE(fs::exists(file));
}

TEST_F(Import, ACopyOfAnySizeIsTheSame) {
    for (const std::size_t size : {0U, 1U, 524'288U, 524'289U, 9'000'001U}) {
        std::string content(size, 'x');
        for (std::size_t index = 0; index < size; index += 4096)
            content[index] = static_cast<char>(index / 4096);
        const fs::path file = source(std::to_string(size) + ".mp4", content);
        EXPECT_EQ(mImporter.import(file, "Films").result, kOk);
        EXPECT_TRUE(readFile(library() / "Films" / file.filename()) == content) << size;
    }
}

TEST_F(Import, AFileOfASystemThatCannotCopyInTheKernelIsReadAndWritten) {
    // Its size is told, and its content cannot be copied in the kernel from another file system.
    const fs::path file = "/sys/kernel/notes";
    if (!fs::exists(file))
        GTEST_SKIP() << "no such file here";
    EXPECT_EQ(mImporter.import(file, "Films").result, kOk);
    EXPECT_EQ(readFile(library() / "Films/notes"), readFile(file));
}

TEST_F(Import, TheNotificationsOfAnImportComeInOrder) {
    mImporter.import(source("a.mp4"), "Films");
    std::vector<int> kinds;
    for (const auto& notification : mImporter.notifications())
        kinds.push_back(notification.kind);
    EXPECT_THAT(kinds, ElementsAre(kImportStarted, kImportProgress, kImportFinished));
    EXPECT_EQ(mImporter.notifications()[0].text, wide(mFolder / "a.mp4"));
    EXPECT_EQ(mImporter.notifications()[1].text, wide(mFolder / "a.mp4"));
}

TEST_F(Import, AUriIsTakenAsThePlayerTakesIt) {
    const fs::path file = source("a b.mp4");
    EXPECT_EQ(mImporter->import(L"file://" + wide(mFolder.path()) + L"/a%20b.mp4", L""), kOk);
    EXPECT_EQ(mImporter.awaitFinished().text, wide(file));
    for (const wchar_t* const text : {L"http://localhost/a.mp4", L"", L"file://elsewhere.net/a"}) {
        EXPECT_EQ(mImporter->import(text, L""), kOk);
        EXPECT_NE(mImporter.awaitFinished().result, kOk) << text;
    }
}

TEST_F(Import, ANameThatIsTakenGetsANumber) {
    source("data/media/Films/a.mp4", "somebody's");
    EXPECT_EQ(mImporter.import(source("one/a.mp4", "one"), "Films").text,
              wide(library() / "Films/a (2).mp4"));
    EXPECT_EQ(mImporter.import(source("two/a.mp4", "two"), "Films").text,
              wide(library() / "Films/a (3).mp4"));
    EXPECT_EQ(readFile(library() / "Films/a.mp4"), "somebody's");
    EXPECT_EQ(readFile(library() / "Films/a (2).mp4"), "one");
    EXPECT_EQ(readFile(library() / "Films/a (3).mp4"), "two");
}

TEST_F(Import, FilesOfOneNameInOneBurstGetNumbers) {
    for (const char* const folder : {"one", "two", "three"})
        source(std::string(folder) + "/a.mp4", folder);
    for (const char* const folder : {"one", "two", "three"})
        mImporter.queue(mFolder / folder / "a.mp4", "Films");
    for (const char* const name : {"a.mp4", "a (2).mp4", "a (3).mp4"})
        EXPECT_EQ(mImporter.awaitFinished().text, wide(library() / "Films" / name));
    EXPECT_EQ(readFile(library() / "Films/a (3).mp4"), "three");
}

TEST_F(Import, AKnownFileIsNotCopiedAgainButUpdated) {
    const fs::path file = source("a.mp4");
    const auto first = mImporter.import(file, "Films");
    const auto id = ask("SELECT id FROM media");
    EXPECT_EQ(mImporter.import(file, "Films").text, first.text);

    source("a.mp4", "newer content");
    EXPECT_EQ(mImporter.import(file, "Films").text, first.text);
    EXPECT_EQ(readFile(library() / "Films/a.mp4"), "newer content");
    EXPECT_EQ(ask("SELECT id, size FROM media"), id + "|13");
    EXPECT_THAT(listFolder(library()), ElementsAre(".importing/", "Films/", "Films/a.mp4"));
}

TEST_F(Import, AKnownFileTwiceInOneBurstIsOneFile) {
    const fs::path file = source("a.mp4");
    mImporter.queue(file, "Films");
    mImporter.queue(file, "Films");
    EXPECT_EQ(mImporter.awaitFinished().text, mImporter.awaitFinished().text);
    EXPECT_EQ(ask("SELECT count(*) FROM media"), "1");
}

TEST_F(Import, ACopyThatWasRemovedIsMadeAgain) {
    const fs::path file = source("a.mp4");
    mImporter.import(file, "Films");
    fs::remove(library() / "Films/a.mp4");
    EXPECT_EQ(mImporter.import(file, "Films").text, wide(library() / "Films/a.mp4"));
    EXPECT_EQ(readFile(library() / "Films/a.mp4"), "content");
}

TEST_F(Import, AFileOfTheLibraryIsCataloguedInItsFolderAndCopiedIntoAnother) {
    const fs::path file = source("data/media/Films/a.mp4");
    EXPECT_EQ(mImporter.import(file, "Films").text, wide(file));
    EXPECT_EQ(mImporter.import(file).text, wide(file));
    EXPECT_EQ(ask("SELECT count(*) FROM media"), "1");
    EXPECT_EQ(mImporter.import(file, "Others").text, wide(library() / "Others/a.mp4"));
    EXPECT_EQ(ask("SELECT count(*) FROM media"), "2");
}

TEST_F(Import, ACopyThatIsImportedInItsPlaceStaysAKnownCopy) {
    const fs::path file = source("a.mp4");
    mImporter.import(file, "Films");
    EXPECT_EQ(mImporter.import(library() / "Films/a.mp4").result, kOk);
    EXPECT_EQ(mImporter.import(file, "Films").text, wide(library() / "Films/a.mp4"));
    EXPECT_EQ(ask("SELECT count(*) FROM media"), "1");
}

TEST_F(Import, AFolderThatLeadsOutOfTheLibraryIsRefused) {
    const fs::path file = source("a.mp4");
    fs::create_directories(library());
    fs::create_directory(mFolder / "outside");
    fs::create_directory_symlink(mFolder / "outside", library() / "link");
    for (const std::string folder : {"..", "../outside", "Films/../../outside", "/tmp", "link",
                                     "link/deeper", ".importing", "./.importing"}) {
        const auto answer = mImporter.import(file, folder);
        EXPECT_EQ(answer.result, kAccessDenied) << folder;
        EXPECT_THAT(answer.text, HasSubstr(L"leads out of the library")) << folder;
    }
    EXPECT_TRUE(listFolder(mFolder / "outside").empty());
    EXPECT_EQ(mImporter.import(file, "./Films//New/.").text, wide(library() / "Films/New/a.mp4"));
    EXPECT_EQ(mImporter.import(file, ".").text, wide(library() / "a.mp4"));
}

TEST_F(Import, WhatIsNoFileIsToldAndTheNextImportWorks) {
    EXPECT_EQ(mImporter.import(mFolder / "missing.mp4").result, kNotFound);
    EXPECT_EQ(mImporter.import(mFolder.path(), "Films").result, kNotMedia);
    EXPECT_EQ(mImporter.import("/dev/zero", "Films").result, kNotMedia);
    EXPECT_THAT(mImporter.import(mFolder / "missing.mp4").text, HasSubstr(L"missing.mp4"));
    source("file");
    EXPECT_EQ(mImporter.import(source("a.mp4"), "Films").result, kOk);
    fs::copy_file(mFolder / "a.mp4", library() / "file");
    EXPECT_EQ(mImporter.import(mFolder / "a.mp4", "file/deeper").result, kNotFound);
    EXPECT_EQ(mImporter.import(mFolder / "a.mp4", std::string(300, 'x')).result, kNotFound);
    EXPECT_EQ(mImporter.import(mFolder / "a.mp4").result, kOk);
}

TEST_F(Import, NamesOfAnyLengthAndCharacterSurvive) {
    const std::string longest(251, 'n');
    source("one/" + longest + ".mp4", "1");
    source("two/" + longest + ".mp4", "2");
    EXPECT_EQ(mImporter.import(mFolder / "one" / (longest + ".mp4"), "F").result, kOk);
    EXPECT_EQ(mImporter.import(mFolder / "two" / (longest + ".mp4"), "F").result, kOk);
    const std::string odd = "\xc3\xa4 'quote\" \xe6\x97\xa5\n%s.mp4";
    EXPECT_EQ(mImporter.import(source(odd), "\xe6\x97\xa5").text,
              wide(library() / "\xe6\x97\xa5" / odd));
}

TEST_F(Import, TheStatusCountsTheBytesOfAllThatIsQueued) {
    MediaImporterStatus status{-1, -1};
    EXPECT_EQ(mImporter->status(status), kImporterIdle);
    EXPECT_EQ(status.total, 0);
    mImporter.import(source("a.mp4", std::string(1000, 'x')), "Films");
    EXPECT_EQ(mImporter->status(status), kImporterIdle);
    EXPECT_EQ(status.done, 1000);
    EXPECT_EQ(status.total, 1000);
    mImporter.import(source("b.mp4", std::string(10, 'x')));
    EXPECT_EQ(mImporter->status(status), kImporterIdle);
    EXPECT_EQ(status.total, 10);
}

TEST_F(Import, ABurstIsAnsweredInOrder) {
    constexpr int kCount = 200;
    for (int number = 0; number < kCount; ++number)
        mImporter.queue(source("in/" + std::to_string(number) + ".mp4"), number % 2 ? "Out" : "");
    for (int number = 0; number < kCount; ++number) {
        const fs::path folder = number % 2 ? library() / "Out" : mFolder / "in";
        EXPECT_EQ(mImporter.awaitFinished().text, wide(folder / (std::to_string(number) + ".mp4")));
    }
    EXPECT_EQ(ask("SELECT count(*) FROM media"), std::to_string(kCount));
}

TEST_F(Import, TheGraphIsWritten) {
    EXPECT_EQ(mImporter->dumpGraph(L""), kWrongState);
    EXPECT_EQ(mImporter->dumpGraph(wide(mFolder / "no/graph.dot")), kNotFound);
    EXPECT_EQ(mImporter->dumpGraph(wide(mFolder / "graph.dot")), kOk);
    EXPECT_THAT(readFile(mFolder / "graph.dot"), testing::StartsWith("digraph importer {"));
}

TEST_F(Import, ADataDirectoryThatWasRemovedIsMadeAgain) {
    const fs::path file = source("a.mp4");
    mImporter.import(file, "Films");
    fs::remove_all(mFolder / "data");
    EXPECT_EQ(mImporter.import(file, "Films").result, kOk);
    EXPECT_EQ(ask("SELECT count(*) FROM media"), "1");
    fs::remove_all(library());
    EXPECT_EQ(mImporter.import(file, "Films").result, kOk);
    EXPECT_EQ(readFile(library() / "Films/a.mp4"), "content");
}

TEST_F(Import, ASecondImporterIsToldThatTheLibraryIsInUse) {
    const fs::path file = source("a.mp4");
    mImporter.import(file);
    TestImporter second(mFolder / "data", anyMedium());
    EXPECT_EQ(second.import(file).result, kNotAvailable);
    mImporter.destroy();
    EXPECT_EQ(second.import(file).result, kOk);
}

TEST(ImportOfMedia, SamplesAreDescribedAndBrokenOnesAreToldApart) {
    const TestFolder folder;
    TestImporter importer(folder / "data", importer::probeByLook);
    EXPECT_EQ(importer.import(samplePath("film.mp4"), "Films").result, kOk);
    EXPECT_EQ(importer.import(samplePath("text.txt"), "Films").result, kNotMedia);
    EXPECT_EQ(importer.import(samplePath("stub.mp4"), "Films").result, kDamaged);
    EXPECT_EQ(importer.import(samplePath("empty.mp4"), "Films").result, kNotMedia);
    EXPECT_EQ(importer.import(samplePath("sound.mp3"), "Films").result, kOk);
    EXPECT_EQ(
        askDatabase(folder / "data/mediaplayer/media.db", "SELECT width, height FROM video_stream"),
        "192|108");
    EXPECT_THAT(listFolder(folder / "data/media"),
                ElementsAre(".importing/", "Films/", "Films/film.mp4", "Films/sound.mp3"));
}

TEST(ImportByTheLibrary, TheImporterUsesTheDevicesDataDirectory) {
    const TestFolder folder;
    ::setenv("QNS_HV_DATA", (folder / "data").c_str(), 1);
    const std::unique_ptr<IMediaImporter> importer(InterfaceFactory::createImporter());
    ::unsetenv("QNS_HV_DATA");
    std::promise<int> result;
    importer->setNotify([&](MediaImporterNotify& notification) {
        if (notification.kind == kImportFinished)
            result.set_value(notification.result);
    });
    EXPECT_EQ(importer->import(wide(samplePath("sound.flac")), L"Music"), kOk);
    EXPECT_EQ(result.get_future().get(), kOk);
    EXPECT_TRUE(fs::exists(folder / "data/media/Music/sound.flac"));
}

TEST(ImportWithoutADataDirectory, IsToldAsNotAvailable) {
    const TestFolder folder;
    writeFile(folder / "a.mp4", "content");
    TestImporter importer("", anyMedium());
    EXPECT_EQ(importer.import(folder / "a.mp4").result, kNotAvailable);
}
