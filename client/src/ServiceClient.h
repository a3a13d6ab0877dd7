// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <memory>
#include <optional>

#include "client/src/Link.h"
#include "pack/PackedArguments.h"

namespace qnsmedia {

/** Where a service of the daemon is, and how one registers with it. */
struct Service {
    long object;
    long registerCallBack;
    long unregisterCallBack;
    long clientIdCallBack;
    long registerNotify = 0; ///< 0: the service has no notifications
    long unregisterNotify = 0;
};

/** A request of a service, and the answer to it. */
struct Operation {
    template<typename Method, typename CallBack>
    constexpr Operation(Method request, CallBack reply, const char* title,
                        Answers which = Answers::inOrder, std::chrono::milliseconds extra = {})
        : method(static_cast<long>(request)),
          answer(static_cast<long>(reply)),
          name(title),
          answers(which),
          extraTime(extra) {}

    long method;
    long answer;
    const char* name; ///< for error texts, such as "play"
    Answers answers;
    std::chrono::milliseconds extraTime; ///< beyond the connection's deadline
};

/**
 * A client of one service: registers its callback object and, where the service notifies, a
 * notify object; sends requests and finds who waits for their answers. Any thread may use it.
 */
class ServiceClient {
public:
    /**
     * Waits until the daemon has given an id; throws qnsmedia::Error. `notified` gets the
     * notifications, on the dispatching thread, from before this returns.
     */
    ServiceClient(std::shared_ptr<Link> link, const Service& service,
                  Dispatcher::EventHandler notified = nullptr);
    ~ServiceClient();
    ServiceClient(const ServiceClient&) = delete;
    ServiceClient& operator=(const ServiceClient&) = delete;

    [[nodiscard]] int clientId() const { return mClientId; }
    [[nodiscard]] Link& link() const { return *mpLink; }

    /** Begins with this client's id, as nearly all requests do. */
    [[nodiscard]] PackedArguments ownId() const;

    void send(const Operation& operation, PackedArguments& arguments, Completion completion) const;

    /** Sends a request that has no answer. */
    void post(long method, PackedArguments& arguments) const;

    /**
     * Waits for something that a notification is to tell, until finish() or fail() is called
     * with the ticket that this returns. 0 when it has failed at once. The service must have
     * notifications.
     */
    [[nodiscard]] long await(const Operation& operation, Completion completion) const;
    /** On the dispatching thread. */
    void finish(long ticket, const ArgumentReader& notification) const;
    void fail(long ticket, std::exception_ptr error) const;

    /** Fails a request that is not sent. */
    void fail(Completion completion, std::exception_ptr error) const;

private:
    [[nodiscard]] int registerCallBack() const;
    void registerNotify() const;
    [[nodiscard]] Link::Request requestFor(const Operation& operation) const;

    const std::shared_ptr<Link> mpLink;
    const Service mService;
    std::optional<ObjectClaim> mNotifyObject;
    const ObjectClaim mCallBackObject;
    int mClientId = 0;
};

} // namespace qnsmedia
