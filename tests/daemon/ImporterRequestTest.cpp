// SPDX-License-Identifier: MIT
#include <map>
#include <string>
#include <vector>

#include "tests/daemon/support/ImporterDaemonTest.h"

using namespace importer;
using testing::ElementsAre;
using testing::IsEmpty;
using wire::Bytes;

namespace {

constexpr int kInformation = 6;
constexpr int kWarning = 4;
constexpr int kError = 3;

class ImporterRequest : public ImporterClientTest {
protected:
    std::vector<std::string> serviceLog(std::size_t count) {
        return logOf("MediaImporterService", count);
    }

    std::vector<std::string> controllerLog(std::size_t count) {
        return logOf("MediaImporterController", count);
    }

    /** The main thread is in the engine and stays there until endBusy(). */
    void beBusy() {
        mClient.request(kCancel, mId);
        mClient.expectResult(kObject, kCancelCallBack, 0);
        EXPECT_EQ(mImporter.nextCall(), "importer cancel");
    }

    void endBusy() { mImporter.answer("return 0"); }
};

TEST_F(ImporterRequest, RegistrationGivesANumberOfThisServicesOwn) {
    PlayerClient player(1001);
    player.registerCallBack();
    EXPECT_EQ(player.id(), 1);
    EXPECT_EQ(mId, 1);
    EXPECT_EQ(mClient.registerCallBack(7), 2);
    mClient.request(kUnregister, 2);
    EXPECT_EQ(mClient.registerCallBack(8), 3);
}

TEST_F(ImporterRequest, RegistrationOfWhoCannotBeReachedChangesNothingAndSendsNothing) {
    ImporterClient other(1001);
    other.stopListening();
    mClient.sendRegistration(5, 1001);
    mClient.request(kRegisterNotify, wire::integer(6) + wire::integer(1001) + wire::integer(mId));
    EXPECT_EQ(mClient.registerCallBack(7), 2);
    mImporter.notifyImport({3, 0, L"/a"});
    mClient.expectNotification(kNotifyObject, notification(3, 0, "/a"));
    mClient.expectNothingElse();
}

TEST_F(ImporterRequest, InitializeIsAcceptedWithoutTheEngine) {
    mClient.request(kInitialize, mId);
    mClient.expectResult(kObject, kInitializeCallBack, 0);
    expectStatus();
    EXPECT_THAT(serviceLog(2),
                ElementsAre(serviceLine(kInformation, 101, "initializeImporter Enter."),
                            serviceLine(kInformation, 102, "initializeImporter Leave, Success.")));
    EXPECT_THAT(controllerLog(0), IsEmpty());
}

TEST_F(ImporterRequest, AnImportIsAnsweredBeforeTheFileIsLookedAt) {
    mClient.import(mId, "/m/a b.mp4", "Films/2026");
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 10 open \"/m/a b.mp4\"");
    mClient.expectResult(kObject, kImportCallBack, 0);
    mDiscoverers.answer("return 0");
    mDiscoverers.expectCall("discoverer 10 metadata");
    mDiscoverers.expectCall("discoverer 10 close");
    mImporter.expectCall("importer import \"/m/a b.mp4\" \"Films/2026\"");
    expectStatus();
    EXPECT_THAT(serviceLog(2),
                ElementsAre(serviceLine(kInformation, 103, "import Enter."),
                            serviceLine(kInformation, 104, "import Leave, Success.")));
    EXPECT_THAT(controllerLog(0), IsEmpty());
    mClient.expectNothingElse();
}

TEST_F(ImporterRequest, BothTextsMayHaveAnyCharacters) {
    mClient.import(mId, "/\xC3\xBC \xF0\x9F\x8E\xB5 \"%s\".mp4", "\xE6\x98\xA0\xE7\x94\xBB");
    mClient.expectResult(kObject, kImportCallBack, 0);
    const std::string file = R"("/\x{fc} \x{1f3b5} \"%s\".mp4")";
    mDiscoverers.expectCall("discoverer 10 open " + file);
    mDiscoverers.expectCall("discoverer 10 metadata");
    mDiscoverers.expectCall("discoverer 10 close");
    mImporter.expectCall("importer import " + file + R"( "\x{6620}\x{753b}")");
}

TEST_F(ImporterRequest, EmptyTextsReachTheEngineAsEmpty) {
    for (const char* texts : {"A1 00 A1 00", "A0 A0", ""}) {
        mClient.request(kImport, wire::integer(mId) + wire::hex(texts));
        mClient.expectResult(kObject, kImportCallBack, 0);
        expectImport("");
    }
    mClient.request(kImport, wire::integer(mId) + wire::text("/a"));
    mClient.expectResult(kObject, kImportCallBack, 0);
    expectImport("/a");
}

TEST_F(ImporterRequest, ALongNameReachesTheEngineWhole) {
    const std::string name(wire::kMaxPayload - wire::integer(mId).size() - 4 - 2, 'n');
    mClient.import(mId, name);
    mClient.expectResult(kObject, kImportCallBack, 0);
    expectImport(name);
    expectStatus();
}

TEST_F(ImporterRequest, WhatTheEngineAnswersToAnImportIsToldToNobody) {
    mClient.import(mId, "/a", "b");
    mClient.expectResult(kObject, kImportCallBack, 0);
    expectLook("/a");
    mImporter.expectCall("importer import \"/a\" \"b\"", "return 5");
    expectStatus();
    mClient.expectNothingElse();
    EXPECT_THAT(controllerLog(0), IsEmpty());
}

TEST_F(ImporterRequest, AFailedOpenIsLoggedAndForgottenWhenTheMetadataCanBeRead) {
    mClient.import(mId, "/m/100%s.mp4");
    mClient.expectResult(kObject, kImportCallBack, 0);
    expectLook("/m/100%s.mp4", "return 7");
    mImporter.expectCall("importer import \"/m/100%s.mp4\" \"\"");
    expectStatus();
    EXPECT_THAT(controllerLog(1),
                ElementsAre(controllerLine(kWarning, 310, "import /m/100%s.mp4 iRet: 7")));
    mClient.expectNothingElse();
}

TEST_F(ImporterRequest, AFileThatCannotBeReadIsToldAndLoggedAndDoesNotReachTheImporter) {
    mClient.import(mId, "/a");
    mClient.expectResult(kObject, kImportCallBack, 0);
    expectLook("/a", "return 0", "return 4");
    mClient.expectNotification(kNotifyObject, notification(2, 4, "", kNothingKnown));
    expectStatus();
    EXPECT_THAT(controllerLog(2),
                ElementsAre(controllerLine(kWarning, 311, "import /a iRet: 4"),
                            controllerLine(kWarning, 312, "importNotify /a iRet: 4")));
    import("/b");
}

TEST_F(ImporterRequest, AFileThatIsNotThereIsLoggedThreeTimesAndToldOnce) {
    mClient.import(mId, "/a");
    mClient.expectResult(kObject, kImportCallBack, 0);
    expectLook("/a", "return 1", "return -1");
    mClient.expectNotification(kNotifyObject, notification(2, -1, "", kNothingKnown));
    expectStatus();
    mClient.expectNothingElse();
    EXPECT_THAT(controllerLog(3),
                ElementsAre(controllerLine(kWarning, 310, "import /a iRet: 1"),
                            controllerLine(kWarning, 311, "import /a iRet: -1"),
                            controllerLine(kWarning, 312, "importNotify /a iRet: -1")));
}

TEST_F(ImporterRequest, TwoImportsOnTheirWayToABusyEngineAreTheLaterOneTwice) {
    ImporterClient other(1001);
    const auto id = other.registerCallBack(7);
    beBusy();
    mClient.import(mId, "/a", "x");
    mClient.expectResult(kObject, kImportCallBack, 0);
    other.import(id, "/b", "y");
    other.expectResult(7, kImportCallBack, 0);
    endBusy();
    expectImport("/b", "y");
    expectImport("/b", "y");
    expectStatus();
}

TEST_F(ImporterRequest, AnImportWhileOneRunsIsHandedToTheEngineAsItStands) {
    import("/a", "x");
    mImporter.notifyImport({3, 0, L"/a"});
    mClient.expectNotification(kNotifyObject, notification(3, 0, "/a", kNothingKnown));
    import("/b", "y");
}

TEST_F(ImporterRequest, CancelIsAnsweredBeforeTheEngineHasCancelled) {
    mClient.request(kCancel, mId);
    EXPECT_EQ(mImporter.nextCall(), "importer cancel");
    mClient.expectResult(kObject, kCancelCallBack, 0);
    EXPECT_THAT(controllerLog(1),
                ElementsAre(controllerLine(kInformation, 101, "cancel() called. ")));
    mImporter.answer("return 9");
    expectStatus();
    EXPECT_THAT(controllerLog(2),
                ElementsAre(controllerLine(kInformation, 101, "cancel() called. "),
                            controllerLine(kInformation, 102, "cancel() finished. ")));
    EXPECT_THAT(serviceLog(2),
                ElementsAre(serviceLine(kInformation, 105, "cancel Enter."),
                            serviceLine(kInformation, 106, "cancel Leave, Success.")));
    mClient.expectNothingElse();
}

TEST_F(ImporterRequest, TheStatusIs28BytesAndNotLogged) {
    mClient.request(kGetStatus, mId);
    mImporter.expectCall("importer status", "return 1 72623859790382856 -2");
    mClient.expectCallBack(kObject, kStatusCallBack,
                           wire::hex("D2 00 00 00 01  D2 00 00 00 00"
                                     "D3 01 02 03 04 05 06 07 08"
                                     "D3 FF FF FF FF FF FF FF FE"));
    mClient.request(kGetStatus, mId);
    mImporter.expectCall("importer status", "return 0 0 0");
    mClient.expectCallBack(kObject, kStatusCallBack,
                           wire::hex("D2 00 00 00 00  D2 00 00 00 00"
                                     "D3 00 00 00 00 00 00 00 00  D3 00 00 00 00 00 00 00 00"));
    EXPECT_EQ(status(0, 0, 0).size(), 28U);
    EXPECT_THAT(serviceLog(0), IsEmpty());
    EXPECT_THAT(controllerLog(0), IsEmpty());
}

TEST_F(ImporterRequest, TheStatusIsToldWithWhateverCodeTheEngineHas) {
    for (const std::int32_t code : {-1, 2, 2147483647}) {
        mClient.request(kGetStatus, mId);
        mImporter.expectCall("importer status", "return " + std::to_string(code) + " 5 6");
        mClient.expectCallBack(kObject, kStatusCallBack, status(code, 5, 6));
    }
}

TEST_F(ImporterRequest, TheStatusAskedForByTwoOfABusyEngineIsToldTwiceToTheLater) {
    ImporterClient other(1001);
    const auto id = other.registerCallBack(7);
    beBusy();
    mClient.request(kGetStatus, mId);
    mClient.expectNothingElse();
    other.request(kGetStatus, id);
    other.expectNothingElse();
    endBusy();
    mImporter.expectCall("importer status", "return 1 0 9");
    mImporter.expectCall("importer status", "return 1 5 9");
    other.expectCallBack(7, kStatusCallBack, status(1, 0, 9));
    other.expectCallBack(7, kStatusCallBack, status(1, 5, 9));
    mClient.expectNothingElse();
}

TEST_F(ImporterRequest, TheStatusForAClientThatHasLeftIsToldToNobody) {
    const auto witness = mClient.registerCallBack(7);
    mClient.request(kGetStatus, mId);
    EXPECT_EQ(mImporter.nextCall(), "importer status");
    mClient.request(kUnregister, mId);
    mClient.request(kCancel, witness);
    mClient.expectResult(7, kCancelCallBack, 0);
    mImporter.answer("return 0");
    mImporter.expectCall("importer cancel");
    mClient.expectNothingElse();
}

TEST_F(ImporterRequest, AnUnknownClientIsLoggedAndNotAnswered) {
    for (const long method : {kInitialize, kCancel, kGetStatus})
        mClient.request(method, 77);
    mClient.import(77, "/a");
    mClient.expectNothingElse();
    expectStatus();
    const std::string reason = " Leave, Failed.(isEnableID(iClientID) == false)";
    EXPECT_THAT(serviceLog(7),
                ElementsAre(serviceLine(kInformation, 101, "initializeImporter Enter."),
                            serviceLine(kError, 401, "initializeImporter" + reason),
                            serviceLine(kInformation, 105, "cancel Enter."),
                            serviceLine(kInformation, 405, "cancel" + reason),
                            serviceLine(kError, 407, "getImporterStatus" + reason),
                            serviceLine(kInformation, 103, "import Enter."),
                            serviceLine(kError, 403, "import" + reason)));
    EXPECT_THAT(controllerLog(0), IsEmpty());
}

TEST_F(ImporterRequest, AnUnregisteredClientIsUnknown) {
    const auto witness = mClient.registerCallBack(7);
    mClient.request(kUnregister, mId);
    for (const long method : {kInitialize, kCancel, kGetStatus})
        mClient.request(method, mId);
    mClient.import(mId, "/a");
    mClient.expectNothingElse();
    mClient.request(kGetStatus, witness);
    mImporter.expectCall("importer status");
    mClient.expectCallBack(7, kStatusCallBack, status(0, 0, 0));
    EXPECT_THAT(serviceLog(7), testing::SizeIs(7));
}

TEST_F(ImporterRequest, ANotifyObjectMakesNoClient) {
    mClient.registerNotify(9, 55);
    mClient.request(kInitialize, 55);
    mClient.expectNothingElse();
}

TEST_F(ImporterRequest, UnregisteringWhoIsNotRegisteredIsNothing) {
    for (const std::int32_t id : {0, -1, 77}) {
        mClient.request(kUnregister, id);
        mClient.request(kUnregisterNotify, id);
    }
    expectStatus();
    mImporter.notifyImport({3, 0, L""});
    mClient.expectNotification(kNotifyObject, notification(3, 0, ""));
}

TEST_F(ImporterRequest, AnUnknownMethodIsNothing) {
    for (const long method : {0L, 9L, -1L, 1L << 32})
        mClient.request(method, mId);
    mClient.expectNothingElse();
    expectStatus();
    EXPECT_THAT(serviceLog(0), IsEmpty());
}

TEST_F(ImporterRequest, AClientsIdIsCutTo32Bits) {
    mClient.request(kInitialize, wire::int64((1LL << 32) + mId));
    mClient.expectResult(kObject, kInitializeCallBack, 0);
    mClient.request(kCancel, wire::uint64(0xFFFFFFFF00000001U));
    mClient.expectResult(kObject, kCancelCallBack, 0);
    mImporter.expectCall("importer cancel");
}

TEST_F(ImporterRequest, AnyClientMayActForAnother) {
    ImporterClient other(1001);
    other.registerCallBack(7);
    other.request(kInitialize, mId);
    mClient.expectResult(kObject, kInitializeCallBack, 0);
    other.request(kGetStatus, mId);
    mImporter.expectCall("importer status");
    mClient.expectCallBack(kObject, kStatusCallBack, status(0, 0, 0));
    other.expectNothingElse();
}

TEST_F(ImporterRequest, ComesInTheOrderInWhichItWasSent) {
    mClient.request(kInitialize, mId);
    mClient.import(mId, "/a");
    mClient.request(kCancel, mId);
    mClient.request(kGetStatus, mId);
    mClient.expectResult(kObject, kInitializeCallBack, 0);
    mClient.expectResult(kObject, kImportCallBack, 0);
    mClient.expectResult(kObject, kCancelCallBack, 0);
    expectImport("/a");
    mImporter.expectCall("importer cancel");
    mImporter.expectCall("importer status");
    mClient.expectCallBack(kObject, kStatusCallBack, status(0, 0, 0));
}

TEST_F(ImporterRequest, AtPowerOffTheImporterEndsBeforeItsDiscovererAndMayNotifyUntilThen) {
    PlayerClient player(1001);
    player.registerCallBack();
    player.request(request::kPowerOffMediaPlayer);
    EXPECT_EQ(mImporter.nextCall(), "importer destroy");
    mImporter.notifyImportsAtOnce({{2, 6, L"/a"}, {2, 6, L"/b"}});
    mImporter.answer("return 0");
    mDiscoverers.expectCall("discoverer 10 destroy");
    for (int number = 0; number < 10; ++number) {
        EXPECT_THAT(mDiscoverers.nextCall(), testing::EndsWith(" destroy"));
        mDiscoverers.answer("return 0");
    }
    EXPECT_EQ(mpDaemon->waitForExit(), 0);
}

/** A daemon whose engine makes no importer. */
class MissingImporter : public ImporterRequest {
protected:
    void SetUp() override {
        ASSERT_NO_FATAL_FAILURE(startImporter({false, true}));
        registerClient();
        mClient.request(kGetStatus, mId);
        mClient.expectCallBack(kObject, kStatusCallBack, status(-1, 0, 0));
    }
};

TEST_F(MissingImporter, HasTheStatusMinusOne) {
    mClient.request(kGetStatus, mId);
    mClient.expectCallBack(kObject, kStatusCallBack, status(-1, 0, 0));
}

TEST_F(MissingImporter, AcceptsACancelAndLogsIt) {
    mClient.request(kCancel, mId);
    mClient.expectResult(kObject, kCancelCallBack, 0);
    EXPECT_THAT(controllerLog(2),
                ElementsAre(controllerLine(kInformation, 101, "cancel() called. "),
                            controllerLine(kInformation, 102, "cancel() finished. ")));
}

TEST_F(MissingImporter, LooksAtAFileAndTellsNothingOfIt) {
    mClient.import(mId, "/a");
    mClient.expectResult(kObject, kImportCallBack, 0);
    expectLook("/a");
    mClient.request(kGetStatus, mId);
    mClient.expectCallBack(kObject, kStatusCallBack, status(-1, 0, 0));
    mClient.expectNothingElse();
    EXPECT_THAT(controllerLog(0), IsEmpty());
}

TEST_F(MissingImporter, TellsAFileThatCannotBeRead) {
    mClient.import(mId, "/a");
    mClient.expectResult(kObject, kImportCallBack, 0);
    expectLook("/a", "return 0", "return 3");
    mClient.expectNotification(kNotifyObject, notification(2, 3, "", kNothingKnown));
}

/** A daemon whose engine makes no discoverer for the importer. */
class MissingImportersDiscoverer : public ImporterRequest {
protected:
    void SetUp() override {
        ASSERT_NO_FATAL_FAILURE(startImporter({true, false}));
        registerClient();
        expectStatus();
    }
};

TEST_F(MissingImportersDiscoverer, LetsNoImportReachTheEngine) {
    mClient.import(mId, "/a");
    // Different threads send them, and nothing holds up either.
    std::map<long, wire::Bytes> told;
    for (int count = 0; count < 2; ++count) {
        const auto packet = mClient.receive();
        ASSERT_TRUE(packet);
        told[packet->object] = packet->payload;
    }
    EXPECT_EQ(told[kObject], wire::int32(0));
    EXPECT_EQ(told[kNotifyObject], notification(2, -1, "", kNothingKnown));
    expectStatus();
    EXPECT_THAT(controllerLog(1),
                ElementsAre(controllerLine(kWarning, 312, "importNotify /a iRet: -1")));
}

} // namespace
