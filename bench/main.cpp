// SPDX-License-Identifier: MIT
#include "bench/Benches.h"
#include "bench/Report.h"
#include "bench/all/AllBench.h"

#include <CLI/CLI.hpp>
#include <cstdio>
#include <exception>
#include <iostream>
#include <sched.h>

namespace {

struct Bench {
    const char* name;
    const char* summary;
    int (*run)(const bench::Options& options, bench::Report& report);
    bool isPinned; ///< on one core in a run of all
};

constexpr Bench kBenches[] = {
    {"rpc", "one request and its answer, beside bare sockets and D-Bus", bench::runRpc, true},
    {"pack", "encode and decode every value form, beside msgpack-c", bench::runPack, true},
    {"player", "open, seek, close and loop real files, beside libmpv", bench::runPlayer, true},
    {"start", "start-up, memory and idle load, beside an empty QApplication and MPD",
     bench::runStart, true},
    {"media", "read and draw files, beside the libraries and commands that do", bench::runMedia,
     true},
    {"import", "import thousands of files, beside MPD and minidlna", bench::runImport, false},
    {"scale", "how costs grow with clients, requests, listeners, discoverers and rows",
     bench::runScale, false},
};

struct CommonOptions {
    bench::Options bench;
    bool json = false;
    int core = -1;
};

bool pinTo(int core) {
    cpu_set_t cores;
    CPU_ZERO(&cores);
    CPU_SET(static_cast<unsigned>(core), &cores);
    if (::sched_setaffinity(0, sizeof cores, &cores) == 0)
        return true;
    std::perror("qnsmedia-bench: cannot pin to the core");
    return false;
}

/** What was measured before something went wrong stays in the report. */
int measure(const Bench& bench, const bench::Options& options, bench::Report& report) {
    try {
        return bench.run(options, report);
    } catch (const std::exception& error) {
        std::fprintf(stderr, "qnsmedia-bench: %s: %s\n", bench.name, error.what());
        return 1;
    }
}

int run(const Bench& bench, const CommonOptions& options) {
    if (options.core >= 0 && !pinTo(options.core))
        return 1;
    bench::Report report;
    const int status = measure(bench, options.bench, report);
    if (options.json)
        report.printJson(std::cout);
    else
        report.printTable(std::cout);
    return status;
}

void addCommonOptions(CLI::App& command, CommonOptions& options) {
    command.add_flag("--json", options.json, "print the figures as JSON");
    command.add_option("--core", options.core, "run on this processor core only")
        ->check(CLI::Range(0, CPU_SETSIZE - 1));
    command.add_option("--rounds", options.bench.rounds, "how often to repeat each measurement")
        ->check(CLI::PositiveNumber);
    command.add_flag("--quick", options.bench.quick, "see that it works: fewer and smaller");
    command.allow_extras();
}

int runAll(const CommonOptions& options) {
    std::vector<bench::Subcommand> subcommands;
    for (const Bench& bench : kBenches)
        subcommands.push_back({bench.name, bench.isPinned});
    return bench::runAll(subcommands, options.bench, options.json, options.core);
}

} // namespace

int main(int argc, char** argv) {
    CLI::App app("Measurements of QNSMediaService beside its peers", "qnsmedia-bench");
    app.require_subcommand(1);
    CommonOptions options;
    for (const Bench& bench : kBenches)
        addCommonOptions(*app.add_subcommand(bench.name, bench.summary), options);
    CLI::App* const all = app.add_subcommand("all", "all of these, and one table");
    addCommonOptions(*all, options);
    CLI11_PARSE(app, argc, argv);

    if (all->parsed())
        return runAll(options);
    for (const Bench& bench : kBenches) {
        const CLI::App& command = *app.get_subcommand(bench.name);
        if (!command.parsed())
            continue;
        options.bench.arguments = command.remaining();
        return run(bench, options);
    }
    return 1;
}
