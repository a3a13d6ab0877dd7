// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/ISender.h"

namespace PTC {

/**
 * Base of senders. Its id is the id of the receiver in the other process, its identity the
 * loopback port at which that process listens. Both are set before other threads send.
 */
class RemoteSender : public IRemoteSender {
public:
    explicit RemoteSender(long id);

    long getId() override;
    bool initialize(long identity) override;
    void setId(long id) override;

    /** -1 until initialize(). */
    virtual long getIdentity();

private:
    long mId;
    long mIdentity = -1;
};

} // namespace PTC
