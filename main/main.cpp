// SPDX-License-Identifier: MIT
#include <QApplication>
#include <cstdlib>

#include "log/Logging.h"
#include "main/CommandLine.h"
#include "main/MediaServiceFactory.h"
#include "main/MediaServiceMain.h"
#include "main/SignalHandler.h"

namespace {

constexpr const wchar_t* kModule = L"MediaPlayerService";
constexpr int kLogCode = 101;
constexpr int kLogInformational = 6;
constexpr int kLogError = 3;

/** Ends the process on SIGINT and SIGTERM, on a thread of the signal layer. */
void onSystemSingleCaught() {
    LOG_EVENT(kModule, kLogCode, L"main::onSystemSingleCaught", kLogInformational);
    QCoreApplication::quit();
    // Not exit(): it would run the destructors of statics under the feet of threads that go on.
    // Nothing is lost, since trace lines and log lines are with the kernel as soon as written.
    std::_Exit(0);
}

/** A device without a display still has its players: Qt then draws nowhere. */
void choosePlatform(int argc, char** argv) {
    const bool hasDisplay = std::getenv("DISPLAY") || std::getenv("WAYLAND_DISPLAY");
    if (!hasDisplay && !choosesPlatform(argc, argv))
        ::setenv("QT_QPA_PLATFORM", "offscreen", 0);
}

} // namespace

int main(int argc, char** argv) {
    if (const std::optional<int> status = runCommandLine(argc, argv))
        return *status;
    choosePlatform(argc, argv);

    INIT_LOGGING(kModule);
    registerSystemSignalHandler(onSystemSingleCaught, "QNSMediaService");

    const QApplication application(argc, argv);
    MediaServiceFactory factory;
    factory.initialize(); // without a server the process still runs, and says so
    MediaServiceMain serviceMain;
    if (!serviceMain.initialize()) {
        LOG_EVENT(kModule, kLogCode, L"MediaServiceMain initialize is failed.", kLogError);
        return -1;
    }
    const int status = QApplication::exec();
    LOG_EVENT(kModule, kLogCode, L"quit a.exec", kLogInformational);
    return status;
}
