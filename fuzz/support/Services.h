// SPDX-License-Identifier: MIT
#pragma once

#include <condition_variable>
#include <cstddef>
#include <memory>
#include <mutex>
#include <vector>

#include "fuzz/support/Ledger.h"
#include "ptc/IFactory.h"

class LTReceiver;

namespace PTC {
class IProxyHolder;
}

namespace fuzz {

/**
 * All three services as the daemon wires them, between a worker thread of their own and clients
 * that a ledger stands for. Made, used and destroyed by one thread, which is the services' main
 * thread.
 */
class Services : private PTC::IProxyFactory {
public:
    /** An object of the worker's; a call of its method tells that all before it is done. */
    static constexpr long kDoneObjectId = 1L << 40;
    static constexpr long kDoneMethod = 1L << 41;

    explicit Services(Ledger& ledger);
    ~Services() override;
    Services(const Services&) = delete;
    Services& operator=(const Services&) = delete;

    /** Hands an event over to the worker, as the transport does. Any thread. */
    void receive(PTC::Event* event);

    /** Waits until kDoneMethod has been called so often in all. */
    void waitUntilDone(int times);

    /** Does what the worker has left to the main thread. */
    static void runQueued();

    /** What happens to a client's object when the client has ended. The worker must be idle. */
    void endProxy(std::size_t index);

private:
    class DoneAdapter;

    PTC::IProxyBase* createProxy(long interfaceId, long proxyId, long clientIdentity) override;

    template<class Adapter, class Interface, class Service>
    void add(long adapterId, std::unique_ptr<Service> service);
    void done();

    Ledger& mLedger;
    std::vector<std::unique_ptr<PTC::IProxyBase>> mProxies;
    std::vector<PTC::IProxyHolder*> mHolders; ///< owned by the receiver
    std::unique_ptr<LTReceiver> mpReceiver;

    std::mutex mMutex; ///< guards mDone
    std::condition_variable mChanged;
    int mDone = 0;
};

} // namespace fuzz
