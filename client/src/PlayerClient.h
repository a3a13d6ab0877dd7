// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <mutex>
#include <string>

#include "client/src/Link.h"
#include "define/PlayerMethods.h"
#include "qnsmedia/Player.h"

namespace qnsmedia {

/** A request of the player and the answer to it. */
struct PlayerOperation {
    MediaServiceDefine::PlayerMethod method;
    MediaServiceDefine::PlayerCallBack answer;
    const char* name;
    Answers answers = Answers::inOrder;
    std::chrono::milliseconds extraTime{};
};

/** A player's two objects, what is asked through them and who waits. Any thread may use it. */
class PlayerClient {
public:
    explicit PlayerClient(std::shared_ptr<Link> link);
    ~PlayerClient();
    PlayerClient(const PlayerClient&) = delete;
    PlayerClient& operator=(const PlayerClient&) = delete;

    [[nodiscard]] int clientId() const { return mClientId; }
    [[nodiscard]] Link& link() const { return *mpLink; }
    void onNotification(Player::NotificationHandler handler);

    /** Begins with this client's id, as nearly all requests do. */
    [[nodiscard]] PackedArguments ownId() const;

    void send(const PlayerOperation& operation, PackedArguments& arguments, Completion completion);
    void post(MediaServiceDefine::PlayerMethod method, PackedArguments& arguments);

    void open(const std::string& path, Completion completion);

    /** The completion gets the arguments of the notification that tells of this open. */
    void openMedia(const std::string& path, Completion completion);

private:
    /** An open whose outcome is waited for. */
    struct Opening {
        long ticket = 0; ///< 0: none
        std::string path;
    };

    void registerClient();
    [[nodiscard]] long awaitOpened(const std::string& path, Completion completion);
    void notified(long method, const ArgumentReader& arguments);
    void opened(const PlayerNotification& notification, const ArgumentReader& arguments);

    std::shared_ptr<Link> mpLink;
    int mClientId = 0;

    std::mutex mMutex; ///< guards the next two
    Player::NotificationHandler mHandler;
    Opening mOpening;

    ObjectClaim mNotifyObject; ///< last: from here on events come
    ObjectClaim mCallBackObject;
};

} // namespace qnsmedia
