// SPDX-License-Identifier: MIT
// Several discoverers that share the reading of a collection, through the daemon and without it.
#include <algorithm>
#include <filesystem>
#include <functional>
#include <memory>

#include "bench/Benches.h"
#include "bench/ChildProcess.h"
#include "bench/Programs.h"
#include "bench/ScratchFolder.h"
#include "bench/import/Collection.h"
#include "bench/media/Readers.h"
#include "bench/rpc/PacketSocket.h"
#include "bench/scale/CurveBuilder.h"
#include "bench/scale/Scales.h"

namespace bench {
namespace {

namespace fs = std::filesystem;

constexpr int kDefaultRounds = 5;
constexpr int kFiles = 500;
constexpr int kQuickFiles = 100;
constexpr int kMostDiscoverers = 10; ///< that the daemon gives to clients

struct Contender {
    const char* name;
    Role role;
    std::function<std::unique_ptr<MediaReader>()> makeReader;
};

double filesPerSecond(const Contender& contender, int discoverers,
                      const std::vector<std::string>& files) {
    std::vector<std::unique_ptr<MediaReader>> team;
    for (int i = 0; i < discoverers; ++i)
        team.emplace_back(contender.makeReader())->read(files.front()); // starts what it needs
    std::for_each(files.begin(), files.end(), touch);
    return static_cast<double>(files.size()) / readSideBySide(team, files);
}

void compare(const std::vector<Contender>& contenders, const std::vector<std::string>& files,
             int rounds, Report& report) {
    std::vector<int> places;
    for (int discoverers = 1; discoverers <= kMostDiscoverers; ++discoverers)
        places.push_back(discoverers);
    CurveBuilder rates({"files described", "1/s", "discoverers", places, {}, Better::kHigher});
    for (const Contender& contender : contenders)
        rates.addLine(contender.name, contender.role);
    for (int round = 0; round < rounds; ++round)
        for (std::size_t place = 0; place < places.size(); ++place)
            for (std::size_t i = 0; i < contenders.size(); ++i)
                rates.samples(i, place).push_back(
                    filesPerSecond(contenders[i], places[place], files));
    report.add(rates.finish());
}

} // namespace

bool measureDiscoverers(const Options& options, Report& report) {
    isolateNetwork();
    const ScratchFolder scratch;
    const fs::path& folder = scratch.path();
    const std::vector<std::string> files = makeCollection(
        folder,
        {options.quick ? kQuickFiles : kFiles, {"mp3", "flac", "ogg", "m4a", "wav"}, false});
    const ChildProcess daemon = ChildProcess::run({programFolder() + "/QNSMediaService"});
    connectTo(1008);
    qnsmedia::Connection connection;
    compare({{"daemon", Role::ours, [&] { return makeDaemonReader(connection); }},
             {"engine alone", Role::floor, [] { return makeEngineReader(); }}},
            files, roundsOf(options, kDefaultRounds, 1), report);
    return true;
}

} // namespace bench
