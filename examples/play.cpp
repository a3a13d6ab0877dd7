// SPDX-License-Identifier: MIT
// Plays a file to its end.
#include <future>
#include <qnsmedia/Player.h>

int main(int, char** argv) {
    qnsmedia::Connection connection;
    qnsmedia::Player player(connection);
    std::promise<void> ended;
    player.onNotification([&](const qnsmedia::PlayerNotification& notification) {
        if (notification.kind == qnsmedia::NotificationKind::end)
            ended.set_value();
    });
    player.openMedia(argv[1]).get();
    player.play().get();
    ended.get_future().wait();
}
