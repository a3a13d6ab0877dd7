// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <future>
#include <optional>
#include <string_view>

#include <gmock/gmock.h>

#include "qnsmedia/Error.h"
#include "qnsmedia/Player.h"
#include "tests/client/support/FakeDaemon.h"
#include "tests/daemon/support/Patience.h"

/** A player of the library, registered with a daemon that the test plays. */
class ConnectedPlayer : public testing::Test {
protected:
    /** Long enough for an answer, when one comes, and no burden when the test waits for none. */
    static qnsmedia::Connection::Options shortDeadline() {
        qnsmedia::Connection::Options options;
        options.deadline = patience::stretched(std::chrono::milliseconds(100));
        return options;
    }

    void SetUp() override { connect({}); }

    void connect(const qnsmedia::Connection::Options& options) {
        mPlayer.reset();
        mConnection.reset();
        mConnection.emplace(options);
        mPlayer.emplace(*mConnection);
    }

    /** An answered request: everything that was sent before has been taken in. */
    void expectAlive() {
        mDaemon.on(request::kSetRepeat, [this](const wire::Packet& request) {
            mDaemon.reply(request, callback::kSetRepeat, wire::int32(0));
        });
        EXPECT_NO_THROW(mPlayer->noRepeat().get());
    }

    FakeDaemon mDaemon;
    std::optional<qnsmedia::Connection> mConnection;
    std::optional<qnsmedia::Player> mPlayer;
};

/** A notification's nine items. */
inline wire::Bytes notification(long kind, std::int32_t result, std::string_view text,
                                std::int64_t param1 = 0, std::int64_t param2 = 0,
                                std::int64_t param3 = 0, std::uint64_t value1 = 0,
                                std::uint64_t value2 = 0, std::int64_t value = 0) {
    return wire::integer(kind) + wire::int32(result) + wire::text(text) + wire::integer(param1) +
           wire::integer(param2) + wire::integer(param3) + wire::uint64(value1) +
           wire::uint64(value2) + wire::int64(value);
}

/** True when it is told in time. */
template<typename Value>
bool comes(const std::future<Value>& future) {
    return future.wait_until(patience::deadline()) == std::future_status::ready;
}
