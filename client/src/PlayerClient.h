// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <mutex>
#include <string>

#include "client/src/NotificationHandler.h"
#include "client/src/ServiceClient.h"
#include "qnsmedia/Player.h"

namespace qnsmedia {

/** A client of the player that knows what becomes of an open. Any thread may use it. */
class PlayerClient {
public:
    explicit PlayerClient(std::shared_ptr<Link> link);

    [[nodiscard]] const ServiceClient& service() const { return mService; }
    void onNotification(Player::NotificationHandler handler) { mHandler.set(std::move(handler)); }

    void open(const std::string& path, Completion completion);

    /** The completion gets the arguments of the notification that tells of this open. */
    void openMedia(const std::string& path, Completion completion);

private:
    /** An open whose outcome is waited for. */
    struct Opening {
        long ticket = 0; ///< 0: none
        std::string path;
    };

    [[nodiscard]] long awaitOpened(const std::string& path, Completion completion);
    void notified(long method, const ArgumentReader& arguments);
    void opened(const PlayerNotification& notification, const ArgumentReader& arguments);

    NotificationHandler<PlayerNotification> mHandler;
    std::mutex mMutex; ///< guards mOpening
    Opening mOpening;
    ServiceClient mService; ///< last: its notifications use the others
};

} // namespace qnsmedia
