// SPDX-License-Identifier: MIT
#include "tests/daemon/support/DiscovererClient.h"

#include <gtest/gtest.h>

#include "tests/daemon/support/PlayerClient.h"

using wire::Packet;

wire::Bytes discoverer::imageResult(std::int32_t result, std::int32_t code, std::string_view file,
                                    std::string_view image) {
    return wire::int32(result) + wire::int32(code) + wire::text(file) + wire::text(image);
}

wire::Bytes discoverer::noStreams() {
    return wire::raw("") + wire::int32(0) + wire::int32(0);
}

std::int32_t DiscovererClient::registerCallBack(long object) {
    if (!mConnected)
        connect();
    mConnected = true;
    request(discoverer::kRegister, wire::integer(object) + wire::integer(identity()));
    const auto reply = receive();
    if (!reply) {
        ADD_FAILURE() << "No answer to the registration of " << identity();
        return -1;
    }
    const auto id = wire::readInt32(reply->payload);
    EXPECT_EQ(*reply, (Packet{receiverOf(identity()), object, discoverer::kClientIdCallBack, true,
                              true, wire::int32(id)}));
    return id;
}

void DiscovererClient::request(long method, const wire::Bytes& arguments) {
    send(Packet{8, 51, method, false, true, arguments});
}

void DiscovererClient::request(long method, std::int32_t client) {
    request(method, wire::integer(client));
}

void DiscovererClient::open(std::int32_t client, std::string_view file) {
    request(discoverer::kOpen, wire::integer(client) + wire::text(file));
}

void DiscovererClient::getImage(std::int32_t client, std::string_view image,
                                std::string_view notice, std::int64_t position, std::int32_t width,
                                std::int32_t height) {
    request(discoverer::kGetImage, wire::integer(client) + wire::integer(width) +
                                       wire::integer(height) + wire::integer(position) +
                                       wire::text(image) + wire::text(notice));
}

void DiscovererClient::expectCallBack(long object, long method, const wire::Bytes& arguments) {
    EXPECT_EQ(receive(), (Packet{receiverOf(identity()), object, method, true, true, arguments}));
}

void DiscovererClient::expectResult(long object, long method, std::int32_t result) {
    expectCallBack(object, method, wire::int32(result));
}

void DiscovererClient::expectNothingElse() {
    request(discoverer::kRegister, wire::integer(kMarkerObject) + wire::integer(identity()));
    const auto reply = receive();
    ASSERT_TRUE(reply) << "No answer to " << identity();
    EXPECT_EQ(reply->object, kMarkerObject) << testing::PrintToString(*reply);
    request(discoverer::kUnregister, wire::readInt32(reply->payload));
}
