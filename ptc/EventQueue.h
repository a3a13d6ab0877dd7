// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/Event.h"

#include <cstddef>
#include <memory>
#include <vector>

namespace PTC {

/** Events in arrival order. Owns the events, not their argument blocks. Not locked. */
class EventQueue {
public:
    void add(Event* event);

    /** The event at `index`, or null beyond the end. Stays owned by the queue. */
    [[nodiscard]] Event* at(unsigned long index) const;

    /** Deletes the event at `index` and closes the gap; beyond the end does nothing. */
    void remove(unsigned long index);

    [[nodiscard]] unsigned long count() const;
    [[nodiscard]] unsigned long capacity() const;

private:
    std::vector<std::unique_ptr<Event>> mEvents;
};

} // namespace PTC
