// SPDX-License-Identifier: MIT
#include <cstdint>
#include <optional>
#include <random>
#include <string>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/DiscovererClient.h"

using namespace discoverer;
using wire::Bytes;

namespace {

/** Arguments that no client would send, to a daemon whose engine says yes to everything. */
class DiscovererHostile : public DaemonTest {
protected:
    void SetUp() override {
        DaemonTest::SetUp();
        if (!HasFatalFailure())
            mId = mClient.registerCallBack(kObject);
    }

    void sendTo(long method, const Bytes& payload, bool remote = true) {
        mClient.send({8, 51, method, false, remote, payload});
    }

    /** The daemon still serves this client, also in its main thread, whatever else it sent it. */
    void expectAlive() {
        mClient.request(kUnregister, mId);
        mClient.sendRegistration(kWitness, mClient.identity());
        const auto witness = receiveFor(kWitness, 1);
        ASSERT_TRUE(witness) << mpDaemon->output().joined();
        mClient.request(kGetExtensions, wire::readInt32(witness->payload));
        EXPECT_TRUE(receiveFor(kWitness, kExtensionsCallBack)) << mpDaemon->output().joined();
    }

    /** The next packet to this object and method; those before it are dropped. */
    std::optional<wire::Packet> receiveFor(long object, long method) {
        auto packet = mClient.receive();
        while (packet && (packet->object != object || packet->method != method))
            packet = mClient.receive();
        return packet;
    }

    static constexpr long kObject = 100;
    static constexpr long kWitness = 123456;
    DiscovererClient mClient{1000};
    std::int32_t mId = -1;
};

struct Example {
    long method;
    Bytes arguments;
};

/** Every request in full, in the widest forms. */
std::vector<Example> examples(std::int32_t id) {
    const auto known = wire::int64(id);
    const auto image = wire::int64(4) + wire::int64(2) + wire::int64(7) +
                       wire::text("/nowhere/picture") + wire::text("/nowhere/notice");
    return {{kInitialize, known},
            {kOpen, known + wire::text(std::string(40, 'n'))},
            {kClose, known},
            {kGetMetadata, known},
            {kGetImage, known + image},
            {kGetExtensions, known},
            {kUnregister, wire::int64(1000)},
            {kRegister, wire::int64(4) + wire::int64(1000)}};
}

TEST_F(DiscovererHostile, RequestsThatAreCutOffAnywhereHarmNobody) {
    for (const auto& [method, arguments] : examples(mId))
        for (std::size_t length = 1; length < arguments.size(); ++length)
            sendTo(method, arguments.substr(0, length));
    expectAlive();
}

TEST_F(DiscovererHostile, TextsThatAreCutOffByTheEndOfThePacketHarmNobody) {
    const auto numbers = wire::integer(4) + wire::integer(2) + wire::integer(0);
    for (const char* header : {"DA FF FF", "DB FF FF FF FF", "DB 7F FF FF FF", "BF", "DA 50 00"})
        for (const auto& before : {Bytes(), numbers, numbers + wire::text("/nowhere/picture")})
            for (const std::size_t size : {wire::kMaxPayload, std::size_t{30}}) {
                auto payload = wire::integer(mId) + before + wire::hex(header);
                payload.resize(size, 'n');
                sendTo(before.empty() ? kOpen : kGetImage, payload);
            }
    expectAlive();
}

TEST_F(DiscovererHostile, ItemsOfTheWrongKindHarmNobody) {
    const std::vector<Bytes> items{wire::hex("C0"),
                                   wire::hex("C2"),
                                   wire::hex("CA 7F C0 00 00"),
                                   wire::hex("CB 7F F0 00 00 00 00 00 00"),
                                   wire::hex("91"),
                                   wire::hex("81"),
                                   wire::hex("C1"),
                                   wire::hex("DC FF FF"),
                                   wire::hex("DF FF FF FF FF"),
                                   wire::text("text"),
                                   wire::hex("A0"),
                                   wire::hex("FF")};
    for (long method = kInitialize; method < kRegister; ++method)
        for (const auto& first : items)
            for (const auto& second : items)
                sendTo(method, first + second + second + first);
    expectAlive();
}

TEST_F(DiscovererHostile, PicturesOfEveryExtremeHarmNobody) {
    const std::vector<Bytes> extremes{wire::int64(INT64_MIN), wire::int64(INT64_MAX),
                                      wire::uint64(UINT64_MAX), wire::integer(-1),
                                      wire::integer(0)};
    for (const auto& width : extremes)
        for (const auto& height : extremes)
            for (const auto& position : extremes)
                sendTo(kGetImage, wire::integer(mId) + width + height + position +
                                      wire::text("/nowhere/picture") + wire::text(""));
    expectAlive();
}

TEST_F(DiscovererHostile, RegistrationsThatSayTheyComeFromInsideHarmNobody) {
    for (std::size_t length = 1; length < 40; ++length)
        for (const char fill : {'\0', '\1', '\x41', '\xFF'})
            sendTo(kRegister, Bytes(length, fill), false);
    expectAlive();
}

TEST_F(DiscovererHostile, RandomPacketsHarmNobody) {
    std::mt19937 random(51);
    const auto below = [&](std::size_t end) { return random() % end; };
    for (int i = 0; i < 2000; ++i) {
        const auto method = static_cast<long>(below(10));
        Bytes payload = below(2) == 0 ? wire::integer(mId) : Bytes();
        for (auto count = below(200); count > 0; --count)
            payload += static_cast<char>(random());
        sendTo(method, payload, below(16) != 0);
    }
    expectAlive();
}

} // namespace
