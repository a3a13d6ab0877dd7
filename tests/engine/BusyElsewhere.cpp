// SPDX-License-Identifier: MIT
#include "tests/engine/BusyElsewhere.h"

#include <algorithm>
#include <ctime>
#include <fstream>
#include <string>
#include <unistd.h>

namespace {

/** Of all processors: user, nice, system, idle, waiting for disks, interrupts (2), stolen. */
Seconds busyMachine() {
    std::ifstream file("/proc/stat");
    std::string name;
    file >> name;
    double ticks = 0;
    for (int field = 0; field < 8; ++field) {
        double value = 0;
        file >> value;
        ticks += field == 3 || field == 4 ? 0 : value;
    }
    return Seconds(ticks / static_cast<double>(::sysconf(_SC_CLK_TCK)));
}

Seconds busyProcess() {
    timespec time{};
    ::clock_gettime(CLOCK_PROCESS_CPUTIME_ID, &time);
    return Seconds(static_cast<double>(time.tv_sec) + static_cast<double>(time.tv_nsec) / 1e9);
}

} // namespace

BusyElsewhere::BusyElsewhere() : mBefore(busyMachine() - busyProcess()) {}

Seconds BusyElsewhere::elapsed() const {
    return std::max(Seconds{}, busyMachine() - busyProcess() - mBefore);
}
