// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>

#include "client/src/NotificationHandler.h"
#include "client/src/ServiceClient.h"
#include "qnsmedia/Importer.h"

namespace qnsmedia {

/** A client of the importer that knows when an import has reached the engine. Any thread. */
class ImporterClient {
public:
    explicit ImporterClient(std::shared_ptr<Link> link);

    [[nodiscard]] const ServiceClient& service() const { return mService; }
    void onNotification(Importer::NotificationHandler handler) { mHandler.set(std::move(handler)); }

    /** The completion gets the arguments of a status that was told after the import. */
    void importFile(const std::string& path, const std::string& folder, Completion completion);

private:
    void awaitTurn(long ticket);
    void notified(long method, ArgumentReader arguments);

    NotificationHandler<ImportNotification> mHandler;
    ServiceClient mService; ///< last: its notifications use the handler
};

} // namespace qnsmedia
