// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

#include "tests/daemon/support/WireClient.h"

/** Where a service is found, and how one registers there. */
struct ServiceAddress {
    long object;
    long registerCallBack; ///< method id
    long unregisterCallBack;
};

/** A client process with any number of clients of one service. */
class ServiceClient : public WireClient {
public:
    ServiceClient(long identity, const ServiceAddress& service);

    /**
     * Registers a callback object, connecting first if necessary. Returns the client id, which
     * must be the next that is answered; -1 when it is not.
     */
    std::int32_t registerCallBack(long object);

    /** Asks for a registration without waiting for its answer. */
    void sendRegistration(long object, long identity);

    void request(long method, const wire::Bytes& arguments);

    /** Sends a request whose only argument is a client's id. */
    void request(long method, std::int32_t client);

    /** The next packet must be this callback to the object. */
    void expectCallBack(long object, long method, const wire::Bytes& arguments);
    void expectResult(long object, long method, std::int32_t result);

    /**
     * All that this process sent before has been taken, and nothing has been sent to it that was
     * not received: the next packet answers a request made here, one more registration.
     */
    void expectNothingElse();

private:
    [[nodiscard]] wire::Packet callback(long object, long method, wire::Bytes arguments) const;

    ServiceAddress mService;
    bool mConnected = false;
};
