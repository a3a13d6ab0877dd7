// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <mutex>
#include <ostream>
#include <utility>
#include <vector>

#include "ptc/Event.h"
#include "ptc/ISender.h"
#include "tests/support/Bytes.h"

/** An event as it would reach a client. */
struct SentEvent {
    long objectId;
    long methodId;
    Bytes bytes;

    bool operator==(const SentEvent& other) const {
        return objectId == other.objectId && methodId == other.methodId && bytes == other.bytes;
    }
    friend std::ostream& operator<<(std::ostream& out, const SentEvent& event) {
        out << "object " << event.objectId << " method " << event.methodId << " bytes" << std::hex;
        for (const int byte : event.bytes)
            out << ' ' << byte;
        return out << std::dec;
    }
};

/** Keeps what is sent. Any thread may send. */
class RecordingSender : public PTC::ISender {
public:
    long getId() override { return 1; }

    void send(PTC::Event* event) override {
        if (atSend)
            atSend();
        const std::lock_guard lock(mMutex);
        mAllForClients = mAllForClients && event->isRemote && event->isCallback;
        mEvents.push_back(
            {event->objectId, event->methodId, Bytes(event->data, event->data + event->size)});
        delete event;
    }

    /** What was sent since the last call. */
    std::vector<SentEvent> take() {
        const std::lock_guard lock(mMutex);
        return std::exchange(mEvents, {});
    }

    /** True when every event had both flags set. */
    [[nodiscard]] bool allForClients() const { return mAllForClients; }

    /** Called before each event is kept, on the thread that sends it. */
    std::function<void()> atSend;

private:
    std::mutex mMutex;
    std::vector<SentEvent> mEvents;
    bool mAllForClients = true;
};
