// SPDX-License-Identifier: MIT
#include "tests/daemon/support/ServiceClient.h"

#include <utility>

#include <gtest/gtest.h>

#include "tests/daemon/support/PlayerClient.h"

using wire::Packet;

namespace {

constexpr long kClientIdCallBack = 1;
constexpr long kMarkerObject = 999;

} // namespace

ServiceClient::ServiceClient(long identity, const ServiceAddress& service)
    : WireClient(identity), mService(service) {}

std::int32_t ServiceClient::registerCallBack(long object) {
    if (!std::exchange(mConnected, true))
        connect();
    sendRegistration(object, identity());
    const auto reply = receive();
    if (!reply) {
        ADD_FAILURE() << "No answer to the registration of " << object;
        return -1;
    }
    const auto id = wire::readInt32(reply->payload);
    EXPECT_EQ(*reply, callback(object, kClientIdCallBack, wire::int32(id)));
    return id;
}

void ServiceClient::sendRegistration(long object, long identity) {
    request(mService.registerCallBack, wire::integer(object) + wire::integer(identity));
}

void ServiceClient::request(long method, const wire::Bytes& arguments) {
    send(Packet{8, mService.object, method, false, true, arguments});
}

void ServiceClient::request(long method, std::int32_t client) {
    request(method, wire::integer(client));
}

void ServiceClient::expectCallBack(long object, long method, const wire::Bytes& arguments) {
    EXPECT_EQ(receive(), callback(object, method, arguments));
}

void ServiceClient::expectResult(long object, long method, std::int32_t result) {
    expectCallBack(object, method, wire::int32(result));
}

void ServiceClient::expectNothingElse() {
    sendRegistration(kMarkerObject, identity());
    const auto reply = receive();
    ASSERT_TRUE(reply) << "No answer to " << identity();
    EXPECT_EQ(reply->object, kMarkerObject) << testing::PrintToString(*reply);
    request(mService.unregisterCallBack, wire::readInt32(reply->payload));
}

Packet ServiceClient::callback(long object, long method, wire::Bytes arguments) const {
    return {receiverOf(identity()), object, method, true, true, std::move(arguments)};
}
