// SPDX-License-Identifier: MIT
#pragma once

#include <map>
#include <mutex>

/**
 * A service's registry of clients: hands out client ids and remembers each client's callback
 * object and notify object. The objects are not owned. Any thread may call it.
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

protected:
    /** A copy of the notify objects by ascending client id, to be called without the lock. */
    [[nodiscard]] std::map<int, void*> notifyClients() const;

private:
    mutable std::mutex mMutex; ///< guards all below
    std::map<int, void*> mClientMap;
    std::map<int, void*> mNotifyMap;
    int mLastID = 0;
};
