// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/IRemoteReceiver.h"

#include <map>
#include <memory>

namespace PTC {

struct EventPacket;

/**
 * Routes packets by receiver id. Fill the table before the transport starts: reader threads
 * read it without a lock.
 */
class RemoteReceiver : public IRemoteReceiver {
public:
    explicit RemoteReceiver(long id);
    ~RemoteReceiver() override;

    long getId() override;
    bool initialize(long identity) override;
    long getIdentity() override;
    void addReceiver(IReceiver* receiver) override;

    /** Gives a receiver back to the caller, or null when there is none with that id. */
    [[nodiscard]] std::unique_ptr<IReceiver> releaseReceiver(long id);

    virtual void run() = 0;

    /**
     * Passes the packet's payload, as an event, to the receiver that it names. The packet stays
     * with the caller. Returns without taking the payload when there is no such receiver;
     * otherwise sets `packet->data` to null.
     */
    virtual void handleEventPacket(EventPacket* packet);

protected:
    /** Deletes the receivers. For transports whose threads call into them. */
    void deleteReceivers();

private:
    std::map<long, std::unique_ptr<IReceiver>> mReceivers;
    long mId;
    long mIdentity = -1;
};

} // namespace PTC
