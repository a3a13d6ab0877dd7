// SPDX-License-Identifier: MIT
#include "cli/Commands.h"
#include "cli/Playback.h"

int playCommand(const qnsmedia::Connection::Options& options, const std::string& file) {
    return Playback(options, file).run();
}
