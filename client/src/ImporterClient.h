// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <atomic>
#include <cstddef>
#include <memory>
#include <optional>
#include <string>

#include "client/src/NotificationHandler.h"
#include "client/src/ServiceClient.h"
#include "qnsmedia/Importer.h"

namespace qnsmedia {

/** A client of the importer that knows when an import has reached the engine. Any thread. */
class ImporterClient {
public:
    explicit ImporterClient(const std::shared_ptr<Link>& link);

    [[nodiscard]] const ServiceClient& service() const { return mService; }
    void onNotification(Importer::NotificationHandler handler) { mHandler.set(std::move(handler)); }

    /** The completion gets the arguments of a status that was told after the import. */
    void importFile(const std::string& path, const std::string& folder, Completion completion);

private:
    void awaitTurn(long ticket);
    void skipTurnClient(std::size_t used);
    void notified(long method, ArgumentReader arguments);

    NotificationHandler<ImportNotification> mHandler;

    /**
     * Clients of the daemon that only wait for turns, so that no answer to another question is
     * taken for the one that counts. An answer that does not come may be late, or another client
     * may have got it: the next turn is the other one's, and nothing has to be made of it.
     */
    std::array<std::optional<ServiceClient>, 2> mTurnClients;
    std::atomic<std::size_t> mTurnsMissed{0}; ///< tells whose turn it is

    ServiceClient mService; ///< last: what comes to it uses all of the above
};

} // namespace qnsmedia
