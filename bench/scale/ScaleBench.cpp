// SPDX-License-Identifier: MIT
// How costs grow with what a device may have many of.
#include <algorithm>
#include <cstdio>

#include "bench/Benches.h"
#include "bench/scale/Scales.h"

namespace bench {
namespace {

struct Part {
    const char* name;
    bool (*measure)(const Options& options, Report& report);
};

constexpr Part kParts[] = {
    {"clients", measureClients},     {"flight", measureInFlight},
    {"listeners", measureListeners}, {"discoverers", measureDiscoverers},
    {"rows", measureLibraryRows},
};

bool isWanted(const Part& part, const std::vector<std::string>& names) {
    return names.empty() || std::find(names.begin(), names.end(), part.name) != names.end();
}

} // namespace

int runScale(const Options& options, Report& report) {
    for (const Part& part : kParts) {
        if (isWanted(part, options.arguments) && !part.measure(options, report)) {
            std::fprintf(stderr, "qnsmedia-bench: a contender could not be started: %s\n",
                         part.name);
            return 1;
        }
    }
    return 0;
}

} // namespace bench
