// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <list>
#include <mutex>
#include <vector>

#include "pack/ArgumentReader.h"
#include "ptc/IAdapter.h"

class LTReceiver;

namespace qnsmedia {

class CallbackAdapter;
class ErrandAdapter;

/**
 * The objects of this process that the daemon can call, and the thread on which that happens.
 * Any thread may use it. Handlers and errands run one after another on the receiver's worker.
 */
class Dispatcher {
public:
    /** Takes the id of the object that is called, and the event's method and arguments. */
    using EventHandler =
        std::function<void(long object, long method, const ArgumentReader& arguments)>;
    using Errand = std::function<void()>;

    Dispatcher();
    ~Dispatcher();
    Dispatcher(const Dispatcher&) = delete;
    Dispatcher& operator=(const Dispatcher&) = delete;

    /** Gives `receiver`, which must get no events yet, the adapters of all objects. */
    void attach(LTReceiver& receiver);

    /** Gives an object id to `handler`; 0 when there are too many. */
    long claimObject(EventHandler handler);

    /**
     * Takes the id back and runs the errands for it that have not been run. No handler and no
     * errand for the object runs when this has returned, except one that is the caller.
     */
    void releaseObject(long id);

    /** Runs `errand` on the worker, unless the object, if not 0, is released before. */
    void post(long object, Errand errand);

private:
    friend class CallbackAdapter;
    friend class ErrandAdapter;

    struct Waiting {
        long object;
        Errand run;
    };

    void runErrands();
    std::list<Waiting> takeErrands();
    std::list<Waiting> takeErrandsFor(long object);

    /**
     * Held while a handler or an errand runs; guards the adapters' handlers and the next id.
     * Recursive, so that what it calls may make and release objects.
     */
    std::recursive_mutex mRunning;
    std::vector<CallbackAdapter*> mAdapters; ///< owned by the receiver
    std::size_t mNextAdapter = 0;
    LTReceiver* mpReceiver = nullptr;

    std::mutex mMutex; ///< guards mErrands
    std::list<Waiting> mErrands;
};

} // namespace qnsmedia
