// SPDX-License-Identifier: MIT
#include <functional>

#include <gtest/gtest.h>

#include "tests/daemon/support/LoadParts.h"
#include "tests/daemon/support/PlayerClient.h"

namespace load {

namespace {

constexpr std::int64_t kSecond = 1'000'000'000;
constexpr std::int64_t kDuration = 10 * kSecond;
constexpr long kMostStatesOwed = 64;

} // namespace

void Notifications::take(const wire::Packet& packet) {
    EXPECT_EQ(packet.method, 1);
    ++mCount;
    mDigest = mDigest * 31 + std::hash<wire::Bytes>{}(packet.payload);
}

void PlayerPart::registerAll() {
    mId = mLink.registerCallBack(kPlayerService);
    mLink.registerNotify(kPlayerService, mId);
}

void PlayerPart::ask() {
    const auto number = mLink.below(1000);
    const auto simple = [&](long method, long answer) {
        mLink.askFor(kPlayerService, method, id(), answer, 0);
    };
    if (number < 250)
        simple(request::kPlay, callback::kPlay);
    else if (number < 450)
        simple(request::kPause, callback::kPause);
    else if (number < 600)
        seek();
    else if (number < 700)
        askForLoop();
    else if (number < 960)
        askForState();
    else if (number < 980)
        mLink.ask(kPlayerService, request::kSetSystemFormat, wire::integer(mLink.below(2)));
    else if (number < 995)
        mLink.askFor(kPlayerService, request::kOpenPlayer, id() + wire::text(mBoard.film),
                     callback::kOpenPlayer, 0);
    else
        close();
}

void PlayerPart::close() {
    mLink.askFor(kPlayerService, request::kClosePlayer, id(), callback::kClosePlayer, 0);
}

void PlayerPart::seek() {
    const auto mode = mLink.below(2);
    mLink.askFor(kPlayerService, request::kSeek,
                 id() + wire::integer(mode) + wire::int64(mLink.below(10) * kSecond) +
                     wire::boolean(false),
                 callback::kSeek, 0);
}

void PlayerPart::askForLoop() {
    const auto start = mLink.below(9) * kSecond;
    mLink.askFor(kPlayerService, request::kSetRepeat,
                 id() + wire::boolean(mLink.happens(50)) + wire::int64(start) +
                     wire::int64(start + kSecond),
                 callback::kSetRepeat, 0);
}

void PlayerPart::askForState() {
    if (mBoard.statesOwed >= kMostStatesOwed)
        return;
    ++mBoard.statesOwed;
    mLink.ask(kPlayerService, request::kGetPlayerStatus, id());
}

bool PlayerPart::take(const wire::Packet& packet) {
    if (packet.object == mLink.notification(kPlayerService, {}).object) {
        mNotifications.take(packet);
        return true;
    }
    if (packet.object != mLink.answer(kPlayerService, 0, {}).object ||
        packet.method != callback::kGetPlayerStatus)
        return false;
    const auto status = decodeStatus(packet);
    EXPECT_TRUE(status.code >= 0 && status.code <= 4) << status.code;
    EXPECT_TRUE(status.value1 >= 0 && status.value1 <= kDuration + kSecond) << status.value1;
    EXPECT_GE(--mBoard.statesOwed, 0);
    return true;
}

} // namespace load
