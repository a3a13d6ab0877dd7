// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstddef>
#include <map>
#include <mutex>
#include <utility>

#include "ptc/ISender.h"

namespace fuzz {

/**
 * Stands between the services and their clients, and checks what is sent: no request is answered
 * twice, nothing is told that has not happened, and every packet can be decoded to its end. Any
 * thread may use it.
 */
class Ledger {
public:
    Ledger();

    /** A request is on its way to a service. */
    void requested(long object, long method);

    /** A client has got an object at which it can be called. */
    void connected(long interfaceId);

    /** The engine has told something. */
    void happened(long interfaceId);

    /** What proxies of the interface send through. Not owned by the caller. */
    PTC::ISender* senderOf(long interfaceId);

private:
    class Sender : public PTC::ISender {
    public:
        long getId() override { return 1; }
        void send(PTC::Event* event) override;

        Ledger* pLedger = nullptr;
        long interfaceId = 0;
    };

    void sent(long interfaceId, const PTC::Event& event);
    void countAnswer(long interfaceId, long method);
    void countNotification(long interfaceId);

    std::mutex mMutex;                                 ///< guards all below
    std::map<std::pair<long, long>, int> mAnswersLeft; ///< by interface and method
    std::map<long, int> mClients;
    std::map<long, int> mHappened;
    std::map<long, int> mNotified;

    std::array<Sender, 5> mSenders;
};

} // namespace fuzz
