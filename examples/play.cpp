// SPDX-License-Identifier: MIT
// Plays a file to its end.
#include <filesystem>
#include <future>
#include <qnsmedia/Player.h>

int main(int, char** argv) {
    std::promise<void> ended;
    qnsmedia::Connection connection;
    qnsmedia::Player player(connection);
    player.onNotification([&](const qnsmedia::PlayerNotification& notification) {
        if (notification.kind == qnsmedia::NotificationKind::end)
            ended.set_value();
    });
    player.openMedia(std::filesystem::absolute(argv[1])).get();
    player.play().get();
    ended.get_future().wait();
}
