// SPDX-License-Identifier: MIT
#include "tests/daemon/support/Life.h"

#include <gtest/gtest.h>

#include "tests/daemon/support/PlayerClient.h"

using wire::Packet;

namespace {

// The same in every life, as programs have them.
long callbackObject(const WireService& service) {
    return service.object + 1000;
}
long notifyObject(const WireService& service) {
    return service.object + 2000;
}

} // namespace

std::int32_t Life::registerCallBack(const WireService& service) {
    sendRegistration(service);
    const auto reply = receive();
    if (!reply) {
        ADD_FAILURE() << "No answer to the registration of " << identity();
        return -1;
    }
    const auto id = wire::readInt32(reply->payload);
    EXPECT_EQ(*reply, answer(service, 1, wire::int32(id)));
    return id;
}

void Life::sendRegistration(const WireService& service) {
    request(service, service.registerCallBack,
            wire::integer(callbackObject(service)) + wire::integer(identity()));
}

void Life::registerNotify(const WireService& service, std::int32_t client) {
    request(service, service.registerNotify,
            wire::integer(notifyObject(service)) + wire::integer(identity()) +
                wire::integer(client));
}

void Life::request(const WireService& service, long method, const wire::Bytes& arguments) {
    mRoad.send({8, service.object, method, false, true, arguments});
}

void Life::expectCallBack(const WireService& service, long method, const wire::Bytes& arguments) {
    EXPECT_EQ(receive(), answer(service, method, arguments));
}

void Life::expectResult(const WireService& service, long method, std::int32_t result) {
    expectCallBack(service, method, wire::int32(result));
}

Packet Life::answer(const WireService& service, long method, const wire::Bytes& arguments) const {
    return {receiverOf(identity()), callbackObject(service), method, true, true, arguments};
}

Packet Life::notification(const WireService& service, const wire::Bytes& arguments) const {
    return {receiverOf(identity()), notifyObject(service), 1, true, true, arguments};
}
