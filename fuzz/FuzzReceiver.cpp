// SPDX-License-Identifier: MIT
// Writes anything, cut anywhere, to the running server with the services behind it. Needs the
// daemon's port for itself.
#include <array>
#include <cstring>
#include <filesystem>
#include <iterator>
#include <memory>
#include <mutex>
#include <string>
#include <sys/socket.h>
#include <utility>

#include "base/UniqueFd.h"
#include "define/ObjectIds.h"
#include "fuzz/support/Engine.h"
#include "fuzz/support/Input.h"
#include "fuzz/support/Ledger.h"
#include "fuzz/support/Require.h"
#include "fuzz/support/Services.h"
#include "ptc/Event.h"
#include "ptc/EventPacket.h"
#include "ptc/IReceiver.h"
#include "ptc/LoopbackSocket.h"
#include "ptc/SocketRemoteReceiver.h"

using namespace MediaServiceDefine;

namespace {

using fuzz::require;

/** What has been written, and how much of it must have arrived as events. Any thread. */
class Stream {
public:
    void add(const std::string& bytes) {
        const std::lock_guard lock(mMutex);
        mBytes += bytes;
    }

    [[nodiscard]] std::size_t size() const {
        const std::lock_guard lock(mMutex);
        return mBytes.size();
    }

    /** Requires that the event is the next that the bytes hold. */
    void requireNext(const PTC::Event& event) {
        const std::lock_guard lock(mMutex);
        while (!isDeliverable(header()))
            skipPacket();
        const PTC::EventPacket expected = header();
        require(event.objectId == expected.objectId && event.methodId == expected.methodId);
        require(event.isCallback == (expected.isCallback != 0));
        require(event.isRemote == (expected.isRemote != 0) && event.size == expected.size);
        const char* const payload = mBytes.data() + mNext + PTC::kPacketHeaderSize;
        require(std::memcmp(event.data, payload, static_cast<std::size_t>(event.size)) == 0);
        skipPacket();
    }

    /** Requires that no whole packet is left that a receiver must have got. */
    void requireNothingLeft() {
        const std::lock_guard lock(mMutex);
        for (; mNext + PTC::kPacketSize <= mBytes.size(); skipPacket())
            require(!isDeliverable(header()));
    }

private:
    [[nodiscard]] PTC::EventPacket header() const {
        require(mNext + PTC::kPacketSize <= mBytes.size());
        PTC::EventPacket read{};
        std::memcpy(&read, mBytes.data() + mNext, sizeof(read));
        return read;
    }

    static bool isDeliverable(const PTC::EventPacket& packet) {
        return packet.receiverId == kThreadedReceiverId && packet.size > 0 &&
               packet.size <= PTC::kMaxPayloadSize;
    }

    void skipPacket() { mNext += PTC::kPacketSize; }

    mutable std::mutex mMutex; ///< guards all below
    std::string mBytes;
    std::size_t mNext = 0;
};

/** Checks what arrives, and hands it on to the services. Called by the reader of a connection. */
class Recorder : public PTC::IReceiver {
public:
    Recorder(Stream& stream, fuzz::Ledger& ledger, fuzz::Services& services)
        : mStream(stream), mLedger(ledger), mServices(services) {}

    long getId() override { return kThreadedReceiverId; }
    void recv(PTC::Event* event) override {
        mStream.requireNext(*event);
        if (!event->isCallback)
            mLedger.requested(event->objectId, event->methodId);
        mServices.receive(event);
    }
    void addAdapter(PTC::IAdapterBase*) override {}
    void addCBAdapter(PTC::IAdapterBase*) override {}
    void removeCBAdapter(long) override {}

private:
    Stream& mStream;
    fuzz::Ledger& mLedger;
    fuzz::Services& mServices;
};

/** A client's end of a connection, which waits for an acknowledgement of each write. */
class Client {
public:
    explicit Client(Stream& stream)
        : mStream(stream), mSocket(::socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC, 0)) {
        const auto address = PTC::loopbackAddress(kServiceIdentity);
        require(::connect(mSocket.get(), reinterpret_cast<const sockaddr*>(&address),
                          sizeof(address)) == 0);
        PTC::disableDelay(mSocket.get());
    }

    void write(const std::string& bytes) {
        if (bytes.empty())
            return;
        mStream.add(bytes);
        const auto length = static_cast<ssize_t>(bytes.size());
        require(::send(mSocket.get(), bytes.data(), bytes.size(), MSG_NOSIGNAL) == length);
        read();
    }

    /** Everything up to the connection's end. */
    void readToEnd() {
        while (read() > 0)
            continue;
        require(mRead % sizeof(PTC::kAcknowledgement) == 0);
    }

    void reset() {
        const linger atOnce{1, 0};
        ::setsockopt(mSocket.get(), SOL_SOCKET, SO_LINGER, &atOnce, sizeof(atOnce));
        mSocket.reset();
    }

    void close() { mSocket.reset(); }

private:
    ssize_t read() {
        std::array<char, 4096> buffer;
        const ssize_t count = ::recv(mSocket.get(), buffer.data(), buffer.size(), 0);
        for (ssize_t index = 0; index < count; ++index)
            require(buffer[static_cast<std::size_t>(index)] ==
                    PTC::kAcknowledgement[mRead++ % sizeof(PTC::kAcknowledgement)]);
        return count;
    }

    Stream& mStream;
    qns::UniqueFd mSocket;
    std::size_t mRead = 0;
};

std::string packet(const PTC::EventPacket& header, const std::string& payload) {
    std::string bytes(PTC::kPacketSize, '\0');
    std::memcpy(bytes.data(), &header, sizeof(header));
    payload.copy(bytes.data() + sizeof(header), bytes.size() - sizeof(header));
    return bytes;
}

/** How the client leaves. */
enum Ending : uint8_t { kAnswered, kClosed, kReset, kStaying, kEndingCount };

/** The daemon as one client of it lives through it. */
class Run {
public:
    Run(const uint8_t* data, std::size_t size) : mInput(data, size) {}

    void run() {
        const int ending = mInput.byte() % kEndingCount;
        startServer();
        Client client(mStream);
        for (int steps = 0; steps < kMostSteps && !mInput.isEmpty(); ++steps)
            step(client);
        end(client, ending);
        mpServer.reset();
        if (ending == kAnswered)
            client.readToEnd();
    }

private:
    static constexpr int kMostSteps = 12;

    void startServer() {
        fuzz::engine() = {};
        mpServices = std::make_unique<fuzz::Services>(mLedger);
        mpServer = std::make_unique<SocketRemoteReceiver>(kSocketReceiverId);
        mpServer->addReceiver(std::make_unique<Recorder>(mStream, mLedger, *mpServices).release());
        require(mpServer->initialize(kServiceIdentity));
    }

    void step(Client& client) {
        switch (mInput.byte() % 4) {
        case 0:
            return client.write(mInput.block());
        case 1:
            return writeRequest(client);
        case 2:
            return writeStray(client);
        default:
            return pad(client);
        }
    }

    void writeRequest(Client& client) {
        constexpr std::array<long, 3> kObjects{kDiscovererAdapterId, kImporterAdapterId,
                                               kPlayerAdapterId};
        PTC::EventPacket header{};
        header.receiverId = kThreadedReceiverId;
        header.objectId = kObjects[mInput.byte() % kObjects.size()];
        header.methodId = mInput.byte();
        header.isRemote = 1;
        const auto cut = mInput.number<uint16_t>();
        const std::string payload = mInput.block();
        header.size = static_cast<long>(payload.size());
        writeCut(client, packet(header, payload), cut);
    }

    void writeStray(Client& client) {
        PTC::EventPacket header{};
        header.receiverId = mInput.number<int8_t>();
        header.objectId = mInput.number<int8_t>();
        header.methodId = mInput.number<long>();
        header.isCallback = mInput.byte();
        header.size = mInput.number<int16_t>();
        header.isRemote = mInput.byte();
        const auto cut = mInput.number<uint16_t>();
        writeCut(client, packet(header, mInput.block()), cut);
    }

    static void writeCut(Client& client, const std::string& bytes, std::size_t cut) {
        cut %= bytes.size();
        client.write(bytes.substr(0, cut));
        client.write(bytes.substr(cut));
    }

    void pad(Client& client) {
        const std::size_t part = mStream.size() % PTC::kPacketSize;
        if (part > 0)
            client.write(std::string(PTC::kPacketSize - part, '\0'));
    }

    void end(Client& client, int ending) {
        if (ending == kAnswered)
            waitForAll(client);
        else if (ending == kClosed)
            client.close();
        else if (ending == kReset)
            client.reset();
        fuzz::Services::runQueued();
    }

    /** The last packet is an event that tells when the worker has done all before it. */
    void waitForAll(Client& client) {
        pad(client);
        PTC::EventPacket header{};
        header.receiverId = kThreadedReceiverId;
        header.objectId = fuzz::Services::kDoneObjectId;
        header.methodId = fuzz::Services::kDoneMethod;
        header.size = 1;
        client.write(packet(header, "."));
        mpServices->waitUntilDone(1);
        mStream.requireNothingLeft();
    }

    fuzz::Input mInput;
    Stream mStream;
    fuzz::Ledger mLedger;
    std::unique_ptr<fuzz::Services> mpServices;
    std::unique_ptr<SocketRemoteReceiver> mpServer; ///< before the services that it hands on to
};

std::ptrdiff_t descriptorCount() {
    using Iterator = std::filesystem::directory_iterator;
    return std::distance(Iterator("/proc/self/fd"), Iterator());
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    // What a library opens once and keeps is there from the second input on.
    static int runs = 0;
    const std::ptrdiff_t before = descriptorCount();
    Run(data, size).run();
    require(++runs == 1 || descriptorCount() == before);
    return 0;
}
