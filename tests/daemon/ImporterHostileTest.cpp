// SPDX-License-Identifier: MIT
#include <random>
#include <string>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/ImporterClient.h"

using namespace importer;
using wire::Bytes;
using wire::Packet;

namespace {

/** Arguments that no client would send, to a daemon whose engine says yes to everything. */
class ImporterHostile : public DaemonTest {
protected:
    void SetUp() override {
        DaemonTest::SetUp();
        if (!HasFatalFailure())
            mId = mClient.registerCallBack(kObject);
    }

    void sendTo(long method, const Bytes& payload, bool remote = true) {
        mClient.send({8, 56, method, false, remote, payload});
    }

    /** The daemon still serves this client, whatever else it has sent it, also in its main thread.
     */
    void expectAlive() {
        const auto witness = registerWitness();
        mClient.request(kGetStatus, witness);
        EXPECT_TRUE(receiveFor(kWitness, kStatusCallBack)) << mpDaemon->output().joined();
        mClient.request(kUnregister, witness);
    }

    std::int32_t registerWitness() {
        mClient.sendRegistration(kWitness, mClient.identity());
        const auto answer = receiveFor(kWitness, 1);
        return answer ? wire::readInt32(answer->payload) : -1;
    }

    /** The next packet to this object and method; those before it are dropped. */
    std::optional<Packet> receiveFor(long object, long method) {
        auto packet = mClient.receive();
        while (packet && (packet->object != object || packet->method != method))
            packet = mClient.receive();
        return packet;
    }

    static constexpr long kObject = 100;
    static constexpr long kWitness = 123456;
    ImporterClient mClient{1000};
    std::int32_t mId = -1;
};

struct Example {
    long method;
    Bytes arguments;
};

/** Every request in full, in the widest forms. */
std::vector<Example> examples(std::int32_t id) {
    const auto known = wire::int64(id);
    const auto unknown = wire::int64(1000);
    return {{kInitialize, known},
            {kImport, known + wire::text(std::string(40, 'n')) + wire::text(std::string(40, 'f'))},
            {kCancel, known},
            {kGetStatus, known},
            {kUnregister, unknown},
            {kUnregisterNotify, unknown},
            {kRegister, wire::int64(4) + wire::int64(1000)},
            {kRegisterNotify, wire::int64(4) + wire::int64(1000) + wire::int64(id)}};
}

TEST_F(ImporterHostile, RequestsThatAreCutOffAnywhereHarmNobody) {
    for (const auto& [method, arguments] : examples(mId))
        for (std::size_t length = 0; length < arguments.size(); ++length)
            sendTo(method, arguments.substr(0, length));
    expectAlive();
}

TEST_F(ImporterHostile, TextsThatAreCutOffByTheEndOfThePacketHarmNobody) {
    for (const char* header : {"DA FF FF", "DB FF FF FF FF", "DB 7F FF FF FF", "BF", "DA 50 00"})
        for (const auto& before : {Bytes(), wire::text("/a")})
            for (const std::size_t size : {wire::kMaxPayload, std::size_t{12}}) {
                auto payload = wire::integer(mId) + before + wire::hex(header);
                payload.resize(size, 'n');
                sendTo(kImport, payload);
            }
    expectAlive();
}

TEST_F(ImporterHostile, TextsOfEveryLengthThatFitsHarmNobody) {
    const std::size_t most = wire::kMaxPayload - wire::integer(mId).size() - 2 * 4;
    for (const std::size_t length : {std::size_t{31}, std::size_t{32}, most / 2, most}) {
        mClient.import(mId, std::string(length, 'n'), std::string(most - length, 'f'));
        EXPECT_TRUE(receiveFor(kObject, kImportCallBack));
    }
    expectAlive();
}

TEST_F(ImporterHostile, ItemsOfTheWrongKindHarmNobody) {
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
    for (long method = kInitialize; method <= kRegisterNotify; ++method)
        for (const auto& first : items)
            for (const auto& second : items)
                if (method != kRegister)
                    sendTo(method, first + second + second + first);
    expectAlive();
}

TEST_F(ImporterHostile, TextsThatAreNumbersAreNoTexts) {
    for (const char* text : {"01", "CF FF FF FF FF FF FF FF FF", "D3 80 00 00 00 00 00 00 00", "C0",
                             "C3", "CB 40 00 00 00 00 00 00 00", "91", "C1"})
        for (const auto& before : {Bytes(), wire::text("/a")}) {
            sendTo(kImport, wire::integer(mId) + before + wire::hex(text));
            EXPECT_TRUE(receiveFor(kObject, kImportCallBack)) << text;
        }
    expectAlive();
}

TEST_F(ImporterHostile, TextsThatDoNotConvertHarmNobody) {
    for (const char* text : {"\xFF\xFE", "\xC3", "/a\xED\xA0\x80", "\xF8\x88\x80\x80\x80"}) {
        mClient.import(mId, text, text);
        EXPECT_TRUE(receiveFor(kObject, kImportCallBack));
    }
    expectAlive();
}

TEST_F(ImporterHostile, TextsMayEndBeforeTheirRawDoes) {
    mClient.request(kImport, wire::integer(mId) + wire::raw(std::string("/a\0b\0", 5)) +
                                 wire::raw(std::string("\0\0", 2)));
    EXPECT_TRUE(receiveFor(kObject, kImportCallBack));
    expectAlive();
}

TEST_F(ImporterHostile, RegistrationsThatSayTheyComeFromInsideHarmNobody) {
    for (const long method : {kRegister, kRegisterNotify})
        for (std::size_t length = 1; length < 40; ++length)
            for (const char fill : {'\0', '\1', '\x41', '\xFF'})
                sendTo(method, Bytes(length, fill), false);
    mClient.expectNothingElse();
}

TEST_F(ImporterHostile, ObjectsRegisteredByTheThousandHarmNobody) {
    for (std::int32_t i = 0; i < 1000; ++i)
        mClient.registerNotify(i, i);
    expectAlive();
}

TEST_F(ImporterHostile, ImportsAndCancelsByTheThousandAreAllAnswered) {
    constexpr int kCount = 1000;
    for (int i = 0; i < kCount; ++i) {
        mClient.import(mId, "/" + std::to_string(i));
        mClient.request(kCancel, mId);
    }
    for (int i = 0; i < kCount; ++i) {
        ASSERT_TRUE(receiveFor(kObject, kImportCallBack));
        ASSERT_TRUE(receiveFor(kObject, kCancelCallBack));
    }
    expectAlive();
}

TEST_F(ImporterHostile, RandomPacketsHarmNobody) {
    std::mt19937 random(56);
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
