// SPDX-License-Identifier: MIT
#include <chrono>
#include <future>
#include <stdexcept>

#include <gmock/gmock.h>

#include "qnsmedia/Error.h"
#include "qnsmedia/Player.h"
#include "tests/client/support/FakeDaemon.h"

using namespace std::chrono_literals;
using qnsmedia::Connection;
using testing::HasSubstr;
using testing::ThrowsMessage;

namespace {

Connection::Options identity(int number) {
    Connection::Options options;
    options.identity = number;
    return options;
}

Connection::Options deadline(std::chrono::milliseconds time) {
    Connection::Options options;
    options.deadline = time;
    return options;
}

bool comes(const std::future<void>& event) {
    return event.wait_until(patience::deadline()) == std::future_status::ready;
}

TEST(ClientConnection, TakesTheIdentityThatItIsGiven) {
    const FakeDaemon daemon;
    EXPECT_EQ(Connection(identity(1003)).identity(), 1003);
    EXPECT_EQ(Connection(identity(1007)).identity(), 1007);
}

TEST(ClientConnection, TakesTheFirstIdentityThatIsFree) {
    const FakeDaemon daemon;
    const auto other = listenOn(1000);
    const Connection first;
    const Connection second;
    EXPECT_EQ(first.identity(), 1001);
    EXPECT_EQ(second.identity(), 1002);
}

TEST(ClientConnection, SaysThatAnIdentityIsInUse) {
    const FakeDaemon daemon;
    const auto other = listenOn(1004);
    EXPECT_THAT([] { const Connection connection(identity(1004)); },
                ThrowsMessage<qnsmedia::IdentityInUse>(HasSubstr("1004")));
}

TEST(ClientConnection, SaysThatAllIdentitiesAreInUse) {
    const FakeDaemon daemon;
    std::list<qns::UniqueFd> others;
    for (long port = 1000; port <= 1007; ++port)
        others.push_back(listenOn(port));
    EXPECT_THROW(const Connection connection, qnsmedia::IdentityInUse);
    others.pop_back();
    EXPECT_EQ(Connection().identity(), 1007);
}

TEST(ClientConnection, GivesItsIdentityBack) {
    const FakeDaemon daemon;
    for (int i = 0; i < 3; ++i)
        EXPECT_EQ(Connection().identity(), 1000);
}

TEST(ClientConnection, RefusesNumbersThatAreNoIdentities) {
    const FakeDaemon daemon;
    for (const int number : {999, 1008, 0, -1})
        EXPECT_THROW(const Connection connection(identity(number)), qnsmedia::Error) << number;
}

TEST(ClientConnection, RefusesDeadlinesThatMakeNoSense) {
    const FakeDaemon daemon;
    for (const auto time : {0ms, -1ms, std::chrono::milliseconds(24h) + 1ms})
        EXPECT_THROW(const Connection connection(deadline(time)), qnsmedia::Error) << time.count();
    EXPECT_TRUE(Connection(deadline(24h)).alive());
}

TEST(ClientConnection, SaysThatTheDaemonIsNotRunning) {
    EXPECT_THAT([] { const Connection connection; },
                ThrowsMessage<qnsmedia::DaemonNotRunning>(HasSubstr("127.0.0.1:1008")));
}

TEST(ClientConnection, CanBeMadeOnceTheDaemonRuns) {
    EXPECT_THROW(const Connection connection, qnsmedia::DaemonNotRunning);
    const FakeDaemon daemon;
    EXPECT_TRUE(Connection().alive());
}

TEST(ClientConnection, TellsOnceThatTheDaemonHasGone) {
    FakeDaemon daemon;
    Connection connection;
    std::promise<void> lost;
    connection.onLost([&] { lost.set_value(); });
    EXPECT_TRUE(connection.alive());
    daemon.die();
    EXPECT_TRUE(comes(lost.get_future()));
    EXPECT_FALSE(connection.alive());
}

TEST(ClientConnection, TellsAlsoAHandlerThatComesAfterTheLoss) {
    FakeDaemon daemon;
    Connection connection;
    std::promise<void> lost;
    connection.onLost([&] { lost.set_value(); });
    daemon.die();
    EXPECT_TRUE(comes(lost.get_future()));
    std::promise<void> told;
    connection.onLost([&] { told.set_value(); });
    EXPECT_TRUE(comes(told.get_future()));
}

TEST(ClientConnection, TellsWhatAHandlerHasThrown) {
    FakeDaemon daemon;
    Connection connection;
    std::promise<std::string> thrown;
    connection.onError([&](std::exception_ptr error) {
        try {
            std::rethrow_exception(error);
        } catch (const std::runtime_error& caught) {
            thrown.set_value(caught.what());
        }
    });
    connection.onLost([] { throw std::runtime_error("from the handler"); });
    daemon.die();
    EXPECT_EQ(thrown.get_future().get(), "from the handler");
}

TEST(ClientConnection, DropsWhatTheErrorHandlerThrows) {
    FakeDaemon daemon;
    Connection connection;
    std::promise<void> told;
    connection.onError([&](std::exception_ptr) {
        told.set_value();
        throw 1;
    });
    qnsmedia::Player player(connection);
    player.play([](std::exception_ptr) { throw 2; });
    EXPECT_TRUE(comes(told.get_future()));
    EXPECT_NO_THROW(player.pause().get());
}

TEST(ClientConnection, MayGoBeforeThePlayer) {
    const FakeDaemon daemon;
    auto connection = std::make_unique<Connection>();
    qnsmedia::Player player(*connection);
    connection.reset();
    EXPECT_NO_THROW(player.play().get());
}

} // namespace
