// SPDX-License-Identifier: MIT
#include "tests/daemon/support/PlayerClient.h"

#include <gtest/gtest.h>

using wire::Packet;

std::int64_t receiverOf(long identity) {
    if (identity >= 1000 && identity <= 1005)
        return identity - 999;
    return identity == 1007 ? 7 : 8;
}

wire::Bytes encode(const PlayerStatus& status) {
    return wire::int32(status.code) + wire::int32(0) + wire::int64(status.value1) +
           wire::int64(status.value2);
}

PlayerStatus decodeStatus(const std::optional<Packet>& reply) {
    if (!reply || reply->method != callback::kGetPlayerStatus || reply->payload.size() != 28) {
        ADD_FAILURE() << "Not a status reply: " << testing::PrintToString(reply);
        return {};
    }
    return {wire::readInt32(reply->payload.substr(0, 5)), wire::readInt64(reply->payload, 10),
            wire::readInt64(reply->payload, 19)};
}

PlayerClient::PlayerClient(long identity) : WireClient(identity), mCallbackObject(identity * 100) {}

void PlayerClient::registerCallBack() {
    if (mId < 0)
        connect();
    request(request::kRegisterCallBack,
            wire::integer(callbackObject()) + wire::integer(identity()));
    const auto reply = receive();
    ASSERT_TRUE(reply) << "No answer to the registration of " << identity();
    mId = wire::readInt32(reply->payload);
    EXPECT_EQ(*reply, callbackPacket(callback::kSetPlayerClientId, wire::int32(mId)));
}

void PlayerClient::registerNotify() {
    request(request::kRegisterNotify,
            wire::integer(notifyObject()) + wire::integer(identity()) + wire::integer(id()));
    expectNothingElse();
}

void PlayerClient::request(long method, const wire::Bytes& arguments) {
    send(Packet{8, 62, method, false, true, arguments});
}

void PlayerClient::request(long method) {
    request(method, wire::integer(id()));
}

void PlayerClient::open(std::string_view name) {
    request(request::kOpenPlayer, wire::integer(id()) + wire::text(name));
}

void PlayerClient::seek(std::int64_t position, std::int32_t mode, bool option) {
    request(request::kSeek, wire::integer(id()) + wire::integer(mode) + wire::int64(position) +
                                wire::boolean(option));
}

void PlayerClient::setRepeat(bool repeat, std::int64_t start, std::int64_t end) {
    request(request::kSetRepeat,
            wire::integer(id()) + wire::boolean(repeat) + wire::int64(start) + wire::int64(end));
}

Packet PlayerClient::callbackPacket(long method, const wire::Bytes& payload) const {
    return {receiverOf(identity()), callbackObject(), method, true, true, payload};
}

Packet PlayerClient::notifyPacket(const wire::Bytes& payload) const {
    return {receiverOf(identity()), notifyObject(), 1, true, true, payload};
}

void PlayerClient::expectReply(long method, std::int32_t result) {
    EXPECT_EQ(receive(), callbackPacket(method, wire::int32(result)));
}

void PlayerClient::callAccepted(long method, long callback) {
    request(method);
    expectReply(callback, 0);
}

void PlayerClient::expectNothingElse() {
    const long markerObject = callbackObject() + 99;
    request(request::kRegisterCallBack, wire::integer(markerObject) + wire::integer(identity()));
    const auto reply = receive();
    ASSERT_TRUE(reply) << "No answer to " << identity();
    EXPECT_EQ(reply->object, markerObject) << testing::PrintToString(*reply);
    EXPECT_EQ(reply->method, callback::kSetPlayerClientId);
}
