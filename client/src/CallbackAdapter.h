// SPDX-License-Identifier: MIT
#pragma once

#include <mutex>

#include "client/src/Link.h"
#include "ptc/IAdapter.h"

namespace qnsmedia {

/** An object of this process that the daemon can call; its handler comes and goes. */
class CallbackAdapter : public PTC::IAdapterBase {
public:
    explicit CallbackAdapter(long id) : mId(id) {}

    long getId() override { return mId; }
    void receive(PTC::Event* event) override;
    void setTarget(void*) override {}

    /** False when there is a handler already. */
    bool claim(Link::EventHandler handler);
    void release();

private:
    const long mId;
    /** Recursive, so that a handler may release itself. Held while the handler runs. */
    std::recursive_mutex mMutex;
    Link::EventHandler mHandler;
};

} // namespace qnsmedia
