// SPDX-License-Identifier: MIT
#include <iostream>
#include <string>
#include <unistd.h>

#include "cli/Commands.h"
#include "cli/ExitCode.h"
#include "cli/Output.h"
#include "qnsmedia/Player.h"

namespace {

/** Only somebody who sits there can be asked. */
bool isWanted() {
    if (::isatty(STDIN_FILENO) == 0)
        return true;
    show("End the daemon, for all its clients? [y/N] ");
    std::string answer;
    std::getline(std::cin, answer);
    return answer == "y" || answer == "Y" || answer == "yes";
}

} // namespace

int powerOffCommand(const qnsmedia::Connection::Options& options, bool ask) {
    qnsmedia::Connection connection(options);
    if (ask && !isWanted())
        return kFailed;
    qnsmedia::Player player(connection);
    player.powerOff().get();
    return kDone;
}
