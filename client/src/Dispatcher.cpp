// SPDX-License-Identifier: MIT
#include "client/src/Dispatcher.h"

#include <memory>
#include <unistd.h>
#include <utility>

#include "ptc/Barrier.h"
#include "ptc/Event.h"
#include "ptc/LTReceiver.h"

namespace qnsmedia {
namespace {

/** Objects that one process can have; a player takes two. */
constexpr long kObjectCount = 126;

/**
 * Ids differ from process to process: what the daemon still sends to a process that had this
 * identity before must not reach an object of this one.
 */
long firstObjectId() {
    return static_cast<long>(::getpid()) * (kObjectCount + 2);
}

} // namespace

/** An object whose handler comes and goes. */
class CallbackAdapter : public PTC::IAdapterBase {
public:
    CallbackAdapter(long id, Dispatcher& dispatcher) : mId(id), mDispatcher(dispatcher) {}

    long getId() override { return mId; }
    void setTarget(void*) override {}

    void receive(PTC::Event* event) override {
        const std::lock_guard running(mDispatcher.mRunning);
        // A copy, since the handler may release its own object.
        const Dispatcher::EventHandler handle = handler;
        if (!handle)
            return;
        handle(mId, event->methodId, ArgumentReader(event->data, event->size));
    }

    Dispatcher::EventHandler handler;

private:
    const long mId;
    Dispatcher& mDispatcher;
};

/** Gets an event for every errand. */
class ErrandAdapter : public PTC::IAdapterBase {
public:
    explicit ErrandAdapter(Dispatcher& dispatcher) : mDispatcher(dispatcher) {}

    long getId() override { return firstObjectId(); }
    void setTarget(void*) override {}
    void receive(PTC::Event*) override { mDispatcher.runErrands(); }

private:
    Dispatcher& mDispatcher;
};

Dispatcher::Dispatcher() = default;
Dispatcher::~Dispatcher() = default;

void Dispatcher::attach(LTReceiver& receiver) {
    mpReceiver = &receiver;
    mAdapters.clear();
    receiver.addCBAdapter(std::make_unique<ErrandAdapter>(*this).release());
    for (long i = 1; i <= kObjectCount; ++i) {
        auto adapter = std::make_unique<CallbackAdapter>(firstObjectId() + i, *this);
        mAdapters.push_back(adapter.get());
        receiver.addCBAdapter(adapter.release());
    }
}

// In turn, so that what is still on its way to a released object finds nobody.
long Dispatcher::claimObject(EventHandler handler) {
    const std::lock_guard running(mRunning);
    for (std::size_t tried = 0; tried < mAdapters.size(); ++tried) {
        CallbackAdapter& adapter = *mAdapters[mNextAdapter++ % mAdapters.size()];
        if (adapter.handler)
            continue;
        adapter.handler = std::move(handler);
        return adapter.getId();
    }
    return 0;
}

void Dispatcher::releaseObject(long id) {
    const std::lock_guard running(mRunning);
    for (CallbackAdapter* adapter : mAdapters)
        if (adapter->getId() == id)
            adapter->handler = nullptr;
    for (const Waiting& errand : takeErrandsFor(id))
        PTC::barrier(errand.run);
}

void Dispatcher::post(long object, Errand errand) {
    {
        const std::lock_guard lock(mMutex);
        mErrands.push_back({object, std::move(errand)});
    }
    mpReceiver->recv(new PTC::Event(firstObjectId(), 0, nullptr, 0, false, true));
}

void Dispatcher::runErrands() {
    const std::lock_guard running(mRunning);
    for (const Waiting& errand : takeErrands())
        PTC::barrier(errand.run);
}

std::list<Dispatcher::Waiting> Dispatcher::takeErrands() {
    const std::lock_guard lock(mMutex);
    return std::exchange(mErrands, {});
}

std::list<Dispatcher::Waiting> Dispatcher::takeErrandsFor(long object) {
    std::list<Waiting> taken;
    const std::lock_guard lock(mMutex);
    for (auto errand = mErrands.begin(); errand != mErrands.end();) {
        const auto next = std::next(errand);
        if (errand->object == object)
            taken.splice(taken.end(), mErrands, errand);
        errand = next;
    }
    return taken;
}

} // namespace qnsmedia
