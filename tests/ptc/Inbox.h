// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/Event.h"
#include "ptc/Receiver.h"
#include "tests/ptc/Gate.h"

#include <condition_variable>
#include <cstddef>
#include <mutex>
#include <string>
#include <vector>

/** A receiver that keeps what arrives, from any thread. */
class Inbox : public PTC::Receiver {
public:
    struct Message {
        long objectId;
        long methodId;
        std::string payload;
        bool isCallback;
        bool isRemote;
    };

    using Receiver::Receiver;

    void handleEvent(PTC::Event* event) override {
        const std::lock_guard<std::mutex> lock(mMutex);
        mMessages.push_back({event->objectId, event->methodId,
                             std::string(event->data, static_cast<std::size_t>(event->size)),
                             event->isCallback, event->isRemote});
        mArrived.notify_all();
    }

    /** All messages, once there are that many. */
    [[nodiscard]] std::vector<Message> waitFor(std::size_t count) {
        std::unique_lock<std::mutex> lock(mMutex);
        mArrived.wait_for(lock, kPatience, [&] { return mMessages.size() >= count; });
        return mMessages;
    }

private:
    std::mutex mMutex; ///< guards `mMessages`
    std::condition_variable mArrived;
    std::vector<Message> mMessages;
};
