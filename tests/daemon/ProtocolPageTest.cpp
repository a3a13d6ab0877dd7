// SPDX-License-Identifier: MIT
#include <clocale>
#include <cstdlib>
#include <fstream>
#include <map>
#include <sstream>
#include <string>
#include <vector>

#include "tests/daemon/support/DaemonTest.h"

using wire::Bytes;

namespace {

/** A fenced block of the page: the words behind the fence, and its lines. */
struct Block {
    std::string title;
    std::vector<std::string> lines;
};

std::vector<Block> blocksOfPage() {
    std::ifstream page(QNS_SOURCE_DIR "/docs/protocol.md");
    EXPECT_TRUE(page);
    std::vector<Block> blocks;
    bool inside = false;
    for (std::string line; std::getline(page, line);) {
        const bool fence = line.rfind("```", 0) == 0;
        if (fence && !inside)
            blocks.push_back({line.substr(3), {}});
        else if (!fence && inside)
            blocks.back().lines.push_back(line);
        inside = fence != inside;
    }
    return blocks;
}

std::string withoutComment(const std::string& line) {
    return line.substr(0, line.find('#'));
}

Bytes argumentsIn(const Block& block) {
    Bytes bytes;
    for (const auto& line : block.lines)
        bytes += wire::hex(withoutComment(line));
    return bytes;
}

/** Lines are `offset: bytes`; what no line names is zero. */
Bytes packetIn(const Block& block) {
    Bytes packet(wire::kPacketSize, '\0');
    for (const auto& line : block.lines) {
        const auto bytes = wire::hex(withoutComment(line).substr(line.find(':') + 1));
        packet.replace(std::stoul(line, nullptr, 16), bytes.size(), bytes);
    }
    return packet;
}

std::wstring widened(const std::string& text) {
    std::setlocale(LC_CTYPE, "C.UTF-8");
    std::wstring wide(text.size(), L'\0');
    wide.resize(std::mbstowcs(wide.data(), text.c_str(), wide.size()));
    return wide;
}

constexpr std::size_t kAddressOffset = 24;

/** The page's conversation: client 1000 with the callback object 10 and the notify object 11. */
class ProtocolPage : public ScriptedDaemonTest {
protected:
    void play(const Block& block) {
        std::istringstream title(block.title);
        std::string kind;
        title >> kind;
        if (block.title == "packet to-daemon")
            mClient.sendBytes(packetIn(block));
        else if (block.title == "packet to-client")
            expectPacket(packetIn(block));
        else if (kind == "request")
            sendRequest(numberIn(title), argumentsIn(block));
        else if (kind == "callback")
            expectArguments(10, numberIn(title), argumentsIn(block));
        else if (kind == "notification")
            expectNotification(argumentsIn(block));
        else
            ADD_FAILURE() << "An unknown kind of block";
    }

    void registerClient() {
        mClient.connect();
        sendRequest(request::kRegisterCallBack, wire::integer(10) + wire::integer(1000));
        ASSERT_TRUE(mClient.receive());
        sendRequest(request::kRegisterNotify,
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
        mEngine.notify(event);
        const auto packet = mClient.receive();
        return packet ? itemOf(kind, packet->payload) : Bytes();
    }

    PlayerClient mClient{1000};

private:
    static long numberIn(std::istream& title) {
        long number = 0;
        title >> number;
        return number;
    }

    void sendRequest(long method, const Bytes& arguments) {
        mClient.request(method, arguments);
        const std::map<long, std::pair<const char*, const char*>> calls{
            {request::kOpenPlayer, {"player open \"/media/film.mp4\" 2", "return 0"}},
            {request::kPlay, {"player play", "return 0"}},
            {request::kSeek, {"player seek 1500000000 0", "return 0"}},
            {request::kSetRepeat, {"player repeat true 1000000000 2000000000", "return 0"}},
            {request::kPause, {"player pause", "return 0"}},
            {request::kClosePlayer, {"player close", "return 0"}},
            {request::kGetPlayerStatus, {"player status", "return 3 1500000000 10000000000"}}};
        const auto call = calls.find(method);
        if (call == calls.end() || (method == request::kGetPlayerStatus && !mOpen))
            return;
        mOpen = method != request::kClosePlayer;
        mEngine.expectCall(call->second.first, call->second.second);
    }

    void expectPacket(const Bytes& expected) {
        auto packet = mClient.receiveBytes();
        ASSERT_EQ(packet.size(), expected.size());
        packet.replace(kAddressOffset, 8, 8, '\0');
        EXPECT_TRUE(packet == expected) << wire::toHex(packet.substr(0, 80));
    }

    void expectArguments(std::int64_t object, long method, const Bytes& arguments) {
        EXPECT_EQ(mClient.receive(), (wire::Packet{1, object, method, true, true, arguments}));
    }

    void expectNotification(const Bytes& arguments) {
        mEngine.notify({1, 0, L"/media/film.mp4", 1, 2, 0, 1, 0, 10'000'000'000});
        expectArguments(11, 1, arguments);
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

    bool mOpen = false;
};

TEST_F(ProtocolPage, ShowsAConversationAsItIs) {
    mClient.connect();
    std::map<std::string, int> kinds;
    for (const auto& block : blocksOfPage()) {
        if (block.title == "items")
            continue;
        SCOPED_TRACE(block.title);
        ASSERT_NO_FATAL_FAILURE(play(block));
        ++kinds[block.title.substr(0, block.title.find(' '))];
    }
    EXPECT_EQ(kinds["packet"], 2);
    EXPECT_EQ(kinds["request"], 9);
    EXPECT_EQ(kinds["callback"], 8);
    EXPECT_EQ(kinds["notification"], 1);
    mClient.expectNothingElse();
}

TEST_F(ProtocolPage, ShowsItemsAsTheDaemonWritesThem) {
    registerClient();
    int count = 0;
    for (const auto& block : blocksOfPage()) {
        if (block.title != "items")
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
