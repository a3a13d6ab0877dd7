// SPDX-License-Identifier: MIT
#include <climits>
#include <map>
#include <string>
#include <vector>

#include "tests/daemon/support/ImporterDaemonTest.h"
#include "tests/engine_double/MetadataText.h"

using namespace importer;
using LibMediaPlayer::MediaImporterNotify;
using LibMediaPlayer::MediaMetaInfo;
using testing::ElementsAre;
using testing::IsEmpty;

namespace {

constexpr int kWarning = 4;

/** One with every number different. */
MediaMetaInfo film() {
    MediaMetaInfo info;
    info.system = {"container", L"TITLE=t", true, true, 99};
    info.videoCount = 1;
    info.video = {"type", L"H.264, \u00fc", 320, 180, 24, 25, 2, 16, 15, true, 1000, 2000, false};
    info.audioCount = 2;
    info.audio[0] = {"type", L"AAC", 6, 48000, 16, 128, 256};
    info.audio[1] = {"type", L"AC-3", 2, 44100, 24, 512, 1024};
    return info;
}

constexpr File kFilm{"H.264, \xC3\xBC", "AAC", {320, 180, 25, 2, 48000}};

class ImporterNotification : public ImporterClientTest {
protected:
    /** Imports a file of which the engine tells this. */
    void importFile(const std::string& file, const MediaMetaInfo& info, int result = 0) {
        mClient.import(mId, file);
        mClient.expectResult(kObject, kImportCallBack, 0);
        expectLook(file, "return 0", script::metadataAnswer(result, info));
        if (result == 0)
            mImporter.expectCall("importer import \"" + file + "\" \"\"");
    }

    /** The engine notifies, and the client is told this. */
    void expectTold(const MediaImporterNotify& notify, const wire::Bytes& arguments) {
        mImporter.notifyImport(notify);
        mClient.expectNotification(kNotifyObject, arguments);
    }
};

TEST_F(ImporterNotification, HasTheEnginesThreeFieldsAndSevenOfTheFile) {
    importFile("/a", film());
    expectTold({3, 0, L"/\u00fc"},
               wire::hex("03  D2 00 00 00 00  A4 2F C3 BC 00"
                         "AA 48 2E 32 36 34 2C 20 C3 BC 00  A4 41 41 43 00"
                         "D2 00 00 01 40  D2 00 00 00 B4  D2 00 00 00 19  D2 00 00 00 02"
                         "D2 00 00 BB 80"));
    expectTold({1, 0, L"/b"}, notification(1, 0, "/b", kFilm));
    expectTold({2, 0, L"/c"}, notification(2, 0, "/c", kFilm));
}

TEST_F(ImporterNotification, BeforeTheFirstImportHasNothingOfAFile) {
    expectTold({1, 0, L""}, wire::hex("01  D2 00 00 00 00  A1 00  A1 00  A1 00"
                                      "D2 00 00 00 00  D2 00 00 00 00  D2 00 00 00 00"
                                      "D2 00 00 00 00  D2 00 00 00 00"));
}

TEST_F(ImporterNotification, HasItsKindInTheShortestFormAndAllOtherNumbersIn32Bits) {
    MediaMetaInfo info;
    info.videoCount = 1;
    info.video.width = INT_MIN;
    info.video.height = INT_MAX;
    info.video.frameRateNumerator = -1;
    info.video.frameRateDenominator = 0;
    info.audioCount = 1;
    info.audio[0].sampleRate = 1;
    importFile("/a", info);
    const auto rest = wire::hex("A1 00  A1 00  A1 00"
                                "D2 80 00 00 00  D2 7F FF FF FF  D2 FF FF FF FF"
                                "D2 00 00 00 00  D2 00 00 00 01");
    const std::map<int, const char*> forms{{0, "00"},
                                           {127, "7F"},
                                           {128, "CC 80"},
                                           {256, "CD 01 00"},
                                           {-32, "E0"},
                                           {-33, "D0 DF"},
                                           {-129, "D1 FF 7F"},
                                           {70000, "CE 00 01 11 70"},
                                           {INT_MIN, "D2 80 00 00 00"}};
    for (const auto& [kind, form] : forms)
        expectTold({kind, kind, L""}, wire::hex(form) + wire::int32(kind) + rest);
}

TEST_F(ImporterNotification, OfAFileWithSoundOnlyHasEmptyFieldsForTheVideo) {
    MediaMetaInfo info = film();
    info.videoCount = 0;
    importFile("/a", film());
    importFile("/b", info);
    expectTold({3, 0, L"/b"}, notification(3, 0, "/b", {"", "AAC", {0, 0, 0, 1, 48000}}));
}

TEST_F(ImporterNotification, IsOfTheFileThatWasAskedForLastWhicheverRuns) {
    importFile("/a", film());
    importFile("/b", {});
    expectTold({2, 0, L"/a"}, notification(2, 0, "/a", kNothingKnown));
}

TEST_F(ImporterNotification, OfAFileThatCannotBeReadHasWhatWasFound) {
    importFile("/before", film());
    MediaMetaInfo half;
    half.audioCount = 1;
    half.audio[0] = {"", L"noise", 0, 8000, 0, 0, 0};
    importFile("/a", half, 4);
    const File found{"", "noise", {0, 0, 0, 1, 8000}};
    mClient.expectNotification(kNotifyObject, notification(2, 4, "", found));
    expectTold({2, 0, L"/before"}, notification(2, 0, "/before", found));
}

TEST_F(ImporterNotification, OfAFileThatCannotBeReadGoesToAllClients) {
    ImporterClient other(1001);
    const auto id = other.registerCallBack(7);
    other.registerNotify(8, id);
    other.expectNothingElse();
    importFile("/a", {}, 3);
    mClient.expectNotification(kNotifyObject, notification(2, 3, "", kNothingKnown));
    other.expectNotification(8, notification(2, 3, "", kNothingKnown));
}

TEST_F(ImporterNotification, OfAFailureIsLoggedWithTheFileThatWasAskedForLast) {
    importFile("/100%s%n", {});
    expectTold({2, 0, L"/a"}, notification(2, 0, "/a", kNothingKnown));
    expectTold({2, 8, L"no room"}, notification(2, 8, "no room", kNothingKnown));
    expectTold({1, -1, L""}, notification(1, -1, "", kNothingKnown));
    expectStatus();
    EXPECT_THAT(logOf("MediaImporterController", 2),
                ElementsAre(controllerLine(kWarning, 312, "importNotify /100%s%n iRet: 8"),
                            controllerLine(kWarning, 312, "importNotify /100%s%n iRet: -1")));
}

TEST_F(ImporterNotification, OfASuccessIsNotLogged) {
    for (const int kind : {1, 2, 3, 99})
        expectTold({kind, 0, L"/a"}, notification(kind, 0, "/a"));
    EXPECT_THAT(logOf("MediaImporterController", 0), IsEmpty());
    EXPECT_THAT(logOf("MediaImporterService", 0), IsEmpty());
}

TEST_F(ImporterNotification, GoesToEveryObjectInTheOrderOfTheClientsIds) {
    std::vector<std::int32_t> ids{mId, 7, INT_MAX, -5, INT_MIN, 2, 0};
    for (const auto id : ids)
        mClient.registerNotify(1000 + (id & 0xFF), id);
    mClient.expectNothingElse();
    mImporter.notifyImport({2, 6, L"/a"});
    const auto expected = notification(2, 6, "/a");
    for (const long object : {1000L, 1251L, 1000L, kNotifyObject, 1002L, 1007L, 1255L})
        mClient.expectNotification(object, expected);
    mClient.expectNothingElse();
}

TEST_F(ImporterNotification, GoesToEveryProcess) {
    std::vector<std::unique_ptr<ImporterClient>> others;
    for (long identity = 1007; identity > 1000; --identity) {
        others.push_back(std::make_unique<ImporterClient>(identity));
        others.back()->registerNotify(kNotifyObject, others.back()->registerCallBack(kObject));
        others.back()->expectNothingElse();
    }
    expectTold({3, 0, L"/a"}, notification(3, 0, "/a"));
    for (const auto& other : others)
        other->expectNotification(kNotifyObject, notification(3, 0, "/a"));
}

TEST_F(ImporterNotification, WithoutANotifyObjectGoesToNobody) {
    mClient.request(kUnregisterNotify, mId);
    mClient.expectNothingElse();
    mImporter.notifyImport({3, 0, L"/a"});
    expectStatus();
    mClient.expectNothingElse();
}

TEST_F(ImporterNotification, GoesOnWhenOnlyTheCallbackObjectIsUnregistered) {
    mClient.request(kUnregister, mId);
    mClient.expectNothingElse();
    expectTold({3, 0, L"/a"}, notification(3, 0, "/a"));
}

TEST_F(ImporterNotification, GoesToTheObjectThatWasRegisteredFirstUntilThatLeaves) {
    mClient.registerNotify(7, mId);
    expectTold({3, 0, L"/a"}, notification(3, 0, "/a"));
    mClient.expectNothingElse();
    mClient.request(kUnregisterNotify, mId);
    mClient.registerNotify(7, mId);
    mClient.expectNothingElse();
    mImporter.notifyImport({3, 0, L"/b"});
    mClient.expectNotification(7, notification(3, 0, "/b"));
}

TEST_F(ImporterNotification, MayBeRegisteredUnderAnIdThatNobodyHas) {
    mClient.request(kUnregisterNotify, mId);
    mClient.registerNotify(7, 55);
    mClient.expectNothingElse();
    mImporter.notifyImport({3, 0, L"/a"});
    mClient.expectNotification(7, notification(3, 0, "/a"));
}

TEST_F(ImporterNotification, ThatDoesNotFitIntoAPacketIsNotSent) {
    // Kind, result, the long text's header and zero, two empty texts, five numbers.
    const std::size_t longest = wire::kMaxPayload - (1 + 5 + 3 + 1 + 2 + 2 + 5 * 5);
    mImporter.notifyImport({1, 0, std::wstring(longest + 1, L'x')});
    expectStatus();
    mImporter.notifyImport({1, 0, std::wstring(100000, L'x')});
    expectStatus();
    const auto fits = notification(1, 0, std::string(longest, 'y'));
    EXPECT_EQ(fits.size(), wire::kMaxPayload);
    expectTold({1, 0, std::wstring(longest, L'y')}, fits);
}

TEST_F(ImporterNotification, OfWhichSeveralComeWhileTheDaemonIsBusyIsTheLastAsOften) {
    mClient.request(kCancel, mId);
    mClient.expectResult(kObject, kCancelCallBack, 0);
    EXPECT_EQ(mImporter.nextCall(), "importer cancel");
    mImporter.notifyImport({2, 6, L"/a"});
    mImporter.notifyImport({2, 6, L"/b"});
    mImporter.notifyImport({2, 0, L"/c"});
    mImporter.answer("return 0");
    for (int i = 0; i < 3; ++i)
        mClient.expectNotification(kNotifyObject, notification(2, 0, "/c"));
    mClient.expectNothingElse();
}

TEST_F(ImporterNotification, AtTheSameTimeFromSeveralThreadsIsEachTimeOneOfThemWhole) {
    std::vector<MediaImporterNotify> notifications;
    std::vector<testing::Matcher<wire::Bytes>> whole;
    constexpr int kThreads = 8;
    for (int i = 0; i < kThreads; ++i) {
        notifications.push_back({i, i, std::wstring(1000, L'a' + i)});
        whole.emplace_back(
            testing::Eq(notification(i, i, std::string(1000, static_cast<char>('a' + i)))));
    }
    for (int round = 0; round < 10; ++round) {
        mImporter.notifyImportsAtOnce(notifications);
        for (int i = 0; i < kThreads; ++i) {
            const auto packet = mClient.receive();
            ASSERT_TRUE(packet);
            EXPECT_EQ(packet->object, kNotifyObject);
            EXPECT_THAT(packet->payload, testing::AnyOfArray(whole));
        }
    }
    mClient.expectNothingElse();
}

TEST_F(ImporterNotification, WhileImportsAreLookedAtHarmsNobody) {
    constexpr int kImports = 20;
    const std::vector<MediaImporterNotify> burst(4, {1, 3, L"/somewhere"});
    for (int i = 0; i < kImports; ++i) {
        mClient.import(mId, "/" + std::to_string(i));
        mImporter.notifyImportsAtOnce(burst);
        EXPECT_THAT(mDiscoverers.nextCall(), testing::StartsWith("discoverer 10 open"));
        mDiscoverers.answer("return 0");
        mDiscoverers.expectCall("discoverer 10 metadata", script::metadataAnswer(0, film()));
        mDiscoverers.expectCall("discoverer 10 close");
        EXPECT_THAT(mImporter.nextCall(), testing::StartsWith("importer import"));
        mImporter.answer("return 0");
    }
    int accepted = 0;
    int notified = 0;
    while (accepted < kImports || notified < kImports * 4) {
        const auto packet = mClient.receive();
        ASSERT_TRUE(packet);
        ++(packet->object == kNotifyObject ? notified : accepted);
    }
    mClient.expectNothingElse();
}

TEST_F(ImporterNotification, ToAClientThatHasGoneIsNotKeptFromOthers) {
    ImporterClient other(1001);
    const auto id = other.registerCallBack(7);
    other.registerNotify(8, id);
    other.expectNothingElse();
    mClient.stopListening();
    mClient.disconnect();
    for (int i = 0; i < 3; ++i) {
        mImporter.notifyImport({3, 0, L"/a"});
        other.expectNotification(8, notification(3, 0, "/a"));
    }
}

} // namespace
