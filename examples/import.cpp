// SPDX-License-Identifier: MIT
// Copies a file into the media library and waits until it is safe there.
// usage: example-import FILE FOLDER
#include <filesystem>
#include <future>
#include <iostream>
#include <qnsmedia/Error.h>
#include <qnsmedia/Importer.h>

int main(int argc, char** argv) {
    if (argc != 3)
        return 2;
    try {
        std::promise<qnsmedia::ImportNotification> finished;
        qnsmedia::Connection connection;
        qnsmedia::Importer importer(connection);
        importer.onNotification([&](const qnsmedia::ImportNotification& notification) {
            if (notification.kind != qnsmedia::ImportNotificationKind::finished)
                return;
            importer.onNotification({}); // the first one will do
            finished.set_value(notification);
        });
        importer.importFile(std::filesystem::absolute(argv[1]), argv[2]).get();
        const qnsmedia::ImportNotification outcome = finished.get_future().get();
        if (outcome.result != 0)
            throw qnsmedia::MediaError(outcome.result, qnsmedia::resultText(outcome.result));
        std::cout << outcome.text << '\n';
        return 0;
    } catch (const qnsmedia::Error& error) {
        std::cerr << error.what() << '\n';
        return 1;
    }
}
