// SPDX-License-Identifier: MIT
#include "ptc/EventQueue.h"

namespace PTC {

void EventQueue::add(Event* event) {
    std::unique_ptr<Event> owned(event);
    mEvents.push_back(std::move(owned));
}

Event* EventQueue::at(unsigned long index) const {
    return index < mEvents.size() ? mEvents[index].get() : nullptr;
}

void EventQueue::remove(unsigned long index) {
    if (index < mEvents.size())
        mEvents.erase(mEvents.begin() + static_cast<std::ptrdiff_t>(index));
}

unsigned long EventQueue::count() const {
    return mEvents.size();
}

unsigned long EventQueue::capacity() const {
    return mEvents.capacity();
}

} // namespace PTC
