// SPDX-License-Identifier: MIT
// How soon the daemon serves, and what it needs while nobody asks: beside an empty QApplication,
// which is the least it can be, and beside another media daemon.
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <functional>
#include <string>
#include <thread>

#include "bench/Benches.h"
#include "bench/ChildProcess.h"
#include "bench/Programs.h"
#include "bench/Report.h"
#include "bench/ScratchFolder.h"
#include "bench/rpc/PacketSocket.h"
#include "bench/start/ProcessUse.h"

namespace bench {
namespace {

using Clock = std::chrono::steady_clock;

constexpr int kDefaultRounds = 10;
constexpr int kQuickRounds = 3;
constexpr std::chrono::seconds kSettle{2};
constexpr std::chrono::seconds kIdle{30};
constexpr std::chrono::seconds kQuickIdle{5};

struct Contender {
    std::string name;
    Role role;
    std::vector<std::string> command;
    uint16_t port;
};

double millisecondsToServe(const Contender& contender) {
    const auto start = Clock::now();
    const ChildProcess process = ChildProcess::run(contender.command);
    const qns::UniqueFd connection = connectTo(contender.port);
    return std::chrono::duration<double, std::milli>(Clock::now() - start).count();
}

std::string writeMpdConfiguration(const std::filesystem::path& folder) {
    std::filesystem::create_directories(folder / "music");
    std::ofstream out(folder / "mpd.conf");
    out << "music_directory \"" << (folder / "music").string() << "\"\n"
        << "db_file \"" << (folder / "db").string() << "\"\n"
        << "bind_to_address \"127.0.0.1\"\nport \"6600\"\n"
        << "audio_output {\n type \"null\"\n name \"null\"\n}\n";
    return (folder / "mpd.conf").string();
}

std::vector<Contender> contendersIn(const std::filesystem::path& folder, Report& report) {
    std::vector<Contender> contenders = {
        {"daemon", Role::ours, {programFolder() + "/QNSMediaService"}, 1008},
        {"empty QApplication", Role::floor, {programFolder() + "/bench-empty-application"}, 1009},
    };
    if (takesPart("MPD", "mpd", report))
        contenders.push_back(
            {"MPD", Role::peer, {"mpd", "--no-daemon", writeMpdConfiguration(folder)}, 6600});
    return contenders;
}

Row measureStart(const std::vector<Contender>& contenders, int rounds) {
    std::vector<std::vector<double>> samples(contenders.size());
    for (int round = 0; round < rounds; ++round)
        for (std::size_t i = 0; i < contenders.size(); ++i)
            samples[i].push_back(millisecondsToServe(contenders[i]));
    Row row{"exec to first accepted connection", "ms", {}};
    for (std::size_t i = 0; i < contenders.size(); ++i)
        row.entries.push_back(
            {contenders[i].name, summarize(std::move(samples[i])), contenders[i].role});
    return row;
}

std::vector<ProcessUse> usesOf(const std::vector<ChildProcess>& processes) {
    std::vector<ProcessUse> uses;
    for (const ChildProcess& process : processes)
        uses.push_back(readProcessUse(process.pid()));
    return uses;
}

using Figure = std::function<double(const ProcessUse& before, const ProcessUse& after)>;

/** All contenders side by side, for so many seconds without anything to do. */
void measureIdle(const std::vector<Contender>& contenders, std::chrono::seconds idle,
                 Report& report) {
    std::vector<ChildProcess> processes;
    for (const Contender& contender : contenders) {
        processes.push_back(ChildProcess::run(contender.command));
        connectTo(contender.port);
    }
    std::this_thread::sleep_for(kSettle);
    const std::vector<ProcessUse> before = usesOf(processes);
    std::this_thread::sleep_for(idle);
    const std::vector<ProcessUse> after = usesOf(processes);

    const auto addRow = [&](const char* name, const char* unit, const Figure& figure) {
        Row row{name, unit, {}};
        for (std::size_t i = 0; i < contenders.size(); ++i)
            row.entries.push_back(
                {contenders[i].name, summarize({figure(before[i], after[i])}), contenders[i].role});
        report.add(std::move(row));
    };
    const auto seconds = static_cast<double>(idle.count());
    using Use = const ProcessUse&;
    addRow("resident when idle", "MB", [](Use, Use use) { return use.residentMegabytes; });
    addRow("resident when idle, without parts of files", "MB",
           [](Use, Use use) { return use.anonymousMegabytes; });
    addRow("processor when idle", "%", [=](Use first, Use last) {
        return 100 * (last.cpuSeconds - first.cpuSeconds) / seconds;
    });
    addRow("context switches a second when idle", "1/s", [=](Use first, Use last) {
        return static_cast<double>(last.contextSwitches - first.contextSwitches) / seconds;
    });
}

} // namespace

int runStart(const Options& options, Report& report) {
    isolateNetwork();
    const ScratchFolder scratch;
    const std::filesystem::path& folder = scratch.path();
    ::setenv("QT_QPA_PLATFORM", "offscreen", 0);
    const std::vector<Contender> contenders = contendersIn(folder, report);
    report.add(measureStart(contenders, roundsOf(options, kDefaultRounds, kQuickRounds)));
    measureIdle(contenders, options.quick ? kQuickIdle : kIdle, report);
    return 0;
}

} // namespace bench
