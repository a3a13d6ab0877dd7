// SPDX-License-Identifier: MIT
#include <QApplication>

#include "log/Logging.h"
#include "main/CommandLine.h"
#include "main/HostLog.h"
#include "main/MediaServiceFactory.h"
#include "main/MediaServiceMain.h"
#include "main/SignalHandler.h"
#include "main/StandardDescriptors.h"
#include "main/SystemSingleCaught.h"

int main(int argc, char** argv) {
    openStandardDescriptors();
    const CommandLine commandLine = readCommandLine(argc, argv);
    if (commandLine.exitStatus)
        return *commandLine.exitStatus;
    if (!commandLine.choosesPlatform)
        choosePlatform();

    INIT_LOGGING(host::kLogModule);
    registerSystemSignalHandler(onSystemSingleCaught, "QNSMediaService");

    // Destroyed in the opposite order.
    const QApplication application(argc, argv);
    MediaServiceFactory factory(commandLine.reconnectsClients);
    factory.initialize(); // without a server the process runs all the same; the server has said so
    MediaServiceMain serviceMain;
    if (!serviceMain.initialize()) {
        LOG_EVENT(host::kLogModule, host::kLogCode, L"MediaServiceMain initialize is failed.",
                  host::kLogError);
        return -1;
    }
    const int status = QApplication::exec();
    LOG_EVENT(host::kLogModule, host::kLogCode, L"quit a.exec", host::kLogInformational);
    return status;
}
