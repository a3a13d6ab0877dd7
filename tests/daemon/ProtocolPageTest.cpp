// SPDX-License-Identifier: MIT
#include <clocale>
#include <cstdlib>
#include <map>
#include <set>
#include <string>
#include <utility>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/PageEngine.h"
#include "tests/daemon/support/ProtocolPage.h"

using wire::Bytes;

namespace {

std::wstring widened(const std::string& text) {
    std::setlocale(LC_CTYPE, "C.UTF-8");
    std::wstring wide(text.size(), L'\0');
    wide.resize(std::mbstowcs(wide.data(), text.c_str(), wide.size()));
    return wide;
}

/** The numbers that the page's client gives its objects, and where the service is. */
struct Service {
    long object;
    std::int64_t callbackObject;
    std::int64_t notifyObject;
    std::set<long> requests;
};

const std::map<std::string, Service> kServices{
    {"player", {62, 10, 11, {1, 2, 3, 4, 5, 6, 7, 8, 9, 11, 12, 14}}},
    {"discoverer", {51, 20, 0, {1, 2, 3, 4, 5, 6, 7, 8}}},
    {"importer", {56, 30, 31, {1, 2, 3, 4, 5, 6, 7, 8}}},
};

constexpr std::size_t kAddressOffset = 24;

/** The page's client, and a daemon whose whole engine does what the page tells. */
class ProtocolPage : public DaemonTest {
protected:
    void SetUp() override {
        auto options = withEngineDouble();
        mEngine.addTo(options);
        start(options);
        mEngine.expectCreation();
        ASSERT_TRUE(mpDaemon->waitUntilServing()) << mpDaemon->output().joined();
        mClient.connect();
    }

    void play(const PageBlock& block) {
        if (block.title == "packet to-daemon")
            mClient.sendBytes(block.packet());
        else if (block.kind == "packet")
            expectPacket(block);
        else if (block.kind == "request")
            sendRequest(block);
        else if (block.kind == "callback")
            expectArguments(block, kServices.at(block.service).callbackObject, block.method);
        else if (block.kind == "notification")
            expectNotification(block);
        else if (block.kind == "acknowledgement")
            EXPECT_EQ(block.bytes(), wire::kAcknowledgement);
        else
            ADD_FAILURE() << "An unknown kind of block";
    }

    void registerClient() {
        mClient.request(request::kRegisterCallBack, wire::integer(10) + wire::integer(1000));
        ASSERT_TRUE(mClient.receive());
        mClient.request(request::kRegisterNotify,
                        wire::integer(11) + wire::integer(1000) + wire::integer(1));
        mClient.expectNothingElse();
    }

    /** What the daemon writes for an item such as `int 128`, found in a notification. */
    Bytes writtenBy(const std::string& item) {
        LibMediaPlayer::MediaPlayerNotify event;
        const auto space = item.find(' ');
        const auto kind = item.substr(0, space);
        const auto value = item.substr(space + 1);
        const auto number = kind == "text" ? 0 : std::stol(value);
        if (kind == "text")
            event.text = widened(value.substr(1, value.rfind('"') - 1));
        else if (kind == "int")
            event.param1 = static_cast<int>(number);
        else if (kind == "int32")
            event.result = static_cast<int>(number);
        else if (kind == "uint64")
            event.uvalue1 = static_cast<unsigned long>(number);
        else
            event.value = number;
        mEngine.player().notify(event);
        const auto packet = mClient.receive();
        return packet ? itemOf(kind, packet->payload) : Bytes();
    }

    PlayerClient mClient{1000};

private:
    void sendRequest(const PageBlock& block) {
        mClient.send(
            {8, kServices.at(block.service).object, block.method, false, true, block.bytes()});
        mEngine.carryOut(block);
    }

    void expectPacket(const PageBlock& block) {
        if (block.title == "packet notification")
            mEngine.notify(block);
        auto packet = mClient.receiveBytes();
        const auto expected = block.packet();
        ASSERT_EQ(packet.size(), expected.size());
        packet.replace(kAddressOffset, 8, 8, '\0');
        EXPECT_TRUE(packet == expected) << wire::toHex(packet.substr(0, 100));
    }

    void expectArguments(const PageBlock& block, std::int64_t object, long method) {
        EXPECT_EQ(mClient.receive(), (wire::Packet{1, object, method, true, true, block.bytes()}));
    }

    void expectNotification(const PageBlock& block) {
        mEngine.notify(block);
        expectArguments(block, kServices.at(block.service).notifyObject, 1);
    }

    /** All fields but the one of interest are zero, so that they have known lengths. */
    static Bytes itemOf(const std::string& kind, const Bytes& payload) {
        const std::map<std::string, std::pair<std::size_t, std::size_t>> around{
            {"int32", {1, 32}},
            {"text", {6, 30}},
            {"int", {8, 29}},
            {"uint64", {11, 18}},
            {"int64", {29, 0}}};
        const auto [before, after] = around.at(kind);
        return payload.substr(before, payload.size() - before - after);
    }

    PageEngine mEngine;
};

TEST_F(ProtocolPage, ShowsAConversationAsItIs) {
    std::map<std::string, int> kinds;
    for (const auto& block : blocksOfPage()) {
        if (block.kind == "items")
            continue;
        SCOPED_TRACE(block.title);
        ASSERT_NO_FATAL_FAILURE(play(block));
        ++kinds[block.kind];
    }
    EXPECT_EQ(kinds["packet"], 3);
    EXPECT_EQ(kinds["callback"], 22);
    EXPECT_EQ(kinds["notification"], 2);
    EXPECT_EQ(kinds["acknowledgement"], 1);
}

TEST(ProtocolPageText, ShowsEveryRequestOfEveryService) {
    std::map<std::string, std::set<long>> requests;
    for (const auto& block : blocksOfPage()) {
        if (block.kind == "request")
            requests[block.service].insert(block.method);
    }
    for (const auto& [name, service] : kServices)
        EXPECT_EQ(requests[name], service.requests) << name;
}

TEST_F(ProtocolPage, ShowsItemsAsTheDaemonWritesThem) {
    registerClient();
    int count = 0;
    for (const auto& block : blocksOfPage()) {
        if (block.kind != "items")
            continue;
        for (const auto& line : block.lines) {
            const auto colon = line.rfind(':');
            EXPECT_EQ(wire::toHex(writtenBy(line.substr(0, colon))),
                      wire::toHex(wire::hex(line.substr(colon + 1))))
                << line;
            ++count;
        }
    }
    EXPECT_EQ(count, 18);
}

} // namespace
