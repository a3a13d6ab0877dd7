// SPDX-License-Identifier: MIT
#include <functional>
#include <future>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include <gmock/gmock.h>

#include "qnsmedia/Error.h"
#include "qnsmedia/Importer.h"
#include "tests/client/support/ConnectedPlayer.h"
#include "tests/daemon/support/ImporterClient.h"

using namespace std::chrono_literals;
using qnsmedia::Importer;
using qnsmedia::ImporterState;
using qnsmedia::ImportNotification;
using qnsmedia::ImportNotificationKind;
using testing::HasSubstr;
using testing::ThrowsMessage;

namespace {

constexpr auto kOwnId = 1;

/** An importer of the library, registered with a daemon that the test plays. */
class ConnectedImporter : public testing::Test {
protected:
    /** Long enough for an answer, when one comes, on a machine that is busy. */
    static qnsmedia::Connection::Options shortDeadline() {
        qnsmedia::Connection::Options options;
        options.deadline = patience::stretched(500ms);
        return options;
    }

    void SetUp() override { connect({}); }

    void connect(const qnsmedia::Connection::Options& options) {
        mImporter.reset();
        mConnection.reset();
        mConnection.emplace(options);
        mImporter.emplace(*mConnection);
    }

    /** From now on the request is answered with this. */
    void answer(long method, long callback, const wire::Bytes& payload) {
        mDaemon.on(method, [this, callback, payload](const wire::Packet& request) {
            mDaemon.reply(request, callback, payload);
        });
    }

    void answerStatus(const wire::Bytes& status) {
        answer(importer::kGetStatus, importer::kStatusCallBack, status);
    }

    FakeDaemon mDaemon{FakeService::importer()};
    std::optional<qnsmedia::Connection> mConnection;
    std::optional<Importer> mImporter;
};

/** A request that is accepted or refused, in its two forms. */
struct Request {
    const char* name;
    long method;
    long answer;
    wire::Bytes arguments; ///< after the client id
    std::function<std::future<void>(Importer&)> ask;
    std::function<void(Importer&, Importer::Callback)> call;
};

void PrintTo(const Request& request, std::ostream* out) {
    *out << request.name;
}

std::vector<Request> allRequests() {
    return {
        {"initialize", importer::kInitialize, importer::kInitializeCallBack, "",
         [](Importer& importer) { return importer.initialize(); },
         [](Importer& importer, auto told) { importer.initialize(told); }},
        {"import", importer::kImport, importer::kImportCallBack,
         wire::text("/a ü.mp4") + wire::text("Films"),
         [](Importer& importer) { return importer.importFile("/a ü.mp4", "Films"); },
         [](Importer& importer, auto told) { importer.importFile("/a ü.mp4", "Films", told); }},
        {"cancel", importer::kCancel, importer::kCancelCallBack, "",
         [](Importer& importer) { return importer.cancel(); },
         [](Importer& importer, auto told) { importer.cancel(told); }},
    };
}

/** What a callback was told. */
class Told {
public:
    Importer::Callback callback() {
        return [this](std::exception_ptr error) { mPromise.set_value(error); };
    }

    void get() {
        auto future = mPromise.get_future();
        if (!comes(future))
            throw std::runtime_error("the callback was not called");
        if (const auto error = future.get())
            std::rethrow_exception(error);
    }

private:
    std::promise<std::exception_ptr> mPromise;
};

class ImporterRequest : public ConnectedImporter, public testing::WithParamInterface<Request> {};

INSTANTIATE_TEST_SUITE_P(Each, ImporterRequest, testing::ValuesIn(allRequests()),
                         [](const auto& each) { return each.param.name; });

TEST_P(ImporterRequest, CarriesTheClientIdAndItsArguments) {
    EXPECT_NO_THROW(GetParam().ask(*mImporter).get());
    const auto request = mDaemon.waitForRequest(GetParam().method);
    ASSERT_TRUE(request);
    EXPECT_EQ(wire::toHex(request->payload),
              wire::toHex(wire::int32(kOwnId) + GetParam().arguments));
}

TEST_P(ImporterRequest, TellsItsCallbackThatItWasAccepted) {
    Told told;
    GetParam().call(*mImporter, told.callback());
    EXPECT_NO_THROW(told.get());
}

TEST_P(ImporterRequest, CanBeRefused) {
    answer(GetParam().method, GetParam().answer, wire::int32(1));
    EXPECT_THROW(GetParam().ask(*mImporter).get(), qnsmedia::Refused);
    Told told;
    GetParam().call(*mImporter, told.callback());
    EXPECT_THROW(told.get(), qnsmedia::Refused);
}

TEST_P(ImporterRequest, EndsWithAnErrorWhenTheAnswerCannotBeRead) {
    answer(GetParam().method, GetParam().answer, wire::hex("D2 00 00"));
    EXPECT_THAT([&] { GetParam().ask(*mImporter).get(); },
                ThrowsMessage<qnsmedia::Error>(HasSubstr("cannot be read")));
}

TEST_P(ImporterRequest, EndsAtItsDeadlineWithoutAnAnswer) {
    connect(shortDeadline());
    mDaemon.on(GetParam().method, nullptr);
    EXPECT_THROW(GetParam().ask(*mImporter).get(), qnsmedia::TimedOut);
    Told told;
    GetParam().call(*mImporter, told.callback());
    EXPECT_THROW(told.get(), qnsmedia::TimedOut);
}

TEST_P(ImporterRequest, EndsWhenTheDaemonDies) {
    mDaemon.on(GetParam().method, nullptr);
    auto future = GetParam().ask(*mImporter);
    Told told;
    GetParam().call(*mImporter, told.callback());
    EXPECT_TRUE(mDaemon.waitForRequest(GetParam().method));
    mDaemon.die();
    EXPECT_THROW(future.get(), qnsmedia::ConnectionLost);
    EXPECT_THROW(told.get(), qnsmedia::ConnectionLost);
    EXPECT_THROW(GetParam().ask(*mImporter).get(), qnsmedia::ConnectionLost);
}

TEST_P(ImporterRequest, EndsWithTheImporter) {
    mDaemon.on(GetParam().method, nullptr);
    auto future = GetParam().ask(*mImporter);
    Told told;
    GetParam().call(*mImporter, told.callback());
    mImporter.reset();
    EXPECT_THROW(future.get(), qnsmedia::ConnectionLost);
    EXPECT_THROW(told.get(), qnsmedia::ConnectionLost);
}

class ClientImporter : public ConnectedImporter {
protected:
    static bool isReady(const std::future<void>& future) {
        return future.wait_for(0s) == std::future_status::ready;
    }
};

TEST_F(ClientImporter, UnregistersWhenItGoes) {
    EXPECT_EQ(mImporter->clientId(), kOwnId);
    mImporter.reset();
    const auto notify = mDaemon.waitForRequest(importer::kUnregisterNotify);
    ASSERT_TRUE(notify);
    EXPECT_EQ(notify->payload, wire::int32(kOwnId));
    const auto callBack = mDaemon.waitForRequest(importer::kUnregister);
    ASSERT_TRUE(callBack);
    EXPECT_EQ(callBack->payload, wire::int32(kOwnId));
}

TEST_F(ClientImporter, ImportsWithoutAFolder) {
    mImporter->importFile("/a").get();
    const auto request = mDaemon.waitForRequest(importer::kImport);
    ASSERT_TRUE(request);
    EXPECT_EQ(request->payload, wire::int32(kOwnId) + wire::text("/a") + wire::text(""));
}

TEST_F(ClientImporter, ImportsWhenItsTurnHasCome) {
    mDaemon.on(importer::kGetStatus, nullptr);
    auto imported = mImporter->importFile("/a");
    const auto turn = mDaemon.waitForRequest(importer::kGetStatus);
    ASSERT_TRUE(turn);
    EXPECT_FALSE(isReady(imported));
    mDaemon.reply(*turn, importer::kStatusCallBack, importer::status(1, 2, 3));
    EXPECT_NO_THROW(imported.get());
}

TEST_F(ClientImporter, WaitsForItsTurnNoLongerThanTheDeadline) {
    connect(shortDeadline());
    mDaemon.on(importer::kGetStatus, nullptr);
    EXPECT_THROW(mImporter->importFile("/a").get(), qnsmedia::TimedOut);
    Told told;
    mImporter->importFile("/a", "", told.callback());
    EXPECT_THROW(told.get(), qnsmedia::TimedOut);
}

TEST_F(ClientImporter, LosesItsTurnWithTheDaemon) {
    mDaemon.on(importer::kGetStatus, nullptr);
    auto imported = mImporter->importFile("/a");
    EXPECT_TRUE(mDaemon.waitForRequest(importer::kGetStatus));
    mDaemon.die();
    EXPECT_THROW(imported.get(), qnsmedia::ConnectionLost);
}

TEST_F(ClientImporter, LosesItsTurnWhenItGoes) {
    mDaemon.on(importer::kGetStatus, nullptr);
    auto imported = mImporter->importFile("/a");
    EXPECT_TRUE(mDaemon.waitForRequest(importer::kGetStatus));
    mImporter.reset();
    EXPECT_THROW(imported.get(), qnsmedia::ConnectionLost);
}

TEST_F(ClientImporter, RefusesNamesThatEndEarlyOrDoNotFit) {
    EXPECT_THROW(mImporter->importFile(std::string("/a\0b", 4)).get(), qnsmedia::Error);
    EXPECT_THROW(mImporter->importFile("/a", std::string("\0", 1)).get(), qnsmedia::Error);
    // Five bytes of client id, three before the text and the zero after it, and the empty folder.
    const std::size_t most = wire::kMaxPayload - 9 - 2;
    EXPECT_NO_THROW(mImporter->importFile(std::string(most, 'x')).get());
    EXPECT_THAT([&] { mImporter->importFile(std::string(most + 1, 'x')).get(); },
                ThrowsMessage<qnsmedia::Error>(HasSubstr("too long")));
}

TEST_F(ClientImporter, TellsTheStatus) {
    answerStatus(importer::status(2, 5'000'000'000, 9'000'000'000));
    const auto status = mImporter->status().get();
    EXPECT_EQ(status.state, ImporterState::cancelling);
    EXPECT_EQ(status.bytesDone, 5'000'000'000);
    EXPECT_EQ(status.bytesTotal, 9'000'000'000);
    answerStatus(importer::status(-1, 0, 0));
    std::promise<ImporterState> told;
    mImporter->status([&](std::exception_ptr error, qnsmedia::ImporterStatus now) {
        EXPECT_FALSE(error);
        told.set_value(now.state);
    });
    EXPECT_EQ(told.get_future().get(), ImporterState::unknown);
}

TEST_F(ClientImporter, TellsWhyThereIsNoStatus) {
    answerStatus(importer::status(0, 0, 0).substr(0, 20));
    EXPECT_THAT([&] { (void)mImporter->status().get(); },
                ThrowsMessage<qnsmedia::Error>(HasSubstr("cannot be read")));
    connect(shortDeadline());
    mDaemon.on(importer::kGetStatus, nullptr);
    EXPECT_THROW((void)mImporter->status().get(), qnsmedia::TimedOut);
    auto waiting = mImporter->status();
    mDaemon.die();
    EXPECT_THROW((void)waiting.get(), qnsmedia::Error);
}

TEST_F(ClientImporter, TellsWhatANotificationSays) {
    std::promise<ImportNotification> told;
    mImporter->onNotification([&](const ImportNotification& arrived) { told.set_value(arrived); });
    mDaemon.notify(
        importer::notification(2, 4, "zu spät", {"H.264", "AAC", {320, -180, 30000, 1001, 48000}}));
    const ImportNotification arrived = told.get_future().get();
    EXPECT_EQ(arrived.kind, ImportNotificationKind::finished);
    EXPECT_EQ(arrived.result, 4);
    EXPECT_EQ(arrived.text, "zu spät");
    EXPECT_EQ(arrived.video, "H.264");
    EXPECT_EQ(arrived.audio, "AAC");
    EXPECT_EQ(arrived.width, 320);
    EXPECT_EQ(arrived.height, -180);
    EXPECT_EQ(arrived.frameRateNumerator, 30000);
    EXPECT_EQ(arrived.frameRateDenominator, 1001);
    EXPECT_EQ(arrived.sampleRate, 48000);
}

TEST_F(ClientImporter, DropsNotificationsThatAreCutOffAndSurvivesHandlersThatThrow) {
    const auto whole = importer::notification(3, 0, "/a", {"v", "a", {1, 2, 3, 4, 5}});
    int count = 0;
    std::promise<void> told;
    mImporter->onNotification([&](const ImportNotification& arrived) {
        ++count;
        if (arrived.text == "end")
            told.set_value();
        throw 1;
    });
    for (std::size_t length = 1; length < whole.size(); ++length)
        mDaemon.notify(whole.substr(0, length));
    mDaemon.notify(whole);
    mDaemon.notify(importer::notification(2, 0, "end"));
    told.get_future().get();
    EXPECT_EQ(count, 2);
}

TEST_F(ClientImporter, HandlersMayImport) {
    std::promise<void> told;
    mImporter->onNotification([&](const ImportNotification&) {
        mImporter->importFile("/next", "", [&](std::exception_ptr error) {
            EXPECT_FALSE(error);
            told.set_value();
        });
    });
    mDaemon.notify(importer::notification(2, 0, "/a"));
    EXPECT_TRUE(comes(told.get_future()));
}

TEST_F(ClientImporter, ImportsAgainAfterTheWordOfATurnWentToAnother) {
    connect(shortDeadline());
    for (int round = 0; round < 3; ++round) {
        mDaemon.on(importer::kGetStatus, nullptr);
        EXPECT_THROW(mImporter->importFile("/a").get(), qnsmedia::TimedOut);
        answerStatus(importer::status(0, 0, 0));
        for (int i = 0; i < 3; ++i)
            EXPECT_NO_THROW(mImporter->importFile("/b").get());
    }
}

TEST_F(ClientImporter, DoesNotTakeTheAnswerToAnEarlierQuestionForItsTurn) {
    mDaemon.on(importer::kGetStatus, nullptr);
    auto status = mImporter->status();
    const auto question = mDaemon.waitForRequest(importer::kGetStatus);
    auto imported = mImporter->importFile("/a");
    const auto turn = mDaemon.waitForRequest(importer::kGetStatus);
    ASSERT_TRUE(question && turn);
    mDaemon.reply(*question, importer::kStatusCallBack, importer::status(1, 2, 3));
    EXPECT_EQ(status.get().bytesDone, 2);
    EXPECT_FALSE(isReady(imported));
    mDaemon.reply(*turn, importer::kStatusCallBack, importer::status(1, 2, 3));
    EXPECT_NO_THROW(imported.get());
}

TEST_F(ClientImporter, AsksForItsTurnAndTheStatusOnlyOnceAtATime) {
    mDaemon.on(importer::kGetStatus, nullptr);
    auto imported = mImporter->importFile("/a");
    const auto turn = mDaemon.waitForRequest(importer::kGetStatus);
    ASSERT_TRUE(turn);
    auto first = mImporter->status();
    auto second = mImporter->status();
    mImporter->cancel().get();
    mDaemon.reply(*turn, importer::kStatusCallBack, importer::status(1, 2, 3));
    EXPECT_NO_THROW(imported.get());
    EXPECT_EQ(first.get().bytesDone, 2);
    EXPECT_EQ(second.get().bytesDone, 2);
    answerStatus(importer::status(0, 9, 9));
    EXPECT_EQ(mImporter->status().get().bytesDone, 9);
    EXPECT_TRUE(mDaemon.waitForRequest(importer::kGetStatus));
    mImporter->initialize().get();
    EXPECT_FALSE(mDaemon.hasRequest(importer::kGetStatus));
}

} // namespace
