// SPDX-License-Identifier: MIT
#pragma once

#include <exception>
#include <functional>
#include <future>
#include <memory>
#include <string>

#include "qnsmedia/Connection.h"
#include "qnsmedia/ImporterTypes.h"

namespace qnsmedia {

class ImporterClient;

/**
 * The daemon's importer. There is one for all clients: each hears of all imports, and a cancel
 * ends those of all.
 *
 * Each request comes twice: it returns a future, or it takes a callback, which is called once,
 * with null when the daemon has accepted the request. Otherwise the future or the callback
 * carries Refused, TimedOut, ConnectionLost or Error. What comes of an import is told by
 * notifications.
 *
 * Any thread may call; see Connection for the thread that calls back.
 */
class QNSMEDIA_API Importer {
public:
    using Callback = std::function<void(std::exception_ptr error)>;
    using StatusCallback = std::function<void(std::exception_ptr error, ImporterStatus status)>;
    using NotificationHandler = std::function<void(const ImportNotification& notification)>;

    /** Registers with the daemon and waits until it has given an id. Throws as the futures do. */
    explicit Importer(Connection& connection);

    /**
     * Leaves the daemon. Imports go on. What still waits for an answer is told ConnectionLost,
     * callbacks on this thread. No handler runs when it has returned.
     */
    ~Importer();

    Importer(const Importer&) = delete;
    Importer& operator=(const Importer&) = delete;

    /** The id that the daemon gave this client: 1 or above. */
    [[nodiscard]] int clientId() const;

    /** Who is told of notifications from now on; replaces the one before. */
    void onNotification(NotificationHandler handler);

    std::future<void> initialize();
    void initialize(Callback callback);

    /**
     * Imports a file into `folder` inside the media library, or catalogues it where it lies when
     * `folder` is empty. Ready when the daemon's engine has taken the import into its queue or
     * has refused it, which a notification tells. Wait for that before the next import: the
     * daemon has room for one that is on its way, and a second one takes its place. TimedOut
     * may also mean that another client got the answer, as with status(). The import after one may
     * be ready too early, with an answer that was only late.
     */
    std::future<void> importFile(const std::string& path, const std::string& folder = {});
    void importFile(const std::string& path, const std::string& folder, Callback callback);

    /** Ends all imports, each with a notification of result 6. */
    std::future<void> cancel();
    void cancel(Callback callback);

    /**
     * When two clients ask at the same time, the daemon may give both answers to one of them;
     * the other gets TimedOut.
     */
    std::future<ImporterStatus> status();
    void status(StatusCallback callback);

private:
    std::unique_ptr<ImporterClient> mpClient;
};

} // namespace qnsmedia
