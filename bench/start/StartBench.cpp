// SPDX-License-Identifier: MIT
// How soon the daemon serves, and what it needs while nobody asks: beside an empty QApplication,
// which is the least it can be, and beside another media daemon.
#include <chrono>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>
#include <thread>

#include "bench/Benches.h"
#include "bench/ChildProcess.h"
#include "bench/Programs.h"
#include "bench/Report.h"
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

/** All contenders side by side, for so many seconds without anything to do. */
void measureIdle(const std::vector<Contender>& contenders, std::chrono::seconds idle,
                 Report& report) {
    Row memory{"resident when idle", "MB", {}};
    Row own{"resident when idle, without parts of files", "MB", {}};
    Row load{"processor when idle", "%", {}};
    Row wakeUps{"context switches a second when idle", "1/s", {}};
    std::vector<ChildProcess> processes;
    for (const Contender& contender : contenders) {
        processes.push_back(ChildProcess::run(contender.command));
        connectTo(contender.port);
    }
    std::this_thread::sleep_for(kSettle);
    std::vector<ProcessUse> before;
    for (const ChildProcess& process : processes)
        before.push_back(readProcessUse(process.pid()));
    std::this_thread::sleep_for(idle);
    const auto seconds = static_cast<double>(idle.count());
    for (std::size_t i = 0; i < contenders.size(); ++i) {
        const ProcessUse after = readProcessUse(processes[i].pid());
        const auto add = [&](Row& row, double figure) {
            row.entries.push_back({contenders[i].name, summarize({figure}), contenders[i].role});
        };
        add(memory, after.residentMegabytes);
        add(own, after.anonymousMegabytes);
        add(load, 100 * (after.cpuSeconds - before[i].cpuSeconds) / seconds);
        add(wakeUps,
            static_cast<double>(after.contextSwitches - before[i].contextSwitches) / seconds);
    }
    for (Row* row : {&memory, &own, &load, &wakeUps})
        report.add(std::move(*row));
}

} // namespace

int runStart(const Options& options, Report& report) {
    isolateNetwork();
    const std::filesystem::path folder =
        std::filesystem::temp_directory_path() / ("qnsmedia-bench-" + std::to_string(::getpid()));
    ::setenv("QT_QPA_PLATFORM", "offscreen", 0);
    const std::vector<Contender> contenders = contendersIn(folder, report);
    report.add(measureStart(contenders, roundsOf(options, kDefaultRounds, kQuickRounds)));
    measureIdle(contenders, options.quick ? kQuickIdle : kIdle, report);
    std::filesystem::remove_all(folder);
    return 0;
}

} // namespace bench
