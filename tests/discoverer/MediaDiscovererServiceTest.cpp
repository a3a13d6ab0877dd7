// SPDX-License-Identifier: MIT
#include "discoverer/MediaDiscovererService.h"

#include <stdexcept>
#include <string>

#include <QMetaMethod>
#include <QSignalSpy>

#include "tests/discoverer/DiscovererFixture.h"
#include "tests/support/OutputCapture.h"

using LibMediaPlayer::MediaMetaInfo;
using LibMediaPlayer::SupportedExtensions;
using testing::_;
using testing::DoAll;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::Return;
using testing::SetArgReferee;
using testing::SizeIs;

namespace {

const Bytes kEmptyBlock = Bytes{0xA0} + int32(0) + int32(0);
const Bytes kNewMetadata =
    int32(-1) + int32(0) + text("") + text("") + Bytes{0, 0} + int64(0) + kEmptyBlock + kEmptyBlock;
const Bytes kRefusedImage = int32(1) + int32(1) + text("") + text("");
const Bytes kNoExtensions = text("") + int32(0) + int32(0);

/** One row: what is peculiar to a request. */
struct Request {
    const char* name;
    long method;
    Bytes (*bytes)(int clientId);
    const char* signal;
    long answerMethod;
    Bytes refusal;
    bool isAnsweredAtOnce;
    bool needsController;
};

void PrintTo(const Request& request, std::ostream* out) {
    *out << request.name;
}

Bytes clientOnly(int clientId) {
    return int32(clientId);
}
Bytes openFile(int clientId) {
    return int32(clientId) + text("/a");
}
Bytes makeImage(int clientId) {
    return int32(clientId) + int32(4) + int32(2) + int64(0) + text("/i") + text("");
}

const Request kRequests[] = {
    {"initializeDiscoverer", kInitialize, clientOnly, SIGNAL(initialize_signal(int)), 2, int32(1),
     true, true},
    {"openDiscoverer", kOpen, openFile, SIGNAL(open_signal(int)), 3, int32(5), false, true},
    {"closeDiscoverer", kClose, clientOnly, SIGNAL(close_signal(int)), 4, int32(1), true, true},
    {"getMetadata", kGetMetadata, clientOnly, SIGNAL(getMetadata_signal(int)), 5, kNewMetadata,
     false, false},
    {"getImage", kGetImage, makeImage, SIGNAL(getImage_signal(int)), 6, kRefusedImage, false, true},
    {"getSupportedExtensions", kGetExtensions, clientOnly, SIGNAL(getExtensions_signal(int)), 7,
     kNoExtensions, false, false},
};

class DiscovererRequests : public DiscovererFixture, public testing::WithParamInterface<Request> {
protected:
    /** Sends the request from another thread, so that no engine call follows. */
    std::string outputOf(int clientId) {
        OutputCapture output;
        requestFromWorker(GetParam().method, GetParam().bytes(clientId));
        return output.text();
    }

    static std::string line(const std::string& event) { return GetParam().name + event; }

    static std::string trace(int clientId) {
        if (GetParam().method != kInitialize)
            return "";
        return "MediaDiscovererService::initializeDiscoverer " + std::to_string(clientId) + "\n";
    }

    void expectRefusal(int clientId, const std::string& reason) {
        const QSignalSpy spy(mpService, GetParam().signal);
        EXPECT_EQ(outputOf(clientId), trace(clientId));
        EXPECT_EQ(spy.count(), 0);
        EXPECT_THAT(platform_double::takeLog(),
                    ElementsAre(serviceLine(line(" Enter.")),
                                serviceLine(line(" Leave, Failed.(" + reason + ")"))));
    }
};

INSTANTIATE_TEST_SUITE_P(All, DiscovererRequests, testing::ValuesIn(kRequests),
                         [](const auto& row) { return row.param.name; });

class DiscovererService : public DiscovererFixture {
protected:
    void openAccepted(int clientId, std::string_view name, long object = 100) {
        EXPECT_THAT(answersTo(kOpen, openRequest(clientId, name)),
                    ElementsAre(SentEvent{object, 3, int32(0)}));
    }

    OutputCapture mOutput; ///< what the operations trace is tested elsewhere
};

} // namespace

TEST_P(DiscovererRequests, OfAClientAreLoggedAndPassedOnWithItsDiscoverer) {
    registerClient();
    forget();
    const QSignalSpy spy(mpService, GetParam().signal);
    EXPECT_EQ(outputOf(2), trace(2));
    ASSERT_EQ(spy.count(), 1);
    EXPECT_EQ(spy.at(0), QList<QVariant>{1});
    EXPECT_THAT(platform_double::takeLog(),
                ElementsAre(serviceLine(line(" Enter.")), serviceLine(line(" Leave, Success."))));
    if (GetParam().isAnsweredAtOnce)
        EXPECT_THAT(mSender.take(), ElementsAre(SentEvent{101, GetParam().answerMethod, int32(0)}));
    else
        EXPECT_THAT(mSender.take(), IsEmpty()) << "the answer is the result";
}

TEST_P(DiscovererRequests, OfAnUnknownClientAreLoggedAndNotAnswered) {
    for (const int clientId : {0, 2, -1, 2147483647})
        expectRefusal(clientId, "isEnableID(iClientID) == false");
    EXPECT_THAT(mSender.take(), IsEmpty());
}

TEST_P(DiscovererRequests, OfAClientThatHasUnregisteredAreLoggedAndNotAnswered) {
    request(kUnregister, int32(1));
    expectRefusal(1, "isEnableID(iClientID) == false");
    EXPECT_THAT(mSender.take(), IsEmpty());
}

TEST_P(DiscovererRequests, OfAnEleventhClientAreRefusedEachInItsWay) {
    registerAllOthers();
    registerClient();
    EXPECT_THAT(mSender.take(), ElementsAre(SentEvent{110, 1, int32(11)})) << "it has an id";
    expectRefusal(11, "getDiscovererId(iClientID) == false");
    EXPECT_THAT(mSender.take(),
                ElementsAre(SentEvent{110, GetParam().answerMethod, GetParam().refusal}));
}

TEST_P(DiscovererRequests, WithoutAControllerAreRefusedWhereTheyNeedOne) {
    use(new MediaDiscovererService(nullptr));
    mClients = 0;
    registerClient();
    forget();
    if (GetParam().needsController) {
        expectRefusal(1, "NULL == mpMediaDiscovererController");
        EXPECT_THAT(mSender.take(),
                    ElementsAre(SentEvent{100, GetParam().answerMethod, GetParam().refusal}));
    } else {
        outputOf(1);
        EXPECT_THAT(platform_double::takeLog(), ElementsAre(serviceLine(line(" Enter.")),
                                                            serviceLine(line(" Leave, Success."))));
        EXPECT_THAT(mSender.take(), IsEmpty());
    }
}

TEST_F(DiscovererService, HasItsSignalsAndSlotsInOrder) {
    std::vector<std::string> names;
    const auto& meta = MediaDiscovererService::staticMetaObject;
    for (int i = meta.methodOffset(); i < meta.methodCount(); ++i)
        names.push_back(meta.method(i).methodSignature().toStdString());
    EXPECT_THAT(names,
                ElementsAre("initialize_signal(int)", "open_signal(int)", "close_signal(int)",
                            "getMetadata_signal(int)", "getImage_signal(int)",
                            "getExtensions_signal(int)", "retOpen(int,int)", "retMetadata(int)",
                            "retImage(int)", "retSupportedExtensions(int)", "takeBack(int)"));
}

TEST_F(DiscovererService, GivesEachClientAnIdOfItsOwn) {
    EXPECT_THAT(answersTo(kRegister, int64(101) + int64(1001)),
                ElementsAre(SentEvent{101, 1, int32(2)}));
    request(kUnregister, int32(2));
    EXPECT_THAT(answersTo(kRegister, int64(102) + int64(1001)),
                ElementsAre(SentEvent{102, 1, int32(3)}));
}

TEST_F(DiscovererService, IgnoresTheRegistrationOfNothing) {
    mpService->registerCallBack(nullptr);
    EXPECT_THAT(mSender.take(), IsEmpty());
    EXPECT_THAT(answersTo(kRegister, int64(101) + int64(1001)),
                ElementsAre(SentEvent{101, 1, int32(2)}));
}

TEST_F(DiscovererService, GivesTheDiscovererOfAClientThatLeavesToTheNext) {
    registerAllOthers();
    request(kUnregister, int32(4));
    registerClient();
    mSender.take();
    EXPECT_CALL(engine(3), open(std::wstring(L"/new")));
    EXPECT_THAT(answersTo(kOpen, openRequest(11, "/new")),
                ElementsAre(SentEvent{110, 3, int32(0)}));
}

TEST_F(DiscovererService, AnUnknownClientsLeavingChangesNothing) {
    for (const int client : {0, 2, -1})
        request(kUnregister, int32(client));
    openAccepted(1, "/a");
}

TEST_F(DiscovererService, PassesTheEnginesResultOfAnOpenOn) {
    EXPECT_CALL(engine(), open(std::wstring(L"/a"))).WillOnce(Return(3)).WillOnce(Return(0));
    EXPECT_THAT(answersTo(kOpen, openRequest(1, "/a")), ElementsAre(SentEvent{100, 3, int32(3)}));
    openAccepted(1, "/a");
}

TEST_F(DiscovererService, RefusesASecondOpenUntilItIsClosedOrInitialised) {
    openAccepted(1, "/a");
    for (const long ending : {kClose, kInitialize}) {
        platform_double::takeLog();
        EXPECT_CALL(engine(), open(_)).Times(0);
        EXPECT_THAT(answersTo(kOpen, openRequest(1, "/b")),
                    ElementsAre(SentEvent{100, 3, int32(5)}));
        EXPECT_THAT(platform_double::takeLog(),
                    ElementsAre(serviceLine("openDiscoverer Enter."),
                                serviceLine("openDiscoverer Leave, Failed.(NULL != mOpenFile)")));
        testing::Mock::VerifyAndClearExpectations(&engine());
        request(ending, int32(1));
        mSender.take();
        openAccepted(1, "/b");
    }
}

TEST_F(DiscovererService, IsOpenBeforeTheEngineHasAnswered) {
    requestFromWorker(kOpen, openRequest(1, "/a"));
    requestFromWorker(kOpen, openRequest(1, "/b"));
    EXPECT_THAT(mSender.take(), ElementsAre(SentEvent{100, 3, int32(5)}));
    EXPECT_CALL(engine(), open(std::wstring(L"/a")));
    runQueued();
    EXPECT_THAT(mSender.take(), ElementsAre(SentEvent{100, 3, int32(0)}));
}

TEST_F(DiscovererService, AnEmptyNameReachesTheEngineAndLeavesTheSlotClosed) {
    EXPECT_CALL(engine(), open(std::wstring(L""))).Times(2).WillRepeatedly(Return(1));
    for (int i = 0; i < 2; ++i)
        EXPECT_THAT(answersTo(kOpen, openRequest(1, "")), ElementsAre(SentEvent{100, 3, int32(1)}));
}

TEST_F(DiscovererService, WithoutADiscovererAnswersFiveAndStaysOpenUntilItIsClosed) {
    engineFactory() = {};
    engineFactory().refused = {0};
    use(new MediaDiscovererService);
    mClients = 0;
    registerClient();
    forget();
    EXPECT_THAT(answersTo(kOpen, openRequest(1, "/a")), ElementsAre(SentEvent{100, 3, int32(5)}));
    platform_double::takeLog();
    EXPECT_THAT(answersTo(kOpen, openRequest(1, "/a")), ElementsAre(SentEvent{100, 3, int32(5)}));
    EXPECT_THAT(platform_double::takeLog(),
                testing::Contains(serviceLine("openDiscoverer Leave, Failed.(NULL != mOpenFile)")));
    request(kClose, int32(1));
    platform_double::takeLog();
    request(kOpen, openRequest(1, "/a"));
    EXPECT_THAT(platform_double::takeLog(),
                testing::Contains(serviceLine("openDiscoverer Leave, Success.")));
}

TEST_F(DiscovererService, AnOpenWhoseClientHasLeftIsAnsweredToNobodyAndClosed) {
    requestFromWorker(kOpen, openRequest(1, "/a"));
    request(kUnregister, int32(1));
    runQueued();
    EXPECT_THAT(mSender.take(), IsEmpty());
    registerClient();
    mSender.take();
    openAccepted(2, "/b", 101);
}

TEST_F(DiscovererService, AFileThatIsOpenIsLeftToTheSlotsNextClient) {
    openAccepted(1, "/a");
    request(kUnregister, int32(1));
    registerClient();
    mSender.take();
    EXPECT_THAT(answersTo(kOpen, openRequest(2, "/b")), ElementsAre(SentEvent{101, 3, int32(5)}));
    request(kInitialize, int32(2));
    mSender.take();
    openAccepted(2, "/b", 101);
}

TEST_F(DiscovererService, ResultsOfAClientThatHasLeftAreSentToNobody) {
    for (const long method : {kGetMetadata, kGetExtensions})
        requestFromWorker(method, int32(1));
    requestFromWorker(kGetImage, imageRequest(1, "image", "notice"));
    request(kUnregister, int32(1));
    EXPECT_CALL(engine(), metadata(_)).Times(2);
    EXPECT_CALL(engine(), supportedExtensions(_));
    runQueued();
    EXPECT_THAT(mSender.take(), IsEmpty());
    EXPECT_FALSE(mFolder.has("notice"));
}

TEST_F(DiscovererService, GivesTheDiscovererOfAClientThatEndedAwayAfterWhatItHadAskedFor) {
    requestFromWorker(kGetExtensions, int32(1));
    EXPECT_TRUE(mAdapter->letGo(mProxies.proxyOf(1)));
    registerClient();
    forget();
    requestFromWorker(kGetExtensions, int32(2));
    EXPECT_CALL(engine(0), supportedExtensions(_));
    EXPECT_CALL(engine(1), supportedExtensions(_));
    runQueued();
    EXPECT_THAT(mSender.take(), ElementsAre(SentEvent{101, 7, kNoExtensions}));
    registerClient();
    forget();
    EXPECT_CALL(engine(0), supportedExtensions(_));
    EXPECT_THAT(answersTo(kGetExtensions, int32(3)), SizeIs(1));
}

TEST_F(DiscovererService, GivesTheDiscoverersOfTenClientsThatEndedAwayAtOnce) {
    registerAllOthers();
    for (int client = 1; client <= kDiscovererCount; ++client)
        EXPECT_TRUE(mAdapter->letGo(mProxies.proxyOf(client)));
    registerClient();
    forget();
    EXPECT_CALL(engine(0), supportedExtensions(_));
    EXPECT_THAT(answersTo(kGetExtensions, int32(11)), SizeIs(1));
    runQueued();
    EXPECT_THAT(answersTo(kInitialize, int32(11)), ElementsAre(SentEvent{110, 2, int32(0)}));
}

TEST_F(DiscovererService, LetsGoOfAClientWithoutADiscoverer) {
    registerAllOthers();
    registerClient();
    EXPECT_TRUE(mAdapter->letGo(mProxies.proxyOf(11)));
    forget();
    runQueued();
    EXPECT_THAT(answersTo(kInitialize, int32(11)), IsEmpty());
}

TEST_F(DiscovererService, AnswersInitializeAndCloseBeforeTheyAreDone) {
    requestFromWorker(kClose, int32(1));
    EXPECT_THAT(mSender.take(), ElementsAre(SentEvent{100, 4, int32(0)}));
    EXPECT_CALL(engine(), close()).WillOnce(Return(9));
    runQueued();
    requestFromWorker(kInitialize, int32(1));
    EXPECT_THAT(mSender.take(), ElementsAre(SentEvent{100, 2, int32(0)}));
    runQueued();
    EXPECT_THAT(mSender.take(), IsEmpty());
}

TEST_F(DiscovererService, AnswersMetadataWithItsStreams) {
    MediaMetaInfo info;
    info.system = {"x", L"T=1", false, true, 9};
    info.audioCount = 1;
    info.audio[0] = {"a", L"b", 1, 2, 3, 4, 5};
    EXPECT_CALL(engine(), metadata(_)).WillOnce(DoAll(SetArgReferee<0>(info), Return(0)));
    const Bytes block =
        text("a") + text("b") + int32(1) + int32(2) + int32(3) + int32(4) + int32(5);
    const Bytes raw = Bytes{static_cast<uint8_t>(0xA0 + block.size())} + block;
    ASSERT_LT(block.size(), 32U);
    EXPECT_THAT(answersTo(kGetMetadata, int32(1)),
                ElementsAre(SentEvent{100, 5,
                                      int32(0) + int32(0) + text("x") + text("T=1") + Bytes{0, 1} +
                                          int64(9) + kEmptyBlock + raw +
                                          int32(static_cast<int>(block.size())) + int32(1)}));
}

TEST_F(DiscovererService, AnswersFailedMetadataWithTheEnginesCode) {
    EXPECT_CALL(engine(), metadata(_)).WillOnce(Return(7));
    EXPECT_THAT(answersTo(kGetMetadata, int32(1)),
                ElementsAre(SentEvent{100, 5,
                                      int32(1) + int32(7) + text("") + text("") + Bytes{0, 0} +
                                          int64(0) + kEmptyBlock + kEmptyBlock}));
}

TEST_F(DiscovererService, AnswersExtensions) {
    EXPECT_CALL(engine(), supportedExtensions(_))
        .WillOnce(DoAll(SetArgReferee<0>(SupportedExtensions{L"mp3,mp4", 2}), Return(-3)));
    EXPECT_THAT(answersTo(kGetExtensions, int32(1)),
                ElementsAre(SentEvent{100, 7, text("mp3,mp4") + int32(0) + int32(2)}));
}

TEST_F(DiscovererService, AnswersAPictureAfterItsNotice) {
    openAccepted(1, "/a");
    EXPECT_CALL(engine(), metadata(_)).WillOnce([](MediaMetaInfo& info) {
        info.system.duration = 100;
        return 0;
    });
    EXPECT_CALL(engine(), makeImage(50, 4, 2, mFolder.widePath("image"))).WillOnce([this] {
        EXPECT_FALSE(mFolder.has("notice"));
        return 0;
    });
    const auto sent = answersTo(kGetImage, imageRequest(1, "image", "notice", 50));
    EXPECT_THAT(sent,
                ElementsAre(SentEvent{
                    100, 6, int32(0) + int32(0) + text("/a") + longText(mFolder.path("image"))}));
    EXPECT_EQ(mFolder.contents("notice"), "notice");
}

TEST_F(DiscovererService, WritesTheNoticeBeforeItAnswers) {
    bool hadNotice = false;
    mSender.atSend = [&] { hadNotice = mFolder.has("notice"); };
    request(kGetImage, imageRequest(1, "image", "notice"));
    EXPECT_TRUE(hadNotice);
}

TEST_F(DiscovererService, WritesNoNoticeWithoutAPath) {
    EXPECT_THAT(answersTo(kGetImage, imageRequest(1, "image")), SizeIs(1));
    registerAllOthers();
    registerClient();
    mSender.take();
    EXPECT_THAT(answersTo(kGetImage, imageRequest(11, "image")), SizeIs(1));
    EXPECT_FALSE(mFolder.has("notice"));
}

TEST_F(DiscovererService, WritesTheNoticeOfARefusedRequestBeforeItAnswers) {
    registerAllOthers();
    registerClient();
    mSender.take();
    bool hadNotice = false;
    mSender.atSend = [&] { hadNotice = mFolder.has("notice"); };
    EXPECT_THAT(answersTo(kGetImage, imageRequest(11, "image", "notice")),
                ElementsAre(SentEvent{110, 6, kRefusedImage}));
    EXPECT_TRUE(hadNotice);
    EXPECT_EQ(mFolder.contents("notice"), "notice");
}

TEST_F(DiscovererService, WritesNoNoticeForAnUnknownClientButRemembersItsPath) {
    requestFromWorker(kGetImage, imageRequest(1, "image", "notice1"));
    requestFromWorker(kGetImage, imageRequest(77, "image", "notice77"));
    EXPECT_FALSE(mFolder.has("notice77"));
    runQueued();
    EXPECT_THAT(mSender.take(), SizeIs(1));
    EXPECT_FALSE(mFolder.has("notice1"));
    EXPECT_EQ(mFolder.contents("notice77"), "notice");
}

TEST_F(DiscovererService, WritesTheNoticeToThePathThatCameLastWhoeverIsAnswered) {
    registerClient();
    mSender.take();
    requestFromWorker(kGetImage, imageRequest(1, "image1", "x"));
    requestFromWorker(kGetImage, imageRequest(2, "image2", "y"));
    EXPECT_CALL(engine(0), makeImage(_, _, _, mFolder.widePath("image1")));
    EXPECT_CALL(engine(1), makeImage(_, _, _, mFolder.widePath("image2")));
    runQueued();
    EXPECT_THAT(mSender.take(), SizeIs(2));
    EXPECT_FALSE(mFolder.has("x"));
    EXPECT_EQ(mFolder.contents("y"), "notice");
}

TEST_F(DiscovererService, OfTwoPicturesOfOneClientUsesTheLaterRequestTwice) {
    requestFromWorker(kGetImage, imageRequest(1, "first"));
    requestFromWorker(kGetImage, imageRequest(1, "second"));
    EXPECT_CALL(engine(), makeImage(_, _, _, mFolder.widePath("second"))).Times(2);
    runQueued();
    EXPECT_THAT(mSender.take(), SizeIs(2));
}

TEST_F(DiscovererService, APictureThatFailsIsBlackAndTold) {
    openAccepted(1, "/a");
    EXPECT_CALL(engine(), makeImage(_, _, _, _)).WillOnce(Return(4));
    EXPECT_THAT(answersTo(kGetImage, imageRequest(1, "image")),
                ElementsAre(SentEvent{
                    100, 6, int32(1) + int32(4) + text("/a") + longText(mFolder.path("image"))}));
    EXPECT_EQ(mFolder.contents("image").size(), 32U);
}

TEST_F(DiscovererService, AnExceptionInASlotIsDroppedAndTheRequestCounts) {
    EXPECT_CALL(engine(), close()).WillOnce(testing::Throw(std::runtime_error("close")));
    EXPECT_THAT(answersTo(kClose, int32(1)), ElementsAre(SentEvent{100, 4, int32(0)}));
}
