// SPDX-License-Identifier: MIT
#include "ptc/LTReceiver.h"

#include "ptc/Barrier.h"
#include "ptc/SemaphoreWait.h"

#include <boost/interprocess/exceptions.hpp>
#include <boost/interprocess/sync/scoped_lock.hpp>

#include <algorithm>
#include <cassert>
#include <memory>

namespace {

using Lock = boost::interprocess::scoped_lock<boost::interprocess::interprocess_mutex>;

} // namespace

LTReceiver::LTReceiver(long id) : Receiver(id), workerThread([this] { processEvent(); }) {}

LTReceiver::~LTReceiver() {
    stopRequested = true;
    queueSemaphore.post();
    workerThread.join();
    std::for_each(queue.begin(), queue.end(), discard);
}

void LTReceiver::recv(PTC::Event* event) {
    assert(event);
    std::unique_ptr<PTC::Event, void (*)(PTC::Event*)> owned(event, discard);
    try {
        const Lock lock(queueMutex);
        queue.push_back(event);
        static_cast<void>(owned.release());
        queueSemaphore.post();
    } catch (const boost::interprocess::interprocess_exception&) {
        // The event is lost, or stays queued until the next one wakes the worker.
    }
}

bool LTReceiver::isQueueEmpty() {
    const Lock lock(queueMutex);
    return queue.empty();
}

void LTReceiver::processEvent() {
    try {
        loopProcessEvent();
    } catch (const boost::interprocess::interprocess_exception&) {
        // Without its primitives the worker cannot go on.
    }
}

void LTReceiver::loopProcessEvent() {
    const Lock working(workerMutex);
    for (;;) {
        // A signal handler that ran on this thread is no reason to stop working.
        PTC::waitThroughSignals(queueSemaphore);
        while (!stopRequested && !isQueueEmpty())
            dispatchFront();
        if (stopRequested)
            return;
    }
}

void LTReceiver::dispatchFront() {
    const std::unique_ptr<PTC::Event, void (*)(PTC::Event*)> event(takeFront(), discard);
    PTC::barrier([this, &event] { handleEvent(event.get()); });
}

PTC::Event* LTReceiver::takeFront() {
    const Lock lock(queueMutex);
    auto* const event = queue.front();
    queue.pop_front();
    return event;
}
