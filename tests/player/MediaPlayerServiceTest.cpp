// SPDX-License-Identifier: MIT
#include "player/MediaPlayerService.h"

#include <stdexcept>
#include <string>

#include <QMetaMethod>
#include <QSignalSpy>

#include "tests/player/PlayerFixture.h"
#include "tests/support/OutputCapture.h"

using LibMediaPlayer::RepeatParam;
using platform_double::LogLine;
using testing::_;
using testing::AllOf;
using testing::DoAll;
using testing::ElementsAre;
using testing::Field;
using testing::InSequence;
using testing::IsEmpty;
using testing::Mock;
using testing::Return;
using testing::SetArgReferee;
using testing::Throw;

namespace {

constexpr long kCallBackObject = 100;

SentEvent answer(long method, int result) {
    return {kCallBackObject, method, int32(result)};
}

SentEvent status(long objectId, int code, long position, long duration) {
    return {objectId, 8, int32(code) + int32(0) + int64(position) + int64(duration)};
}

auto repeats(bool repeat, long start, long end) {
    return AllOf(Field(&RepeatParam::repeat, repeat), Field(&RepeatParam::start, start),
                 Field(&RepeatParam::end, end));
}

/** One row: a request that is answered at once. */
struct Request {
    const char* name;
    long method;
    Bytes (*bytes)(int clientId);
    const char* signal;
    long answerMethod;
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
Bytes openNothing(int clientId) {
    return int32(clientId) + text("");
}
Bytes seekTo(int clientId) {
    return int32(clientId) + int32(1) + int64(7) + boolean(true);
}
Bytes repeatFrom(int clientId) {
    return int32(clientId) + boolean(true) + int64(7) + int64(8);
}

const Request kRequests[] = {
    {"initializePlayer", kInitialize, clientOnly, SIGNAL(initialize_signal()), 2},
    {"openPlayer", kOpen, openFile, SIGNAL(open_signal()), 3},
    {"closePlayer", kClose, clientOnly, SIGNAL(close_signal()), 4},
    {"play", kPlay, clientOnly, SIGNAL(play_signal()), 5},
    {"pause", kPause, clientOnly, SIGNAL(pause_signal()), 6},
    {"seek", kSeek, seekTo, SIGNAL(seek_signal()), 7},
    {"setRepeat", kSetRepeat, repeatFrom, SIGNAL(setRepeat_signal()), 9},
};

class PlayerRequests : public PlayerFixture, public testing::WithParamInterface<Request> {
protected:
    /** Sends the request from another thread, so that no engine call follows. */
    std::string outputOf(int clientId) {
        OutputCapture output;
        requestFromWorker(GetParam().method, GetParam().bytes(clientId));
        return output.text();
    }

    std::string traceLine() const {
        return std::string("MediaPlayerService::") + GetParam().name + "\n";
    }
};

INSTANTIATE_TEST_SUITE_P(All, PlayerRequests, testing::ValuesIn(kRequests),
                         [](const auto& row) { return row.param.name; });

class PlayerService : public PlayerFixture {
protected:
    void makeReady() { notify({}); }

    void expectNotReady() {
        EXPECT_THAT(answersTo(kGetStatus, int32(1)), ElementsAre(status(kCallBackObject, 2, 0, 0)));
    }
};

} // namespace

TEST_P(PlayerRequests, OfAClientIsAnsweredWith0BeforeAnythingIsDone) {
    const QSignalSpy spy(mpService, GetParam().signal);
    EXPECT_EQ(outputOf(1), traceLine());
    EXPECT_EQ(spy.count(), 1);
    EXPECT_THAT(mSender.take(), ElementsAre(answer(GetParam().answerMethod, 0)));
}

TEST_P(PlayerRequests, OfAnUnknownClientIsDroppedWithoutAnAnswer) {
    for (const int clientId : {0, 2, -1, 2147483647}) {
        const QSignalSpy spy(mpService, GetParam().signal);
        EXPECT_EQ(outputOf(clientId), traceLine());
        EXPECT_EQ(spy.count(), 0);
    }
    EXPECT_THAT(mSender.take(), IsEmpty());
}

TEST_P(PlayerRequests, OfAClientThatHasUnregisteredIsDropped) {
    request(kUnregisterCallBack, int32(1));
    const QSignalSpy spy(mpService, GetParam().signal);
    EXPECT_EQ(outputOf(1), traceLine());
    EXPECT_EQ(spy.count(), 0);
    EXPECT_THAT(mSender.take(), IsEmpty());
}

TEST_F(PlayerService, GivesEachClientAnIdOfItsOwn) {
    EXPECT_THAT(answersTo(kRegisterCallBack, int64(101) + int64(1001)),
                ElementsAre(SentEvent{101, 1, int32(2)}));
    request(kUnregisterCallBack, int32(2));
    EXPECT_THAT(answersTo(kRegisterCallBack, int64(102) + int64(1001)),
                ElementsAre(SentEvent{102, 1, int32(3)}));
}

TEST_F(PlayerService, IgnoresTheRegistrationOfNothing) {
    mpService->registerCallBack(nullptr);
    mpService->registerNotify({nullptr, 1});
    notify({});
    EXPECT_THAT(mSender.take(), IsEmpty());
    EXPECT_THAT(answersTo(kRegisterCallBack, int64(101) + int64(1001)),
                ElementsAre(SentEvent{101, 1, int32(2)}));
}

TEST_F(PlayerService, AnswersWith0WhenTheSlotThrows) {
    ON_CALL(*mpEngine, open).WillByDefault(Throw(std::runtime_error("open")));
    ON_CALL(*mpEngine, close).WillByDefault(Throw(std::runtime_error("close")));
    ON_CALL(*mpEngine, play).WillByDefault(Throw(std::runtime_error("play")));
    ON_CALL(*mpEngine, pause).WillByDefault(Throw(std::runtime_error("pause")));
    ON_CALL(*mpEngine, seek).WillByDefault(Throw(std::runtime_error("seek")));
    ON_CALL(*mpEngine, repeat).WillByDefault(Throw(std::runtime_error("repeat")));
    for (const Request& row : kRequests)
        EXPECT_THAT(answersTo(row.method, row.bytes(1)), ElementsAre(answer(row.answerMethod, 0)))
            << row.name;
}

TEST_F(PlayerService, PassesRequestsOnToTheEngine) {
    const InSequence inThisOrder;
    EXPECT_CALL(*mpEngine, open(std::wstring(L"/a b\u00fc%s"), 2));
    EXPECT_CALL(*mpEngine, play());
    EXPECT_CALL(*mpEngine, seek(-7, 2));
    EXPECT_CALL(*mpEngine, pause());
    EXPECT_CALL(*mpEngine, repeat(repeats(true, 7, -1)));
    EXPECT_CALL(*mpEngine, close());
    request(kOpen, int32(1) + text("/a b\xC3\xBC%s"));
    request(kPlay, int32(1));
    request(kSeek, int32(1) + int32(2) + int64(-7) + boolean(false));
    request(kPause, int32(1));
    request(kSetRepeat, int32(1) + boolean(true) + int64(7) + int64(-1));
    request(kClose, int32(1));
}

TEST_F(PlayerService, LeavesTheEngineToTheMainThreadAndKeepsTheOrder) {
    const InSequence inThisOrder;
    EXPECT_CALL(*mpEngine, open).Times(0);
    requestFromWorker(kOpen, int32(1) + text("/a"));
    requestFromWorker(kPlay, int32(1));
    requestFromWorker(kClose, int32(1));
    Mock::VerifyAndClearExpectations(mpEngine);
    EXPECT_CALL(*mpEngine, open(std::wstring(L"/a"), 2));
    EXPECT_CALL(*mpEngine, play());
    EXPECT_CALL(*mpEngine, close());
    runQueued();
}

TEST_F(PlayerService, UsesTheLaterParametersForBothOfTwoRequestsThatWait) {
    requestFromWorker(kOpen, int32(1) + text("/first"));
    requestFromWorker(kOpen, int32(1) + text("/second"));
    requestFromWorker(kSeek, int32(1) + int32(0) + int64(1) + boolean(false));
    requestFromWorker(kSeek, int32(1) + int32(1) + int64(2) + boolean(false));
    requestFromWorker(kSetRepeat, int32(1) + boolean(true) + int64(1) + int64(2));
    requestFromWorker(kSetRepeat, int32(1) + boolean(false) + int64(3) + int64(4));
    requestFromWorker(kSetFormat, int32(0));
    EXPECT_CALL(*mpEngine, open(std::wstring(L"/second"), 3)).Times(2);
    EXPECT_CALL(*mpEngine, seek(2, 1)).Times(2);
    EXPECT_CALL(*mpEngine, repeat(repeats(false, 3, 4))).Times(2);
    runQueued();
}

TEST_F(PlayerService, RefusesAnEmptyNameAndClosesWhatIsOpen) {
    const QSignalSpy opened(mpService, SIGNAL(open_signal()));
    EXPECT_CALL(*mpEngine, close());
    EXPECT_CALL(*mpEngine, open).Times(0);
    OutputCapture output;
    const auto answers = answersTo(kOpen, openNothing(1));
    EXPECT_EQ(output.text(), "MediaPlayerService::openPlayer\nMediaPlayerController::close\n");
    EXPECT_THAT(answers, ElementsAre(answer(3, 1)));
    EXPECT_EQ(opened.count(), 0);
}

TEST_F(PlayerService, KeepsTheNameThatWasOpenedLastWhenAnEmptyOneFollows) {
    requestFromWorker(kOpen, int32(1) + text("/a"));
    requestFromWorker(kOpen, openNothing(1));
    EXPECT_CALL(*mpEngine, open(std::wstring(L"/a"), 2));
    EXPECT_CALL(*mpEngine, close());
    runQueued();
}

TEST_F(PlayerService, AnswersAStatusRequestWith2UntilAnOpenHasSucceeded) {
    OutputCapture output;
    EXPECT_CALL(*mpEngine, status).Times(0);
    expectNotReady();
    EXPECT_EQ(output.text(), "");
    notify({1, 1, L"", 0, 0, 0, 0, 0, 0});
    expectNotReady();
}

TEST_F(PlayerService, AnswersAStatusRequestWithWhatTheEngineSays) {
    makeReady();
    EXPECT_CALL(*mpEngine, status)
        .WillOnce(DoAll(SetArgReferee<0>(5000000000), SetArgReferee<1>(9000000000), Return(3)));
    OutputCapture output;
    const auto answers = answersTo(kGetStatus, int32(1));
    EXPECT_EQ(output.text(), "");
    EXPECT_THAT(answers, ElementsAre(status(kCallBackObject, 3, 5000000000, 9000000000)));
}

TEST_F(PlayerService, DropsAStatusRequestOfAnUnknownClient) {
    EXPECT_THAT(answersTo(kGetStatus, int32(2)), IsEmpty());
    makeReady();
    EXPECT_CALL(*mpEngine, status).Times(0);
    EXPECT_THAT(answersTo(kGetStatus, int32(2)), IsEmpty());
}

TEST_F(PlayerService, StaysReadyThroughEverythingButInitializeOpenAndClose) {
    makeReady();
    ON_CALL(*mpEngine, status).WillByDefault(Return(1));
    notify({4, 9, L"", 0, 0, 0, 0, 0, 0});
    for (const long method : {kPlay, kPause, kSeek, kSetRepeat, kSetFormat})
        request(method, int32(1));
    mSender.take();
    EXPECT_THAT(answersTo(kGetStatus, int32(1)), ElementsAre(status(kCallBackObject, 1, 0, 0)));
}

TEST_F(PlayerService, IsNoLongerReadyAfterInitializeOpenOrClose) {
    const std::pair<long, Bytes> requests[] = {
        {kInitialize, int32(1)}, {kOpen, openFile(1)}, {kOpen, openNothing(1)}, {kClose, int32(1)}};
    for (const auto& [method, bytes] : requests) {
        makeReady();
        requestFromWorker(method, bytes);
        mSender.take();
        expectNotReady();
    }
}

TEST_F(PlayerService, StaysReadyWhenAnUnknownClientAsksForAnotherFile) {
    makeReady();
    for (const long method : {kInitialize, kClose})
        request(method, int32(2));
    request(kOpen, openFile(2));
    request(kOpen, openNothing(2));
    EXPECT_CALL(*mpEngine, status).WillOnce(Return(1));
    EXPECT_THAT(answersTo(kGetStatus, int32(1)), ElementsAre(status(kCallBackObject, 1, 0, 0)));
}

TEST_F(PlayerService, SendsAStatusToTheClientThatAskedLast) {
    request(kRegisterCallBack, int64(101) + int64(1001));
    makeReady();
    mSender.take();
    ON_CALL(*mpEngine, status).WillByDefault(Return(3));
    requestFromWorker(kGetStatus, int32(1));
    requestFromWorker(kGetStatus, int32(2));
    runQueued();
    EXPECT_THAT(mSender.take(), ElementsAre(status(101, 3, 0, 0), status(101, 3, 0, 0)));
}

TEST_F(PlayerService, SendsNoStatusToAClientThatHasLeftMeanwhile) {
    makeReady();
    EXPECT_CALL(*mpEngine, status).WillOnce(Return(3));
    requestFromWorker(kGetStatus, int32(1));
    requestFromWorker(kUnregisterCallBack, int32(1));
    runQueued();
    EXPECT_THAT(mSender.take(), IsEmpty());
}

TEST_F(PlayerService, KnowsTwoFormats) {
    EXPECT_EQ(mpService->systemFormat(), 2);
    EXPECT_CALL(*mpEngine, open(_, 3)).Times(1);
    EXPECT_THAT(answersTo(kSetFormat, int32(0)), IsEmpty());
    EXPECT_EQ(mpService->systemFormat(), 3);
    request(kOpen, openFile(1));
    EXPECT_CALL(*mpEngine, open(_, 2)).Times(3);
    for (const int format : {1, 7, -1}) {
        request(kSetFormat, int32(format));
        EXPECT_EQ(mpService->systemFormat(), 2);
        request(kOpen, openFile(1));
    }
}

TEST_F(PlayerService, LogsTheFormat) {
    request(kSetFormat, int32(0));
    EXPECT_THAT(
        platform_double::takeLog(),
        ElementsAre(
            LogLine{6, "MediaPlayerService 100: MediaPlayerService::setSystemFormat() Enter."},
            LogLine{6, "MediaPlayerService 101: MediaPlayerService::setSystemFormat() : "
                       "systemFormat = 3"}));
}

TEST_F(PlayerService, PowersOffAndTellsTheClient) {
    QMetaObject::invokeMethod(
        mpService, [this] { requestFromWorker(kPowerOff, int32(1)); }, Qt::QueuedConnection);
    EXPECT_EQ(QCoreApplication::exec(), 0);
    EXPECT_THAT(mSender.take(), ElementsAre(SentEvent{kCallBackObject, 10, {0, 0, 0, 0}}));
    EXPECT_THAT(
        platform_double::takeLog(),
        ElementsAre(
            LogLine{6, "MediaPlayerService 900: MediaPlayerService::powerOffMediaPlayer() is "
                       "called."},
            LogLine{6, "MediaPlayerService 901: MediaPlayerService::powerOffMediaPlayer() : "
                       "QApplication::quit() finished."},
            LogLine{6, "MediaPlayerService 902: MediaPlayerService::powerOffMediaPlayer() : "
                       "calling the callback func."},
            LogLine{6, "MediaPlayerService 903: MediaPlayerService::powerOffMediaPlayer() "
                       "finished."}));
}

TEST_F(PlayerService, DoesNotPowerOffForAnUnknownClient) {
    constexpr int kStillRunning = 5;
    QMetaObject::invokeMethod(
        mpService,
        [this] {
            requestFromWorker(kPowerOff, int32(2));
            QMetaObject::invokeMethod(
                mpService, [] { QCoreApplication::exit(kStillRunning); }, Qt::QueuedConnection);
        },
        Qt::QueuedConnection);
    EXPECT_EQ(QCoreApplication::exec(), kStillRunning);
    EXPECT_THAT(mSender.take(), IsEmpty());
    EXPECT_THAT(
        platform_double::takeLog(),
        ElementsAre(
            LogLine{6, "MediaPlayerService 900: MediaPlayerService::powerOffMediaPlayer() is "
                       "called."},
            LogLine{3, "MediaPlayerService 400: MediaPlayerService::powerOffMediaPlayer() is "
                       "called, but clientID 2 is not enabled."}));
}

TEST_F(PlayerService, TellsEveryNotifyClientInAscendingOrderOfClientId) {
    registerNotify(205, 5);
    registerNotify(202, 2);
    registerNotify(299, 2); // the first one stays
    request(kOpen, openFile(1));
    mSender.take();
    OutputCapture output;
    notify({1, 0, L"/a", 1, 2, 3, 4, 5, 6});
    EXPECT_EQ(output.text(), "MediaPlayerController::openNotify\nMediaPlayerService::openNotify\n"
                             "####### LOOP(2)\n####### LOOP(5)\n");
    const Bytes expected =
        Bytes{1} + int32(0) + text("/a") + Bytes{1, 2, 3} + uint64(4) + uint64(5) + int64(6);
    EXPECT_THAT(mSender.take(),
                ElementsAre(SentEvent{202, 1, expected}, SentEvent{205, 1, expected}));
}

TEST_F(PlayerService, TellsNobodyWhoHasUnregisteredTheNotifyObject) {
    registerNotify(201, 1);
    registerNotify(202, 2);
    request(kUnregisterNotify, int32(1));
    request(kUnregisterNotify, int32(77));
    OutputCapture output;
    notify({});
    EXPECT_EQ(output.text(), "MediaPlayerController::openNotify\nMediaPlayerService::openNotify\n"
                             "####### LOOP(2)\n");
    EXPECT_EQ(mSender.take().size(), 1U);
}

TEST_F(PlayerService, StillNotifiesAClientWhoseCallBackObjectHasGone) {
    registerNotify(201, 1);
    request(kUnregisterCallBack, int32(1));
    notify({});
    EXPECT_EQ(mSender.take().size(), 1U);
}

TEST_F(PlayerService, HasTheDotFileSignalThoughNoRequestEmitsIt) {
    EXPECT_CALL(*mpEngine, dumpGraph(std::wstring()));
    OutputCapture output;
    Q_EMIT mpService->generateDotFile_signal();
    EXPECT_EQ(output.text(), "MediaPlayerController::generateDotFile\n");
}

TEST_F(PlayerService, DeclaresItsSignalsAndSlotsInOrder) {
    const QMetaObject* const type = mpService->metaObject();
    std::vector<std::string> names;
    for (int i = type->methodOffset(); i < type->methodCount(); ++i)
        names.push_back(type->method(i).methodSignature().toStdString());
    EXPECT_THAT(names,
                ElementsAre("initialize_signal()", "open_signal()", "close_signal()",
                            "play_signal()", "pause_signal()", "seek_signal()",
                            "getStatus_signal()", "setRepeat_signal()", "generateDotFile_signal()",
                            "openNotify()", "retPlayerStatus()"));
}

TEST_F(PlayerService, SurvivesRandomRequests) {
    uint32_t state = 1;
    const auto random = [&state] { return (state = state * 1664525 + 1013904223) >> 16; };
    OutputCapture output;
    for (int round = 0; round < 3000; ++round) {
        Bytes bytes(random() % 30);
        for (auto& byte : bytes)
            byte = static_cast<uint8_t>(random());
        const long method = random() % 16;
        if (method != kPowerOff && method != kUnregisterCallBack)
            requestFromWorker(method, bytes);
    }
    mSender.take();
    requestFromWorker(kPlay, int32(1));
    output.text();
    EXPECT_THAT(mSender.take(), ElementsAre(answer(5, 0)));
}
