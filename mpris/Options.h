// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "qnsmedia/Connection.h"

namespace mpris {

/** What the program is told by its arguments. */
struct Options {
    qnsmedia::Connection::Options connection;

    /** Waits for a daemon, at first and when one has gone, instead of ending. */
    bool wait = false;

    /** Where the daemon is to write pictures; empty for a folder of our own. */
    std::string pictures;
};

} // namespace mpris
