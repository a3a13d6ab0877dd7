// SPDX-License-Identifier: MIT
#include "bench/rpc/RpcClient.h"

#include <boost/interprocess/sync/interprocess_semaphore.hpp>
#include <chrono>
#include <thread>

namespace bench {

RpcClient::RpcClient(uint16_t servicePort, uint16_t ownPort)
    : mListener(listenOn(ownPort)), mRequests(connectTo(servicePort)) {}

bool RpcClient::awaitConnectionBack(const Packet* first) {
    if (!mListener || !mRequests)
        return false;
    if (first != nullptr && !send(*first))
        return false;
    mReplies = acceptOne(mListener.get());
    return static_cast<bool>(mReplies);
}

bool RpcClient::send(const Packet& request) {
    return writePacket(mRequests.get(), request);
}

bool RpcClient::receive(Packet& reply) {
    return readPacket(mReplies.get(), reply);
}

double RpcClient::pipeline(const Packet& request, int count, int inFlight) {
    boost::interprocess::interprocess_semaphore mayGo(static_cast<unsigned>(inFlight));
    const auto start = std::chrono::steady_clock::now();
    std::thread reader([&] {
        Packet reply;
        for (int i = 0; i < count; ++i) {
            receive(reply);
            mayGo.post();
        }
    });
    for (int i = 0; i < count; ++i) {
        mayGo.wait();
        send(request);
    }
    reader.join();
    const std::chrono::duration<double> elapsed = std::chrono::steady_clock::now() - start;
    return count / elapsed.count();
}

} // namespace bench
