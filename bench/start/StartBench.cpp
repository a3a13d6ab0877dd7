// SPDX-License-Identifier: MIT
// How soon the daemon serves, and what it needs while nobody asks: beside an empty QApplication,
// which is the least it can be, and beside another media daemon.
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <string>
#include <thread>

#include "bench/Benches.h"
#include "bench/ChildProcess.h"
#include "bench/Report.h"
#include "bench/rpc/DaemonPeer.h"
#include "bench/rpc/PacketSocket.h"
#include "bench/start/ProcessUse.h"

namespace bench {
namespace {

using Clock = std::chrono::steady_clock;

constexpr int kDefaultRounds = 10;
constexpr std::chrono::seconds kSettle{2};
constexpr std::chrono::seconds kIdle{30};

struct Contender {
    std::string name;
    std::vector<std::string> command;
    uint16_t port;
};

double millisecondsToServe(const Contender& contender) {
    const auto start = Clock::now();
    const ChildProcess process = ChildProcess::run(contender.command);
    const qns::UniqueFd connection = connectTo(contender.port);
    return std::chrono::duration<double, std::milli>(Clock::now() - start).count();
}

Statistics once(double value) {
    return summarize({value});
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

} // namespace

int runStart(const Options& options, Report& report) {
    if (!enterOwnNetwork())
        std::fputs("qnsmedia-bench: no network of its own; using the machine's ports\n", stderr);
    const int rounds = options.rounds > 0 ? options.rounds : kDefaultRounds;
    const std::filesystem::path folder =
        std::filesystem::temp_directory_path() / ("qnsmedia-bench-" + std::to_string(::getpid()));
    const std::string mpdConfiguration = writeMpdConfiguration(folder);
    ::setenv("QT_QPA_PLATFORM", "offscreen", 0);

    const std::vector<Contender> contenders = {
        {"daemon", {programFolder() + "/QNSMediaService"}, 1008},
        {"empty QApplication", {programFolder() + "/bench-empty-application"}, 1009},
        {"MPD", {"mpd", "--no-daemon", mpdConfiguration}, 6600},
    };

    Row start{"exec to first accepted connection", "ms", {}};
    Row memory{"resident when idle", "MB", {}};
    Row cpu{"processor time in 30 idle seconds", "s", {}};
    Row wakeUps{"context switches in 30 idle seconds", "", {}};
    for (const Contender& contender : contenders)
        start.entries.push_back({contender.name, {}});

    std::vector<std::vector<double>> samples(contenders.size());
    for (int round = 0; round < rounds; ++round)
        for (std::size_t i = 0; i < contenders.size(); ++i)
            samples[i].push_back(millisecondsToServe(contenders[i]));
    for (std::size_t i = 0; i < contenders.size(); ++i)
        start.entries[i].figures = summarize(std::move(samples[i]));

    std::vector<ChildProcess> processes;
    for (const Contender& contender : contenders) {
        processes.push_back(ChildProcess::run(contender.command));
        connectTo(contender.port);
    }
    std::this_thread::sleep_for(kSettle);
    std::vector<ProcessUse> before;
    for (const ChildProcess& process : processes)
        before.push_back(readProcessUse(process.pid()));
    std::this_thread::sleep_for(kIdle);
    for (std::size_t i = 0; i < contenders.size(); ++i) {
        const ProcessUse after = readProcessUse(processes[i].pid());
        const std::string& name = contenders[i].name;
        memory.entries.push_back({name, once(after.residentMegabytes)});
        cpu.entries.push_back({name, once(after.cpuSeconds - before[i].cpuSeconds)});
        wakeUps.entries.push_back(
            {name, once(static_cast<double>(after.contextSwitches - before[i].contextSwitches))});
    }
    for (Row* row : {&start, &memory, &cpu, &wakeUps})
        report.add(std::move(*row));
    std::filesystem::remove_all(folder);
    return 0;
}

} // namespace bench
