// SPDX-License-Identifier: MIT
#include "bench/rpc/FloorServer.h"

#include <boost/interprocess/sync/interprocess_mutex.hpp>
#include <boost/interprocess/sync/interprocess_semaphore.hpp>
#include <chrono>
#include <cstring>
#include <deque>
#include <memory>
#include <thread>

#include "bench/rpc/PacketSocket.h"

namespace bench {
namespace {

/** What a client and its server have between them. */
struct Conversation {
    qns::UniqueFd requests;
    qns::UniqueFd replies;
};

struct Work {
    int replySocket = -1;
    std::unique_ptr<Packet> packet; ///< none: there is no more work
};

/** The hand-over that a threaded receiver must do for one request, and nothing else. */
class Worker {
public:
    Worker() : mThread([this] { run(); }) {}

    ~Worker() {
        hand({});
        mThread.join();
    }

    void hand(Work work) {
        mMutex.lock();
        mQueue.push_back(std::move(work));
        mSemaphore.post();
        mMutex.unlock();
    }

private:
    Work take() {
        mSemaphore.wait();
        mMutex.lock();
        Work work = std::move(mQueue.front());
        mQueue.pop_front();
        mMutex.unlock();
        return work;
    }

    void run() {
        for (Work work = take(); work.packet; work = take())
            writePacket(work.replySocket, *work.packet);
    }

    boost::interprocess::interprocess_mutex mMutex;
    boost::interprocess::interprocess_semaphore mSemaphore{0};
    std::deque<Work> mQueue;
    std::thread mThread; ///< last: it uses the others
};

std::vector<Conversation> acceptAll(uint16_t servicePort,
                                    const std::vector<uint16_t>& clientPorts) {
    const qns::UniqueFd listener = listenOn(servicePort);
    std::vector<Conversation> conversations;
    for (const uint16_t port : clientPorts) {
        qns::UniqueFd requests = acceptOne(listener.get());
        conversations.push_back({std::move(requests), connectTo(port)});
    }
    return conversations;
}

void answer(const Conversation& client) {
    Packet packet;
    while (readPacket(client.requests.get(), packet))
        writePacket(client.replies.get(), packet);
}

void handOver(const Conversation& client, Worker& worker) {
    for (;;) {
        auto packet = std::make_unique<Packet>();
        if (!readPacket(client.requests.get(), *packet))
            return;
        worker.hand({client.replies.get(), std::move(packet)});
    }
}

/** One reader each, the first on the calling thread. */
template<typename Read>
void readAll(const std::vector<Conversation>& clients, Read read) {
    std::vector<std::thread> readers;
    for (std::size_t i = 1; i < clients.size(); ++i)
        readers.emplace_back([&, i] { read(clients[i]); });
    read(clients.front());
    for (std::thread& reader : readers)
        reader.join();
}

} // namespace

void serveFloor(uint16_t servicePort, const std::vector<uint16_t>& clientPorts, Hop hop) {
    const std::vector<Conversation> clients = acceptAll(servicePort, clientPorts);
    if (hop == Hop::none) {
        readAll(clients, answer);
        return;
    }
    Worker worker;
    readAll(clients, [&worker](const Conversation& client) { handOver(client, worker); });
}

void serveBroadcast(uint16_t servicePort, const std::vector<uint16_t>& clientPorts) {
    const std::vector<Conversation> clients = acceptAll(servicePort, clientPorts);
    Packet packet;
    while (readPacket(clients.front().requests.get(), packet)) {
        const int64_t now =
            std::chrono::nanoseconds(std::chrono::steady_clock::now().time_since_epoch()).count();
        int32_t listeners = 0;
        std::memcpy(&listeners, packet.data(), sizeof listeners);
        std::memcpy(packet.data(), &now, sizeof now);
        for (std::size_t i = 0; i < static_cast<std::size_t>(listeners); ++i)
            writePacket(clients[i % clients.size()].replies.get(), packet);
    }
}

} // namespace bench
