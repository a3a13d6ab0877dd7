// SPDX-License-Identifier: MIT
#include <functional>
#include <string>
#include <vector>

#include "tests/client/support/ConnectedPlayer.h"

using namespace std::chrono_literals;
using qnsmedia::NotificationKind;
using qnsmedia::Player;
using qnsmedia::PlayerNotification;
using qnsmedia::PlayerState;
using testing::HasSubstr;
using testing::ThrowsMessage;

namespace {

constexpr auto kOwnId = 1;

/** A request that is accepted or refused, in its two forms. */
struct Request {
    const char* name;
    long method;
    long answer;
    wire::Bytes arguments; ///< after the client id
    std::function<std::future<void>(Player&)> ask;
    std::function<void(Player&, Player::Callback)> call;
};

void PrintTo(const Request& request, std::ostream* out) {
    *out << request.name;
}

std::vector<Request> allRequests() {
    return {
        {"initialize", request::kInitializePlayer, callback::kInitializePlayer, "",
         [](Player& player) { return player.initialize(); },
         [](Player& player, auto told) { player.initialize(told); }},
        {"open", request::kOpenPlayer, callback::kOpenPlayer, wire::text("/a ü.mp4"),
         [](Player& player) { return player.open("/a ü.mp4"); },
         [](Player& player, auto told) { player.open("/a ü.mp4", told); }},
        {"close", request::kClosePlayer, callback::kClosePlayer, "",
         [](Player& player) { return player.close(); },
         [](Player& player, auto told) { player.close(told); }},
        {"play", request::kPlay, callback::kPlay, "", [](Player& player) { return player.play(); },
         [](Player& player, auto told) { player.play(told); }},
        {"pause", request::kPause, callback::kPause, "",
         [](Player& player) { return player.pause(); },
         [](Player& player, auto told) { player.pause(told); }},
        {"seek", request::kSeek, callback::kSeek,
         wire::int32(2) + wire::int64(-5'000'000'000) + wire::boolean(false),
         [](Player& player) { return player.seek(-5s, qnsmedia::SeekMode::relative); },
         [](Player& player, auto told) { player.seek(-5s, qnsmedia::SeekMode::relative, told); }},
        {"repeat", request::kSetRepeat, callback::kSetRepeat,
         wire::boolean(true) + wire::int64(1'000'000'000) + wire::int64(-1),
         [](Player& player) { return player.repeat(1s, qnsmedia::Nanoseconds(-1)); },
         [](Player& player, auto told) { player.repeat(1s, qnsmedia::Nanoseconds(-1), told); }},
        {"noRepeat", request::kSetRepeat, callback::kSetRepeat,
         wire::boolean(false) + wire::int64(0) + wire::int64(-1),
         [](Player& player) { return player.noRepeat(); },
         [](Player& player, auto told) { player.noRepeat(told); }},
    };
}

/** What a callback was told. */
class Told {
public:
    Player::Callback callback() {
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

class PlayerRequest : public ConnectedPlayer, public testing::WithParamInterface<Request> {
protected:
    void answerWith(const wire::Bytes& payload) {
        mDaemon.on(GetParam().method, [this, payload](const wire::Packet& request) {
            mDaemon.reply(request, GetParam().answer, payload);
        });
    }
};

INSTANTIATE_TEST_SUITE_P(Each, PlayerRequest, testing::ValuesIn(allRequests()),
                         [](const auto& each) { return each.param.name; });

TEST_P(PlayerRequest, CarriesTheClientIdAndItsArguments) {
    EXPECT_NO_THROW(GetParam().ask(*mPlayer).get());
    const auto request = mDaemon.waitForRequest(GetParam().method);
    ASSERT_TRUE(request);
    EXPECT_EQ(wire::toHex(request->payload),
              wire::toHex(wire::int32(kOwnId) + GetParam().arguments));
}

TEST_P(PlayerRequest, TellsItsCallbackThatItWasAccepted) {
    Told told;
    GetParam().call(*mPlayer, told.callback());
    EXPECT_NO_THROW(told.get());
}

TEST_P(PlayerRequest, CanBeRefused) {
    answerWith(wire::int32(1));
    EXPECT_THROW(GetParam().ask(*mPlayer).get(), qnsmedia::Refused);
    Told told;
    GetParam().call(*mPlayer, told.callback());
    EXPECT_THROW(told.get(), qnsmedia::Refused);
}

TEST_P(PlayerRequest, EndsWithAnErrorWhenTheAnswerCannotBeRead) {
    answerWith(wire::hex("D2 00 00"));
    EXPECT_THAT([&] { GetParam().ask(*mPlayer).get(); },
                ThrowsMessage<qnsmedia::Error>(HasSubstr("cannot be read")));
}

TEST_P(PlayerRequest, EndsAtItsDeadlineWithoutAnAnswer) {
    if (GetParam().method == request::kInitializePlayer)
        GTEST_SKIP() << "It has five seconds more";
    connect(shortDeadline());
    mDaemon.on(GetParam().method, nullptr);
    EXPECT_THROW(GetParam().ask(*mPlayer).get(), qnsmedia::TimedOut);
    Told told;
    GetParam().call(*mPlayer, told.callback());
    EXPECT_THROW(told.get(), qnsmedia::TimedOut);
}

TEST_P(PlayerRequest, EndsWhenTheDaemonDies) {
    mDaemon.on(GetParam().method, nullptr);
    auto future = GetParam().ask(*mPlayer);
    Told told;
    GetParam().call(*mPlayer, told.callback());
    EXPECT_TRUE(mDaemon.waitForRequest(GetParam().method));
    mDaemon.die();
    EXPECT_THROW(future.get(), qnsmedia::ConnectionLost);
    EXPECT_THROW(told.get(), qnsmedia::ConnectionLost);
    EXPECT_THROW(GetParam().ask(*mPlayer).get(), qnsmedia::ConnectionLost);
}

class ClientPlayer : public ConnectedPlayer {};

TEST_F(ClientPlayer, HasTheIdThatTheDaemonGave) {
    EXPECT_EQ(mPlayer->clientId(), 1);
    EXPECT_EQ(Player(*mConnection).clientId(), 2);
}

TEST_F(ClientPlayer, UnregistersWhenItGoes) {
    mPlayer.reset();
    const auto notify = mDaemon.waitForRequest(request::kUnregisterNotify);
    ASSERT_TRUE(notify);
    EXPECT_EQ(notify->payload, wire::int32(1));
    const auto callBack = mDaemon.waitForRequest(request::kUnregisterCallBack);
    ASSERT_TRUE(callBack);
    EXPECT_EQ(callBack->payload, wire::int32(1));
}

TEST_F(ClientPlayer, SaysWhyTheRegistrationMayHaveNoAnswer) {
    connect(shortDeadline());
    mDaemon.on(request::kRegisterCallBack, nullptr);
    EXPECT_THAT([&] { const Player player(*mConnection); },
                ThrowsMessage<qnsmedia::TimedOut>(HasSubstr("identity 1000")));
}

TEST_F(ClientPlayer, DoesNotTakeZeroForAnId) {
    mDaemon.on(request::kRegisterCallBack, [this](const wire::Packet& request) {
        mDaemon.send({mDaemon.receiver(), wire::readInt64(request.payload, 0),
                      callback::kSetPlayerClientId, true, true, wire::int32(0)});
    });
    EXPECT_THAT([&] { const Player player(*mConnection); },
                ThrowsMessage<qnsmedia::Error>(HasSubstr("cannot be read")));
}

TEST_F(ClientPlayer, TellsTheStatus) {
    mDaemon.on(request::kGetPlayerStatus, [this](const wire::Packet& request) {
        mDaemon.reply(request, callback::kGetPlayerStatus, encode(PlayerStatus{3, 1500, 9000}));
    });
    const qnsmedia::PlayerStatus status = mPlayer->status().get();
    EXPECT_EQ(status.state, PlayerState::playing);
    EXPECT_EQ(status.position.count(), 1500);
    EXPECT_EQ(status.duration.count(), 9000);
    std::promise<PlayerState> told;
    mPlayer->status([&](std::exception_ptr error, qnsmedia::PlayerStatus now) {
        EXPECT_FALSE(error);
        told.set_value(now.state);
    });
    EXPECT_EQ(told.get_future().get(), PlayerState::playing);
}

TEST_F(ClientPlayer, ServesAllStatusRequestsThatWaitWithOneAnswer) {
    mDaemon.on(request::kGetPlayerStatus, nullptr);
    auto first = mPlayer->status();
    auto second = mPlayer->status();
    mDaemon.callBack(callback::kGetPlayerStatus, encode(PlayerStatus{1, 0, 0}));
    EXPECT_EQ(first.get().state, PlayerState::paused);
    EXPECT_EQ(second.get().state, PlayerState::paused);
}

TEST_F(ClientPlayer, AnswersRequestsOfOneKindInTheirOrder) {
    mDaemon.on(request::kPlay, nullptr);
    auto first = mPlayer->play();
    auto second = mPlayer->play();
    mDaemon.callBack(callback::kPlay, wire::int32(0));
    mDaemon.callBack(callback::kPlay, wire::int32(1));
    EXPECT_NO_THROW(first.get());
    EXPECT_THROW(second.get(), qnsmedia::Refused);
}

TEST_F(ClientPlayer, DoesNotTakeALateAnswerForTheNextRequests) {
    connect(shortDeadline());
    mDaemon.on(request::kPlay, nullptr);
    EXPECT_THROW(mPlayer->play().get(), qnsmedia::TimedOut);
    mDaemon.on(request::kPlay, [this](const wire::Packet& request) {
        mDaemon.reply(request, callback::kPlay, wire::int32(1)); // the late one
        mDaemon.reply(request, callback::kPlay, wire::int32(0));
    });
    EXPECT_NO_THROW(mPlayer->play().get());
}

TEST_F(ClientPlayer, SendsTheFormatWithoutWaiting) {
    mPlayer->setSystemFormat(qnsmedia::SystemFormat::display60Hz);
    const auto request = mDaemon.waitForRequest(request::kSetSystemFormat);
    ASSERT_TRUE(request);
    EXPECT_EQ(request->payload, wire::int32(1));
}

TEST_F(ClientPlayer, PowersTheDaemonOff) {
    EXPECT_NO_THROW(mPlayer->powerOff().get());
    Told told;
    mPlayer->powerOff(told.callback());
    EXPECT_NO_THROW(told.get());
}

TEST_F(ClientPlayer, TakesADaemonThatHasGoneForOneThatIsOff) {
    mDaemon.on(request::kPowerOffMediaPlayer, nullptr);
    auto future = mPlayer->powerOff();
    Told told;
    mPlayer->powerOff(told.callback());
    EXPECT_TRUE(mDaemon.waitForRequest(request::kPowerOffMediaPlayer));
    mDaemon.die();
    EXPECT_NO_THROW(future.get());
    EXPECT_NO_THROW(told.get());
    EXPECT_THROW(mPlayer->powerOff().get(), qnsmedia::ConnectionLost) << "it was off before";
}

TEST_F(ClientPlayer, RefusesAPathWithAZeroByte) {
    EXPECT_THROW(mPlayer->open(std::string("a\0b", 3)).get(), qnsmedia::Error);
    EXPECT_THROW(mPlayer->openMedia(std::string("a\0b", 3)).get(), qnsmedia::Error);
}

TEST_F(ClientPlayer, RefusesAPathThatDoesNotFitIntoARequest) {
    // Five bytes of client id, three before the text and the zero after it.
    const std::size_t most = wire::kMaxPayload - 9;
    EXPECT_NO_THROW(mPlayer->open(std::string(most, 'x')).get());
    EXPECT_THAT([&] { mPlayer->open(std::string(most + 1, 'x')).get(); },
                ThrowsMessage<qnsmedia::Error>(HasSubstr("too long")));
    EXPECT_THROW(mPlayer->openMedia(std::string(most + 1, 'x')).get(), qnsmedia::Error);
}

TEST_F(ClientPlayer, TellsWhatANotificationSays) {
    std::promise<PlayerNotification> told;
    mPlayer->onNotification([&](const PlayerNotification& arrived) { told.set_value(arrived); });
    mDaemon.notify(notification(4, 7, "zu spät", 1, -2, 300, 4, 5, -6));
    const PlayerNotification arrived = told.get_future().get();
    EXPECT_EQ(arrived.kind, NotificationKind::failure);
    EXPECT_EQ(arrived.result, 7);
    EXPECT_EQ(arrived.text, "zu spät");
    EXPECT_EQ(arrived.param1, 1);
    EXPECT_EQ(arrived.param2, -2);
    EXPECT_EQ(arrived.param3, 300);
    EXPECT_EQ(arrived.value1, 4U);
    EXPECT_EQ(arrived.value2, 5U);
    EXPECT_EQ(arrived.value, -6);
}

TEST_F(ClientPlayer, TellsOnlyTheLatestHandler) {
    std::promise<void> told;
    mPlayer->onNotification([](const PlayerNotification&) { ADD_FAILURE() << "replaced"; });
    mPlayer->onNotification([&](const PlayerNotification&) { told.set_value(); });
    mDaemon.notify(notification(3, 0, ""));
    EXPECT_TRUE(comes(told.get_future()));
}

TEST_F(ClientPlayer, HandlersMayMakeRequests) {
    std::promise<void> told;
    mPlayer->onNotification([&](const PlayerNotification&) {
        mPlayer->play([&](std::exception_ptr error) {
            EXPECT_FALSE(error);
            told.set_value();
        });
    });
    mDaemon.notify(notification(3, 0, ""));
    EXPECT_TRUE(comes(told.get_future()));
}

TEST_F(ClientPlayer, SurvivesHandlersThatThrow) {
    mPlayer->onNotification([](const PlayerNotification&) { throw 1; });
    mDaemon.notify(notification(3, 0, ""));
    mPlayer->play([](std::exception_ptr) { throw 2; });
    expectAlive();
}

class OpenMedia : public ConnectedPlayer {
protected:
    /** The engine's word on each open, after the daemon has accepted it. */
    void tellOutcome(const wire::Bytes& outcome) {
        mDaemon.on(request::kOpenPlayer, [this, outcome](const wire::Packet& request) {
            mDaemon.reply(request, callback::kOpenPlayer, wire::int32(0));
            mDaemon.notify(outcome);
        });
        expectAlive(); // the notify object is registered
    }
};

TEST_F(OpenMedia, TellsWhatWasFound) {
    tellOutcome(notification(1, 0, "/film", 1, 2, 3, 3, 0, 9));
    const qnsmedia::MediaInfo media = mPlayer->openMedia("/film").get();
    EXPECT_EQ(media.videoStreams, 1);
    EXPECT_EQ(media.audioStreams, 2);
    EXPECT_EQ(media.textStreams, 3);
    EXPECT_EQ(media.duration.count(), 9);
    EXPECT_TRUE(media.seekable);
    EXPECT_TRUE(media.live);
}

TEST_F(OpenMedia, TellsWhyItFailed) {
    tellOutcome(notification(1, 3, "no film"));
    try {
        mPlayer->openMedia("/film").get();
        ADD_FAILURE() << "It was opened";
    } catch (const qnsmedia::MediaError& error) {
        EXPECT_EQ(error.result(), 3);
        EXPECT_STREQ(error.what(), "no film");
    }
}

TEST_F(OpenMedia, TellsItsCallback) {
    tellOutcome(notification(1, 0, "/film", 4));
    std::promise<int> told;
    mPlayer->openMedia("/film", [&](std::exception_ptr error, const qnsmedia::MediaInfo& media) {
        EXPECT_FALSE(error);
        told.set_value(media.videoStreams);
    });
    EXPECT_EQ(told.get_future().get(), 4);
}

TEST_F(OpenMedia, IsRefusedWithTheOpen) {
    mDaemon.on(request::kOpenPlayer, [this](const wire::Packet& request) {
        mDaemon.reply(request, callback::kOpenPlayer, wire::int32(1));
    });
    EXPECT_THROW(mPlayer->openMedia("").get(), qnsmedia::Refused);
}

TEST_F(OpenMedia, ToleratesAnOutcomeBeforeTheAcceptance) {
    expectAlive();
    mDaemon.on(request::kOpenPlayer, [this](const wire::Packet& request) {
        mDaemon.notify(notification(1, 0, "/film", 1));
        mDaemon.reply(request, callback::kOpenPlayer, wire::int32(0));
    });
    EXPECT_EQ(mPlayer->openMedia("/film").get().videoStreams, 1);
    expectAlive();
}

TEST_F(OpenMedia, IsNotMisledByThePictureThatWarmsTheEngineUp) {
    expectAlive();
    mDaemon.on(request::kOpenPlayer, [this](const wire::Packet& request) {
        mDaemon.notify(notification(1, 0, "/black.jpg", 7));
        mDaemon.reply(request, callback::kOpenPlayer, wire::int32(0));
        mDaemon.notify(notification(1, 0, "/film", 1));
    });
    EXPECT_EQ(mPlayer->openMedia("/film").get().videoStreams, 1);
}

TEST_F(OpenMedia, EndsWhenAnotherTakesItsPlace) {
    expectAlive();
    mDaemon.on(request::kOpenPlayer, nullptr);
    auto first = mPlayer->openMedia("/first");
    auto second = mPlayer->openMedia("/second");
    try {
        first.get();
        ADD_FAILURE() << "It was opened";
    } catch (const qnsmedia::MediaError& error) {
        EXPECT_EQ(error.result(), 6);
    }
    mDaemon.notify(notification(1, 0, "/second", 2));
    EXPECT_EQ(second.get().videoStreams, 2);
}

TEST_F(OpenMedia, EndsWhenTheDaemonDies) {
    mDaemon.on(request::kOpenPlayer, [this](const wire::Packet& request) {
        mDaemon.reply(request, callback::kOpenPlayer, wire::int32(0));
    });
    auto media = mPlayer->openMedia("/film");
    EXPECT_TRUE(mDaemon.waitForRequest(request::kOpenPlayer));
    mDaemon.die();
    EXPECT_THROW(media.get(), qnsmedia::ConnectionLost);
}

} // namespace
