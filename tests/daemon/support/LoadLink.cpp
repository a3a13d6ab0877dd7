// SPDX-License-Identifier: MIT
#include "tests/daemon/support/LoadLink.h"

#include <gtest/gtest.h>

namespace load {

void Link::ask(const WireService& service, long method, const wire::Bytes& arguments) {
    request(service, method, arguments);
    ++mAsked;
}

void Link::askFor(const WireService& service, long method, const wire::Bytes& arguments,
                  long answerMethod, std::int32_t result) {
    ask(service, method, arguments);
    mOwed.push_back(answer(service, answerMethod, wire::int32(result)));
}

void Link::take(const wire::Packet& packet) {
    if (mOwed.empty()) {
        ADD_FAILURE() << identity()
                      << " is answered what it did not ask: " << testing::PrintToString(packet);
        return;
    }
    EXPECT_EQ(packet, mOwed.front());
    mOwed.pop_front();
}

} // namespace load
