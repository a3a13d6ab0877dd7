// SPDX-License-Identifier: MIT
// The least that a daemon with a QApplication does: it listens on port 1009 when its event loop
// runs. What the real daemon's start is measured against.
#include <QApplication>
#include <QTimer>

#include "bench/rpc/PacketSocket.h"

int main(int argc, char** argv) {
    qputenv("QT_QPA_PLATFORM", "offscreen");
    const QApplication application(argc, argv);
    qns::UniqueFd listener;
    QTimer::singleShot(0, [&] { listener = bench::listenOn(1009); });
    return QApplication::exec();
}
