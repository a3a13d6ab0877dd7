// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <mutex>
#include <shared_mutex>

/**
 * A service's registry of clients: hands out client ids and remembers each client's callback
 * object and notify object. The objects are not owned. Any thread may call it.
 *
 * An object may be freed after forget(), unless isInUse(). So a thread that does not call
 * forget() itself holds what use() returns from before it looks an object up until it has
 * used it.
 */
class ClientNotify {
public:
    ClientNotify() = default;
    virtual ~ClientNotify();

    /** The next client id, from 1 upward, never used twice. */
    int getNewID();

    /** Registers a callback object under a new id and returns the id. */
    int registerClient(void* callback);

    /** The first object registered under an id stays. The id need not be a client's. */
    void registerNotifyClient(int id, void* notify);

    void unregisterClient(int id);
    void unregisterNotifyClient(int id);

    /** True when a callback object is registered under `id`. */
    [[nodiscard]] bool isEnableID(int id) const;

    /** The callback object of `id`, or null. */
    [[nodiscard]] void* getCurrentMethod(int id) const;

    /** Unregisters the object, a callback or a notify object, wherever it is registered. */
    void forget(const void* object);

    /** False when nobody uses an object that he looked up before this call. Does not wait. */
    [[nodiscard]] bool isInUse() const;

protected:
    /** Not twice at a time on one thread. */
    [[nodiscard]] std::shared_lock<std::shared_mutex> use() const;

    /** Unregisters the callback object of a client that has ended. */
    virtual void clientEnded(int id);

    /** A copy of the notify objects by ascending client id, to be called without the lock. */
    [[nodiscard]] std::map<int, void*> notifyClients() const;

private:
    mutable std::mutex mMutex; ///< guards all below
    std::map<int, void*> mClientMap;
    std::map<int, void*> mNotifyMap;
    int mLastID = 0;

    mutable std::shared_mutex mUseMutex; ///< held, shared, by those who use an object
};
