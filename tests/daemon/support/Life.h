// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

#include "tests/daemon/support/WireClient.h"

/** What a client needs to know about a service; method ids. */
struct WireService {
    long object;
    long registerCallBack;
    long registerNotify; ///< 0: there is none
};

constexpr WireService kDiscovererService{51, 8, 0};
constexpr WireService kImporterService{56, 7, 8};
constexpr WireService kPlayerService{62, 13, 14};
constexpr WireService kAllServices[] = {kDiscovererService, kImporterService, kPlayerService};

/**
 * One of a client process's lives, from its start to its end, as the daemon sees it: the port
 * that it listens on, and what is sent there. Its requests may go over the connection of another,
 * so that a test need not wait for a new one to be accepted.
 */
class Life : public WireClient {
public:
    /** `road` must be connected, and outlive this one. */
    Life(WireClient& road, long identity) : WireClient(identity), mRoad(road) {}

    /** Over a connection of its own, which it makes at once. */
    explicit Life(long identity) : WireClient(identity), mRoad(*this) { connect(); }

    /** Registers a callback object and waits for the client id; -1 when there is no answer. */
    std::int32_t registerCallBack(const WireService& service);

    /** Asks for it, and waits for nothing. */
    void sendRegistration(const WireService& service);
    void registerNotify(const WireService& service, std::int32_t client);

    void request(const WireService& service, long method, const wire::Bytes& arguments);

    /** The next packet must be this callback of the service. */
    void expectCallBack(const WireService& service, long method, const wire::Bytes& arguments);
    void expectResult(const WireService& service, long method, std::int32_t result);

    /** What the daemon sends to the service's callback object, or to its notify object. */
    [[nodiscard]] wire::Packet answer(const WireService& service, long method,
                                      const wire::Bytes& arguments) const;
    [[nodiscard]] wire::Packet notification(const WireService& service,
                                            const wire::Bytes& arguments) const;

private:
    WireClient& mRoad;
};
