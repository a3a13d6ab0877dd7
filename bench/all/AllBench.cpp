// SPDX-License-Identifier: MIT
#include "bench/all/AllBench.h"

#include <chrono>
#include <cstdio>
#include <iostream>
#include <nlohmann/json.hpp>
#include <sched.h>

#include "bench/Benches.h"
#include "bench/ChildProcess.h"
#include "bench/all/Environment.h"
#include "bench/all/Table.h"

namespace bench {
namespace {

using Json = nlohmann::ordered_json;
using Clock = std::chrono::steady_clock;

/** What all subcommands together have brought. */
struct Results {
    Json benches = Json::object();
    std::vector<TableLine> table;
    std::vector<std::string> leftOut;
    std::vector<std::string> troubles;
};

int lastCore() {
    cpu_set_t cores;
    CPU_ZERO(&cores);
    ::sched_getaffinity(0, sizeof cores, &cores);
    int last = 0;
    for (int core = 0; core < CPU_SETSIZE; ++core)
        if (CPU_ISSET(static_cast<unsigned>(core), &cores))
            last = core;
    return last;
}

std::vector<std::string> commandOf(const Subcommand& subcommand, const Options& options, int core) {
    std::vector<std::string> command = {"/proc/self/exe", subcommand.name, "--json"};
    if (subcommand.isPinned)
        command.insert(command.end(), {"--core", std::to_string(core)});
    if (options.rounds > 0)
        command.insert(command.end(), {"--rounds", std::to_string(options.rounds)});
    if (options.quick)
        command.emplace_back("--quick");
    return command;
}

void take(const Subcommand& subcommand, const std::string& output, Json& entry, Results& results) {
    const Report report = reportFromJson(Json::parse(output));
    for (TableLine& line : linesOf(subcommand.name, report))
        results.table.push_back(std::move(line));
    for (std::string& gap : gapsIn(subcommand.name, report))
        results.troubles.push_back(std::move(gap));
    for (const std::string& contender : report.leftOut())
        results.leftOut.push_back(subcommand.name + ": " + contender);
    entry.update(toJson(report));
}

void runOne(const Subcommand& subcommand, const Options& options, int core, Results& results) {
    std::fprintf(stderr, "%s ...\n", subcommand.name.c_str());
    const auto begin = Clock::now();
    const Finished finished = runToEnd(commandOf(subcommand, options, core));
    const std::chrono::duration<double> took = Clock::now() - begin;
    std::fprintf(stderr, "%s: %.0f s\n", subcommand.name.c_str(), took.count());
    Json entry{{"seconds", rounded(took.count())}, {"isPinned", subcommand.isPinned}};
    if (finished.status != 0)
        results.troubles.push_back(subcommand.name + " has ended with status " +
                                   std::to_string(finished.status));
    try {
        take(subcommand, finished.output, entry, results);
    } catch (const Json::exception& error) {
        results.troubles.push_back(subcommand.name + " tells nothing: " + error.what());
    }
    results.benches[subcommand.name] = std::move(entry);
}

void printSummary(std::ostream& out, const Results& results) {
    printLines(out, results.table);
    for (const std::string& contender : results.leftOut)
        out << "not installed, so left out: " << contender << '\n';
    for (const std::string& trouble : results.troubles)
        out << "failed: " << trouble << '\n';
}

} // namespace

int runAll(const std::vector<Subcommand>& subcommands, const Options& options, bool json,
           int core) {
    Json document{{"environment", describeEnvironment()}, {"isQuick", options.quick}};
    Results results;
    for (const Subcommand& subcommand : subcommands)
        runOne(subcommand, options, core >= 0 ? core : lastCore(), results);
    printSummary(json ? std::cerr : std::cout, results);
    if (json) {
        document["table"] = toJson(results.table);
        document["leftOut"] = results.leftOut;
        document["troubles"] = results.troubles;
        document["benches"] = results.benches;
        std::cout << document.dump(1) << '\n';
    }
    return results.troubles.empty() ? 0 : 1;
}

} // namespace bench
