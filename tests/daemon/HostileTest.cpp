// SPDX-License-Identifier: MIT
#include <random>
#include <string>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"

using wire::Packet;

namespace {

/** Bytes from outside that are no requests: nothing may come of them. */
class Hostile : public DaemonTest {
protected:
    void SetUp() override {
        DaemonTest::SetUp();
        if (!HasFatalFailure())
            mClient.registerCallBack();
    }

    void sendTo(long method, const wire::Bytes& payload, bool remote = true) {
        mClient.send({8, 62, method, false, remote, payload});
    }

    /** The daemon still serves this client, whatever else it may have sent it. */
    void expectAlive() {
        mClient.request(request::kRegisterCallBack,
                        wire::integer(kMarker) + wire::integer(mClient.identity()));
        for (;;) {
            const auto packet = mClient.receive();
            ASSERT_TRUE(packet) << mpDaemon->output().joined();
            if (packet->object == kMarker)
                return;
        }
    }

    static constexpr long kMarker = 123456;
    PlayerClient mClient{1000};
};

struct Example {
    long method;
    wire::Bytes arguments;
};

/** Every request in full, of a client that is unknown where the request would be felt. */
std::vector<Example> examples(std::int32_t id) {
    const auto known = wire::int64(id);
    const auto unknown = wire::int64(1000);
    return {{request::kInitializePlayer, unknown},
            {request::kOpenPlayer, known + wire::text(std::string(40, 'n'))},
            {request::kClosePlayer, known},
            {request::kPlay, known},
            {request::kPause, known},
            {request::kSeek, known + wire::int32(1) + wire::int64(5) + wire::boolean(true)},
            {request::kGetPlayerStatus, known},
            {request::kSetRepeat, known + wire::boolean(true) + wire::int64(1) + wire::uint64(2)},
            {request::kPowerOffMediaPlayer, unknown},
            {request::kUnregisterCallBack, unknown},
            {request::kUnregisterNotify, unknown},
            {request::kSetSystemFormat, wire::int64(1)},
            {request::kRegisterCallBack, wire::int64(4) + wire::int64(1000)},
            {request::kRegisterNotify, wire::int64(4) + wire::int64(1000) + wire::int64(id)}};
}

TEST_F(Hostile, RequestsThatAreCutOffAnywhereHarmNobody) {
    for (const auto& [method, arguments] : examples(mClient.id()))
        for (std::size_t length = 1; length < arguments.size(); ++length)
            sendTo(method, arguments.substr(0, length));
    expectAlive();
}

TEST_F(Hostile, RequestsThatAreCutOffByTheEndOfThePacketHarmNobody) {
    // A name whose length goes on behind the last byte that a packet can hold.
    for (const char* header : {"DA FF FF", "DB FF FF FF FF", "DB 7F FF FF FF", "BF", "DA 50 00"})
        for (const std::size_t size : {wire::kMaxPayload, std::size_t{9}}) {
            auto payload = wire::integer(mClient.id()) + wire::hex(header);
            payload.resize(size, 'n');
            sendTo(request::kOpenPlayer, payload);
        }
    expectAlive();
}

TEST_F(Hostile, ItemsOfTheWrongKindHarmNobody) {
    const std::vector<wire::Bytes> items{wire::hex("C0"),
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
    for (long method = 2; method <= 14; ++method) {
        if (method == request::kPowerOffMediaPlayer || method == request::kRegisterCallBack)
            continue;
        for (const auto& first : items)
            for (const auto& second : items)
                sendTo(method, first + second + second + first);
    }
    expectAlive();
}

TEST_F(Hostile, ANameThatIsANumberIsNoName) {
    for (const char* second : {"01", "CF FF FF FF FF FF FF FF FF", "D3 80 00 00 00 00 00 00 00",
                               "C0", "C3", "CB 40 00 00 00 00 00 00 00", "91"})
        sendTo(request::kOpenPlayer, wire::integer(mClient.id()) + wire::hex(second));
    expectAlive();
}

TEST_F(Hostile, NamesThatDoNotConvertHarmNobody) {
    for (const char* name : {"\xFF\xFE", "\xC3", "/a\xED\xA0\x80", "\xF8\x88\x80\x80\x80"})
        mClient.open(name);
    expectAlive();
}

TEST_F(Hostile, NamesWithConversionsOfPrintfArePrintedAsTheyStand) {
    mClient.open("/%s%n%d%p%99999d");
    mClient.expectReply(callback::kOpenPlayer, 0);
    EXPECT_TRUE(mSyslog.waitForLine("MediaPlayerController::open /%s%n%d%p%99999d"));
}

TEST_F(Hostile, RegistrationsThatSayTheyComeFromInsideHarmNobody) {
    for (const long method : {request::kRegisterCallBack, request::kRegisterNotify})
        for (std::size_t length = 1; length < 40; ++length)
            for (const char fill : {'\0', '\1', '\x41', '\xFF'})
                sendTo(method, wire::Bytes(length, fill), false);
    mClient.expectNothingElse();
}

TEST_F(Hostile, ObjectsRegisteredByTheThousandHarmNobody) {
    for (int i = 0; i < 1000; ++i)
        sendTo(request::kRegisterNotify, wire::integer(i) + wire::integer(1000) + wire::integer(i));
    expectAlive();
}

TEST_F(Hostile, RandomPacketsHarmNobody) {
    std::mt19937 random(20480);
    const auto below = [&](std::size_t end) { return random() % end; };
    const auto number = [&] {
        const auto wide = static_cast<std::int64_t>(random()) << 32 | random();
        return below(2) == 0 ? static_cast<std::int64_t>(below(70)) : wide;
    };
    for (int i = 0; i < 1500; ++i) {
        Packet packet;
        packet.receiver = below(8) == 0 ? number() : 8;
        packet.object = below(8) == 0 ? number() : 62;
        packet.method = below(8) == 0 ? number() : static_cast<std::int64_t>(below(16));
        if (packet.method == request::kPowerOffMediaPlayer ||
            packet.method == request::kInitializePlayer)
            continue;
        packet.callback = below(16) == 0;
        packet.remote = below(16) != 0;
        packet.payload.resize(below(200));
        for (auto& byte : packet.payload)
            byte = static_cast<char>(random());
        const auto size =
            below(4) == 0 ? number() : static_cast<std::int64_t>(packet.payload.size());
        mClient.sendBytes(wire::toBytes(packet, size));
    }
    expectAlive();
}

TEST_F(Hostile, RandomBytesHarmNobody) {
    std::mt19937 random(1008);
    wire::Bytes noise(wire::kPacketSize * 50, '\0');
    for (auto& byte : noise)
        byte = static_cast<char>(random());
    WireClient other(1001);
    other.connect();
    other.sendBytes(noise);
    expectAlive();
}

} // namespace
