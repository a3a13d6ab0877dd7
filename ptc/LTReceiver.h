// SPDX-License-Identifier: MIT
#pragma once

#include "ptc/Receiver.h"

#include <boost/interprocess/sync/interprocess_mutex.hpp>
#include <boost/interprocess/sync/interprocess_semaphore.hpp>
#include <boost/thread/thread.hpp>

#include <atomic>
#include <deque>

/**
 * Dispatches events on one worker thread of its own, one at a time and in the order in which
 * recv() took them. Any thread may call recv(); it returns at once.
 */
class LTReceiver : public PTC::Receiver {
public:
    explicit LTReceiver(long id);

    /** Waits for a call that is being dispatched; drops what is still queued. */
    ~LTReceiver() override;

    /** `event` must not be null. */
    void recv(PTC::Event* event) override;

    [[nodiscard]] bool isQueueEmpty();

    /** The worker's thread body. */
    void processEvent();
    void loopProcessEvent();

private:
    void dispatchFront();
    [[nodiscard]] PTC::Event* takeFront();

    std::atomic<bool> stopRequested{false};
    boost::interprocess::interprocess_mutex workerMutex; ///< held while the worker loops
    boost::interprocess::interprocess_mutex queueMutex;  ///< guards `queue`
    boost::interprocess::interprocess_semaphore queueSemaphore{0};
    std::deque<PTC::Event*> queue; ///< owned
    boost::thread workerThread;    ///< last: starts when all else is there
};
