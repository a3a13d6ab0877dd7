// SPDX-License-Identifier: MIT
// What it takes to get a collection of sound files into a library: through the daemon, beside two
// other daemons that keep one.
#include <algorithm>
#include <cstdio>
#include <cstdlib>
#include <filesystem>

#include "bench/Benches.h"
#include "bench/Programs.h"
#include "bench/Report.h"
#include "bench/ScratchFolder.h"
#include "bench/import/Collection.h"
#include "bench/import/Importers.h"
#include "bench/rpc/PacketSocket.h"

namespace bench {
namespace {

namespace fs = std::filesystem;

constexpr int kDefaultRounds = 3;
constexpr int kFiles = 2000;
constexpr int kQuickFiles = 200;
constexpr int kQuickCovers = 40; // thumbnails wait for an idle processor

struct Contender {
    std::string name;
    ImportFigures (*run)(const Collection& collection, const fs::path& scratch);
    std::vector<double> rates;
    std::vector<double> ratesWithThumbnails;
    std::vector<double> memory;
};

double rate(int files, double seconds) {
    return seconds > 0 ? files / seconds : 0;
}

void runOnce(Contender& contender, const Collection& collection, const fs::path& scratch) {
    fs::create_directories(scratch);
    const ImportFigures figures = contender.run(collection, scratch);
    if (figures.known != static_cast<int>(collection.files.size()))
        std::fprintf(stderr, "qnsmedia-bench: %s knows %d of %zu files\n", contender.name.c_str(),
                     figures.known, collection.files.size());
    contender.rates.push_back(rate(figures.known, figures.seconds));
    contender.ratesWithThumbnails.push_back(rate(figures.known, figures.secondsWithThumbnails));
    contender.memory.push_back(figures.peakMegabytes);
    fs::remove_all(scratch);
}

void addRows(const std::string& name, bool hasCovers, std::vector<Contender> contenders,
             Report& report) {
    Row speed{name, "1/s", {}, Better::kHigher};
    Row drawn{name + ", with thumbnails", "1/s", {}, Better::kHigher};
    Row memory{name + ", peak memory", "MB", {}};
    for (Contender& contender : contenders) {
        const bool isOurs = &contender == &contenders.front();
        drawn.entries.push_back(
            {contender.name, summarize(isOurs ? contender.ratesWithThumbnails : contender.rates)});
        speed.entries.push_back({contender.name, summarize(std::move(contender.rates))});
        memory.entries.push_back({contender.name, summarize(std::move(contender.memory))});
    }
    report.add(std::move(speed));
    if (hasCovers)
        report.add(std::move(drawn));
    report.add(std::move(memory));
}

/** One collection, all contenders in turn. */
void compare(const std::string& name, const CollectionPlan& plan, const fs::path& folder,
             int rounds, Report& report) {
    Collection collection{folder / "music", {}};
    collection.files = makeCollection(collection.folder, plan);
    ::sync();
    std::vector<Contender> contenders = {{"daemon", importByDaemon, {}, {}, {}}};
    if (takesPart("MPD", "mpd", report))
        contenders.push_back({"MPD", importByMpd, {}, {}, {}});
    if (takesPart("minidlna", "minidlnad", report))
        contenders.push_back({"minidlna", importByMinidlna, {}, {}, {}});
    for (int round = 0; round < rounds; ++round)
        for (Contender& contender : contenders)
            runOnce(contender, collection, folder / "scratch");
    addRows(name, plan.hasCovers, std::move(contenders), report);
    fs::remove_all(collection.folder);
}

} // namespace

int runImport(const Options& options, Report& report) {
    isolateNetwork();
    ::setenv("QT_QPA_PLATFORM", "offscreen", 0);
    const int rounds = roundsOf(options, kDefaultRounds, 1);
    const int files = options.quick ? kQuickFiles : kFiles;
    const ScratchFolder scratch;
    const fs::path& folder = scratch.path();
    const std::vector<std::string>& parts = options.arguments;
    const auto wanted = [&](const char* part) {
        return parts.empty() || std::find(parts.begin(), parts.end(), part) != parts.end();
    };
    for (const char* const ending : {"mp3", "flac", "ogg", "m4a", "wav"}) {
        if (wanted(ending))
            compare("import of " + std::string(ending), {files, {ending}, false}, folder, rounds,
                    report);
    }
    if (wanted("covers"))
        compare("import of mp3 with covers", {options.quick ? kQuickCovers : kFiles, {"mp3"}, true},
                folder, rounds, report);
    return 0;
}

} // namespace bench
