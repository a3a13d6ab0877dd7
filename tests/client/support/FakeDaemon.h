// SPDX-License-Identifier: MIT
#pragma once

#include <condition_variable>
#include <functional>
#include <list>
#include <map>
#include <mutex>
#include <optional>
#include <string_view>
#include <thread>
#include <vector>

#include "base/UniqueFd.h"
#include "tests/daemon/support/PlayerClient.h"

/** One of the daemon's services, and what it answers without orders to the contrary. */
struct FakeService {
    struct Answer {
        long callback;
        wire::Bytes payload;
    };

    long object;
    long registerCallBack; ///< method ids
    long registerNotify;
    std::map<long, Answer> answers; ///< by the request's method; others have none

    /** They accept every request. */
    static FakeService player();
    static FakeService importer();
};

/**
 * What the client library takes for the daemon: bare sockets and packets written by the test.
 * It has one service. Without orders to the contrary it gives ids, counting from 1. Any thread may
 * use it.
 */
class FakeDaemon {
public:
    /** Called on the daemon's own thread, which may send. */
    using Reaction = std::function<void(const wire::Packet& request)>;

    explicit FakeDaemon(FakeService service = FakeService::player());
    ~FakeDaemon();
    FakeDaemon(const FakeDaemon&) = delete;
    FakeDaemon& operator=(const FakeDaemon&) = delete;

    /** What happens from now on instead of the answer to this method; null: nothing at all. */
    void on(long method, Reaction reaction);

    /** Sends a callback to the object that was registered with the client id of `request`. */
    void reply(const wire::Packet& request, long callback, const wire::Bytes& payload);

    /** Sends to the callback object, or the notify object, that was registered last. */
    void callBack(long callback, const wire::Bytes& payload);
    void notify(const wire::Bytes& payload);

    /** Sends to the client that registered last. */
    void send(const wire::Packet& packet) { sendBytes(wire::toBytes(packet)); }
    void sendBytes(std::string_view bytes);

    [[nodiscard]] std::int64_t callbackObject() const;
    [[nodiscard]] std::int64_t receiver() const;

    /** Waits for the next request with this method; those before it are dropped. */
    std::optional<wire::Packet> waitForRequest(long method);

    /** True when there has been one that waitForRequest() has not given or dropped. */
    [[nodiscard]] bool hasRequest(long method) const;

    /** Ends all connections and listens no more, as a process that dies. */
    void die();

private:
    struct Client {
        std::int64_t identity = 0;
        std::int64_t callbackObject = 0;
        std::int64_t notifyObject = 0;
    };
    struct Incoming {
        qns::UniqueFd socket;
        wire::Bytes received;
    };

    void run();
    void serve(Incoming& incoming);
    void handle(const wire::Packet& request);
    void react(const wire::Packet& request);
    void registerCallBack(const wire::Packet& request);
    void registerNotify(const wire::Packet& request);
    void sendTo(const Client& client, std::int64_t object, long method, const wire::Bytes& payload);
    void write(std::int64_t identity, std::string_view bytes);
    [[nodiscard]] Client lastClient() const;

    const FakeService mService;
    qns::UniqueFd mWakeUp;
    qns::UniqueFd mListener;
    std::list<Incoming> mIncoming; ///< the thread's own

    mutable std::recursive_mutex mMutex; ///< guards all below
    std::condition_variable_any mChanged;
    bool mDying = false;
    std::map<long, Reaction> mReactions;
    std::vector<Client> mClients; ///< the client id is the index plus 1
    std::map<std::int64_t, qns::UniqueFd> mOutgoing;
    std::list<wire::Packet> mRequests;

    std::thread mThread; ///< last: uses all of the above
};
