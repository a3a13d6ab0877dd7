// SPDX-License-Identifier: MIT
#include "importer/MediaImporterService.h"

#include <QCoreApplication>
#include <QSignalSpy>

#include <string>
#include <thread>

#include <gmock/gmock.h>

#include "importer/MediaImporterController.h"
#include "importer/MediaImporterServiceAdapter.h"
#include "importer/MediaImporterServiceCallBackRemoteProxy.h"
#include "importer/MediaImporterServiceNotifyRemoteProxy.h"
#include "log/Logging.h"
#include "ptc/Event.h"
#include "ptc/IFactory.h"
#include "tests/importer/EngineMock.h"
#include "tests/support/PlatformDouble.h"
#include "tests/support/RecordingSender.h"

using namespace std::string_literals;
using LibMediaPlayer::MediaImporterNotify;
using LibMediaPlayer::MediaImporterStatus;
using platform_double::LogLine;
using testing::_;
using testing::DoAll;
using testing::ElementsAre;
using testing::IsEmpty;
using testing::NiceMock;
using testing::Return;
using testing::SetArgReferee;
using testing::Throw;

namespace {

enum RequestId : long {
    kInitialize = 1,
    kImport = 2,
    kCancel = 3,
    kGetStatus = 4,
    kUnregisterCallBack = 5,
    kUnregisterNotify = 6,
    kRegisterCallBack = 7,
    kRegisterNotify = 8
};

constexpr long kCallBackObject = 100;

/** The application object that queued signals need; this thread is the main thread. */
void needApplication() {
    static char name[] = "importer_test";
    static char* arguments[] = {name, nullptr};
    static int count = 1;
    static QCoreApplication instance(count, arguments);
}

/** Makes real proxies that send to one recording sender. */
class RecordingProxyFactory : public PTC::IProxyFactory {
public:
    explicit RecordingProxyFactory(PTC::ISender& sender) : mSender(sender) {}

    PTC::IProxyBase* createProxy(long interfaceId, long proxyId, long) override {
        if (interfaceId == 57)
            return keep(std::make_unique<MediaImporterServiceCallBackRemoteProxy>(proxyId));
        return keep(std::make_unique<MediaImporterServiceNotifyRemoteProxy>(proxyId));
    }

private:
    PTC::IProxyBase* keep(std::unique_ptr<PTC::CallbackProxy> proxy) {
        proxy->setSender(&mSender);
        mProxies.push_back(std::move(proxy));
        return mProxies.back().get();
    }

    PTC::ISender& mSender;
    std::vector<std::unique_ptr<PTC::CallbackProxy>> mProxies;
};

/**
 * The whole importer as the daemon wires it, from encoded requests to the events for clients,
 * with mocks as the engine. A client with callback object 100 is registered as number 1.
 *
 * request() comes from this thread, so that the controller acts before it returns;
 * requestFromWorker() comes from another one, and what it queues waits for runQueued().
 */
class ImporterService : public testing::Test {
protected:
    ImporterService() {
        needApplication();
        INIT_LOGGING(L"importer_test");
        engineFactory() = {mpImporter = new NiceMock<ImporterMock>, new NiceMock<DiscovererMock>};
        use(new MediaImporterService);
        request(kRegisterCallBack, int64(kCallBackObject) + int64(1000));
        mSender.take();
        platform_double::takeLog();
    }
    ~ImporterService() override {
        mAdapter.reset();
        UNINIT_LOGGING();
        EXPECT_TRUE(mSender.allForClients());
    }

    void use(MediaImporterService* service) {
        mpService = service;
        mAdapter = std::make_unique<MediaImporterServiceAdapter>(56);
        mAdapter->setProxyFactory(&mProxies);
        mAdapter->setTarget(static_cast<IMediaImporterService*>(service));
    }

    void request(long method, const Bytes& bytes) {
        auto* const data = new char[bytes.size()];
        std::copy(bytes.begin(), bytes.end(), data);
        PTC::Event event(56, method, data, static_cast<long>(bytes.size()), true, false);
        mAdapter->receive(&event);
        delete[] event.data;
    }

    std::vector<SentEvent> answersTo(long method, const Bytes& bytes) {
        request(method, bytes);
        return mSender.take();
    }

    void requestFromWorker(long method, const Bytes& bytes) {
        std::thread([&] { request(method, bytes); }).join();
    }

    static void runQueued() { QCoreApplication::sendPostedEvents(); }

    void registerNotify(long objectId, int clientId) {
        request(kRegisterNotify, int64(objectId) + int64(1000) + int32(clientId));
    }

    RecordingSender mSender;
    RecordingProxyFactory mProxies{mSender};
    NiceMock<ImporterMock>* mpImporter = nullptr; ///< owned by the controller
    MediaImporterService* mpService = nullptr;    ///< owned by the adapter
    std::unique_ptr<MediaImporterServiceAdapter> mAdapter;
};

/** One row: a request that is answered at once. */
struct Request {
    std::string name;
    long method;
    bool hasTexts;
    const char* signal;
    long answerMethod;
    int firstCode;    ///< of the lines about what is done
    int firstBadCode; ///< of those about what is not
    int failureLevel;
};

void PrintTo(const Request& request, std::ostream* out) {
    *out << request.name;
}

const Request kRequests[] = {
    {"initializeImporter", kInitialize, false, SIGNAL(initialize_signal()), 2, 101, 401, 3},
    {"import", kImport, true, SIGNAL(import_signal()), 3, 103, 403, 3},
    {"cancel", kCancel, false, SIGNAL(cancel_signal()), 4, 105, 405, 6},
};

class ImporterRequests : public ImporterService, public testing::WithParamInterface<Request> {
protected:
    static Bytes bytes(int clientId) {
        return GetParam().hasTexts ? int32(clientId) + text("/a") + text("b") : int32(clientId);
    }

    static LogLine line(int level, int code, const std::string& what) {
        return {level, "MediaImporterService " + std::to_string(code) +
                           ": MediaImporterService::" + GetParam().name + ' ' + what};
    }
    static LogLine enterLine() { return line(6, GetParam().firstCode, "Enter."); }
    static LogLine successLine() { return line(6, GetParam().firstCode + 1, "Leave, Success."); }

    static SentEvent answer(int result) {
        return {kCallBackObject, GetParam().answerMethod, int32(result)};
    }
};

INSTANTIATE_TEST_SUITE_P(All, ImporterRequests, testing::ValuesIn(kRequests),
                         [](const auto& row) { return row.param.name; });

} // namespace

TEST_P(ImporterRequests, OfAClientIsAnsweredWith0BeforeAnythingIsDone) {
    const QSignalSpy spy(mpService, GetParam().signal);
    EXPECT_CALL(*mpImporter, import(_, _)).Times(0);
    EXPECT_CALL(*mpImporter, cancel()).Times(0);
    requestFromWorker(GetParam().method, bytes(1));
    EXPECT_EQ(spy.count(), 1);
    EXPECT_THAT(mSender.take(), ElementsAre(answer(0)));
    EXPECT_THAT(platform_double::takeLog(), ElementsAre(enterLine(), successLine()));
    testing::Mock::VerifyAndClearExpectations(mpImporter);
}

TEST_P(ImporterRequests, OfAnUnknownClientIsLoggedAndNotAnswered) {
    const QSignalSpy spy(mpService, GetParam().signal);
    EXPECT_THAT(answersTo(GetParam().method, bytes(2)), IsEmpty());
    EXPECT_EQ(spy.count(), 0);
    EXPECT_THAT(platform_double::takeLog(),
                ElementsAre(enterLine(), line(GetParam().failureLevel, GetParam().firstBadCode,
                                              "Leave, Failed.(isEnableID(iClientID) == false)")));
}

TEST_P(ImporterRequests, WithoutAControllerIsAnsweredWith1) {
    use(new MediaImporterService(nullptr));
    request(kRegisterCallBack, int64(kCallBackObject) + int64(1000));
    mSender.take();
    EXPECT_THAT(answersTo(GetParam().method, bytes(1)), ElementsAre(answer(1)));
    EXPECT_THAT(
        platform_double::takeLog(),
        ElementsAre(enterLine(), line(GetParam().failureLevel, GetParam().firstBadCode + 1,
                                      "Leave, Failed.(NULL == mpMediaImporterController)")));
}

TEST_P(ImporterRequests, IsAnsweredEvenWhenASlotThrows) {
    QObject::connect(mpService, GetParam().signal, mpService, SIGNAL(generateDotFile_signal()));
    EXPECT_CALL(*mpImporter, dumpGraph(_)).WillRepeatedly(Throw(std::runtime_error("no")));
    EXPECT_THAT(answersTo(GetParam().method, bytes(1)), ElementsAre(answer(0)));
}

TEST_F(ImporterService, ImportsWhatWasAskedFor) {
    EXPECT_CALL(*mpImporter, import(L"/a"s, L"b"s));
    requestFromWorker(kImport, int32(1) + text("/a") + text("b"));
    runQueued();
}

TEST_F(ImporterService, OfTwoImportsAtOnceBothUseTheLaterTexts) {
    EXPECT_CALL(*mpImporter, import(L"/second"s, L""s)).Times(2);
    requestFromWorker(kImport, int32(1) + text("/first") + text("x"));
    requestFromWorker(kImport, int32(1) + text("/second") + text(""));
    runQueued();
}

TEST_F(ImporterService, AnswersAStatusWhenTheEngineHasToldIt) {
    EXPECT_CALL(*mpImporter, status(_))
        .WillOnce(DoAll(SetArgReferee<0>(MediaImporterStatus{5, 9}), Return(1)));
    requestFromWorker(kGetStatus, int32(1));
    EXPECT_THAT(mSender.take(), IsEmpty());
    runQueued();
    EXPECT_THAT(mSender.take(), ElementsAre(SentEvent{kCallBackObject, 5,
                                                      int32(1) + int32(0) + int64(5) + int64(9)}));
    EXPECT_THAT(platform_double::takeLog(), IsEmpty());
}

TEST_F(ImporterService, DropsTheStatusOfAClientThatHasLeft) {
    requestFromWorker(kGetStatus, int32(1));
    request(kUnregisterCallBack, int32(1));
    runQueued();
    EXPECT_THAT(mSender.take(), IsEmpty());
}

TEST_F(ImporterService, RefusesTheStatusToAnUnknownClient) {
    EXPECT_CALL(*mpImporter, status(_)).Times(0);
    EXPECT_THAT(answersTo(kGetStatus, int32(2)), IsEmpty());
    EXPECT_THAT(platform_double::takeLog(),
                ElementsAre(LogLine{3, "MediaImporterService 407: "
                                       "MediaImporterService::getImporterStatus Leave, "
                                       "Failed.(isEnableID(iClientID) == false)"}));
}

TEST_F(ImporterService, WithoutAControllerHasNoStatus) {
    use(new MediaImporterService(nullptr));
    request(kRegisterCallBack, int64(kCallBackObject) + int64(1000));
    mSender.take();
    EXPECT_THAT(answersTo(kGetStatus, int32(1)), IsEmpty());
}

TEST_F(ImporterService, TellsEveryNotifyClientInAscendingOrderOfClientId) {
    registerNotify(205, 5);
    registerNotify(202, 2);
    registerNotify(209, 2); // the first one stays
    // As the engine does it: from a thread of its own.
    MediaImporterNotify notification{1, 0, L"x"};
    std::thread([&] { mpImporter->notify(notification); }).join();
    EXPECT_THAT(mSender.take(), IsEmpty());
    runQueued();
    const Bytes bytes = Bytes{1} + int32(0) + text("x") + text("") + text("") + int32(0) +
                        int32(0) + int32(0) + int32(0) + int32(0);
    EXPECT_THAT(mSender.take(), ElementsAre(SentEvent{202, 1, bytes}, SentEvent{205, 1, bytes}));
}

TEST_F(ImporterService, TellsNobodyWhenNobodyListens) {
    registerNotify(202, 2);
    request(kUnregisterNotify, int32(2));
    MediaImporterNotify notification{1, 0, L"x"};
    mpImporter->notify(notification);
    EXPECT_THAT(mSender.take(), IsEmpty());
}

TEST_F(ImporterService, IgnoresNullObjects) {
    mpService->registerCallBack(nullptr);
    mpService->registerNotify({nullptr, 1});
    EXPECT_THAT(mSender.take(), IsEmpty());
    EXPECT_FALSE(mpService->isEnableID(2));
}

TEST_F(ImporterService, GivesEachClientItsNumber) {
    EXPECT_THAT(answersTo(kRegisterCallBack, int64(101) + int64(1001)),
                ElementsAre(SentEvent{101, 1, int32(2)}));
}

TEST_F(ImporterService, AnswersToTheNamesOfItsBases) {
    for (const char* name : {"MediaImporterService", "IMediaImporterService", "ClientNotify"})
        EXPECT_NE(mpService->qt_metacast(name), nullptr) << name;
}
