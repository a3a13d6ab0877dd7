// SPDX-License-Identifier: MIT
#include "bench/rpc/FloorServer.h"

#include <boost/interprocess/sync/interprocess_mutex.hpp>
#include <boost/interprocess/sync/interprocess_semaphore.hpp>
#include <deque>
#include <memory>
#include <thread>

#include "bench/rpc/PacketSocket.h"

namespace bench {
namespace {

/** The hand-over that a threaded receiver must do for one request, and nothing else. */
class Worker {
public:
    explicit Worker(int replySocket) : mThread([this, replySocket] { run(replySocket); }) {}

    ~Worker() {
        hand(nullptr);
        mThread.join();
    }

    void hand(std::unique_ptr<Packet> packet) {
        mMutex.lock();
        mQueue.push_back(std::move(packet));
        mSemaphore.post();
        mMutex.unlock();
    }

private:
    std::unique_ptr<Packet> take() {
        mSemaphore.wait();
        mMutex.lock();
        std::unique_ptr<Packet> packet = std::move(mQueue.front());
        mQueue.pop_front();
        mMutex.unlock();
        return packet;
    }

    void run(int replySocket) {
        while (const std::unique_ptr<Packet> packet = take())
            writePacket(replySocket, *packet);
    }

    boost::interprocess::interprocess_mutex mMutex;
    boost::interprocess::interprocess_semaphore mSemaphore{0};
    std::deque<std::unique_ptr<Packet>> mQueue;
    std::thread mThread;
};

} // namespace

void serveFloor(uint16_t servicePort, uint16_t clientPort, Hop hop) {
    const qns::UniqueFd listener = listenOn(servicePort);
    const qns::UniqueFd requests = acceptOne(listener.get());
    const qns::UniqueFd replies = connectTo(clientPort);

    if (hop == Hop::none) {
        Packet packet;
        while (readPacket(requests.get(), packet))
            writePacket(replies.get(), packet);
        return;
    }

    Worker worker(replies.get());
    for (;;) {
        auto packet = std::make_unique<Packet>();
        if (!readPacket(requests.get(), *packet))
            return;
        worker.hand(std::move(packet));
    }
}

} // namespace bench
