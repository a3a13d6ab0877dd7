// SPDX-License-Identifier: MIT
// What a listener waits for, beside libmpv in the same process: opening, seeking, closing, and
// by how much the rounds of a loop miss their time.
#include <algorithm>
#include <cmath>
#include <cstdio>
#include <cstdlib>
#include <filesystem>

#include "bench/Benches.h"
#include "bench/Report.h"
#include "bench/ScratchFolder.h"
#include "bench/player/PlayerPeer.h"

namespace bench {
namespace {

using namespace std::chrono_literals;

constexpr int kDefaultRounds = 15;
constexpr int kLoopRounds = 5;
constexpr int kQuickLoopRounds = 1;

/** Key frames lie two seconds apart: this is far from one, and a little behind one. */
constexpr Position kTargets[] = {11'700ms, 5'200ms};
constexpr Position kLoopStart = 6s;
constexpr Position kLoopEnd = 6500ms;

struct Contender {
    const char* name;
    std::unique_ptr<PlayerPeer> pPlayer;
};

/** What was measured of one contender with one file. */
struct Samples {
    std::vector<double> open;
    std::vector<double> keySeek;
    std::vector<double> exactSeek;
    std::vector<double> close;
    std::vector<double> loopError;
};

struct Measurement {
    const char* name;
    std::vector<double> Samples::*samples;
};

constexpr Measurement kMeasurements[] = {
    {"open to ready", &Samples::open},
    {"seek to key frame", &Samples::keySeek},
    {"seek exactly", &Samples::exactSeek},
    {"close", &Samples::close},
    {"loop: error a round", &Samples::loopError},
};

void measure(PlayerPeer& player, const std::string& path, Samples& samples) {
    samples.open.push_back(player.open(path).count());
    for (const Position target : kTargets) {
        samples.keySeek.push_back(player.seek(target, false).count());
        samples.exactSeek.push_back(player.seek(target + 400ms, true).count());
    }
    samples.close.push_back(player.close().count());
}

void measureLoop(PlayerPeer& player, const std::string& path, int rounds, Samples& samples) {
    player.open(path);
    const Milliseconds due = kLoopEnd - kLoopStart;
    for (const Milliseconds time : player.loop(kLoopStart, kLoopEnd, rounds))
        samples.loopError.push_back(std::abs((time - due).count()));
    player.close();
}

void addRows(Report& report, const std::string& what, const std::vector<Contender>& contenders,
             const std::vector<Samples>& samples) {
    for (const Measurement& measurement : kMeasurements) {
        Row row{what + ", " + measurement.name, "ms", {}};
        for (std::size_t i = 0; i < contenders.size(); ++i)
            row.entries.push_back({contenders[i].name, summarize(samples[i].*measurement.samples)});
        report.add(std::move(row));
    }
}

/** Every contender in turn, so that whatever the machine does meets them all. */
void measureFile(const std::filesystem::path& file, int rounds, int loopRounds,
                 const std::vector<Contender>& contenders, Report& report) {
    std::vector<Samples> samples(contenders.size());
    std::vector<Samples> unused(1);
    for (const Contender& contender : contenders) // what is read the first time only
        measure(*contender.pPlayer, file.string(), unused.front());
    for (int round = 0; round < rounds; ++round)
        for (std::size_t i = 0; i < contenders.size(); ++i)
            measure(*contenders[i].pPlayer, file.string(), samples[i]);
    for (std::size_t i = 0; i < contenders.size(); ++i)
        measureLoop(*contenders[i].pPlayer, file.string(), loopRounds, samples[i]);
    addRows(report, file.filename().string(), contenders, samples);
}

std::vector<std::filesystem::path> filesIn(const std::filesystem::path& folder) {
    std::vector<std::filesystem::path> files;
    for (const auto& entry : std::filesystem::directory_iterator(folder))
        files.push_back(entry.path());
    std::sort(files.begin(), files.end());
    return files;
}

} // namespace

int runPlayer(const Options& options, Report& report) {
    const ScratchFolder scratch;
    const std::filesystem::path& folder = scratch.path();
    const std::string make = std::string(QNS_MAKE_MEDIA) + " '" + folder.string() + "'";
    if (std::system(make.c_str()) != 0)
        return 1;
    std::vector<Contender> contenders;
    contenders.push_back({"engine", makeEnginePeer()});
    contenders.push_back({"libmpv", makeMpvPeer()});
    const int rounds = roundsOf(options, kDefaultRounds, 1);
    const int loopRounds = options.quick ? kQuickLoopRounds : kLoopRounds;
    for (const std::filesystem::path& file : filesIn(folder))
        measureFile(file, rounds, loopRounds, contenders, report);
    return 0;
}

} // namespace bench
