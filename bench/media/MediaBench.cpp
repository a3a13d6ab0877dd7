// SPDX-License-Identifier: MIT
// What it takes to learn what files are and to get pictures of them: through the daemon, beside
// the libraries called directly and the commands that people use.
#include <algorithm>
#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <fcntl.h>
#include <filesystem>
#include <fstream>
#include <functional>
#include <nlohmann/json.hpp>
#include <sys/stat.h>
#include <unistd.h>

#include "bench/Benches.h"
#include "bench/ChildProcess.h"
#include "bench/Report.h"
#include "bench/media/Readers.h"
#include "bench/rpc/DaemonPeer.h"
#include "bench/rpc/PacketSocket.h"

namespace bench {
namespace {

using Clock = std::chrono::steady_clock;

constexpr int kDefaultRounds = 5;

struct Contender {
    std::string name;
    std::function<void(const std::string& path)> work;
};

double milliseconds(const std::function<void()>& work) {
    const auto begin = Clock::now();
    work();
    return std::chrono::duration<double, std::milli>(Clock::now() - begin).count();
}

/** The engine remembers what it has read, unless it has just changed. */
void touch(const std::string& file) {
    ::utimensat(AT_FDCWD, file.c_str(), nullptr, 0);
}

/** Each contender's median for each file, all of them in turn. */
Row compare(const std::string& name, const std::vector<std::string>& files, int rounds,
            const std::vector<Contender>& contenders) {
    std::vector<std::vector<double>> medians(contenders.size());
    for (const std::string& file : files) {
        std::vector<std::vector<double>> samples(contenders.size());
        for (int round = 0; round < rounds; ++round)
            for (std::size_t i = 0; i < contenders.size(); ++i) {
                touch(file);
                samples[i].push_back(milliseconds([&] { contenders[i].work(file); }));
            }
        for (std::size_t i = 0; i < contenders.size(); ++i)
            medians[i].push_back(summarize(std::move(samples[i])).median);
    }
    Row row{name, "ms", {}};
    for (std::size_t i = 0; i < contenders.size(); ++i)
        row.entries.push_back({contenders[i].name, summarize(std::move(medians[i]))});
    return row;
}

/** The files that can be read, and of these those that are films of two seconds. */
struct MediaSet {
    std::vector<std::string> all;
    std::vector<std::string> films;
};

MediaSet makeMedia(const std::filesystem::path& folder) {
    const std::string make = std::string(QNS_MAKE_TRUTH) + " '" + folder.string() + "' 2>/dev/null";
    MediaSet set;
    if (std::system(make.c_str()) != 0)
        return set;
    std::ifstream file(folder / "truth.json");
    const auto truth = nlohmann::json::parse(file);
    for (const auto& [name, fields] : truth.items()) {
        if (fields.contains("result"))
            continue;
        const std::string path = (folder / name).string();
        set.all.push_back(path);
        const bool moves = fields.value("video", nlohmann::json()) != nullptr &&
                           fields.value("seconds", 0.0) >= 2 && fields.value("seconds", 0.0) < 3;
        if (moves)
            set.films.push_back(path);
    }
    return set;
}

Row compareReaders(qnsmedia::Connection& connection, const MediaSet& set, int rounds) {
    const auto daemon = makeDaemonReader(connection);
    const auto engine = makeEngineReader();
    const auto libav = makeLibavReader();
    const auto ffprobe = makeCommandReader(
        {"ffprobe", "-v", "quiet", "-of", "json", "-show_format", "-show_streams"});
    const auto mediainfo = makeCommandReader({"mediainfo", "--Output=JSON"});
    const auto with = [](const std::unique_ptr<MediaReader>& reader) {
        return [&reader](const std::string& path) { reader->read(path); };
    };
    return compare("metadata of a file", set.all, rounds,
                   {{"engine", with(engine)},
                    {"daemon", with(daemon)},
                    {"libavformat", with(libav)},
                    {"ffprobe", with(ffprobe)},
                    {"mediainfo", with(mediainfo)}});
}

/** The first picture is a key frame. */
Row compareDrawers(qnsmedia::Connection& connection, const std::string& name, int second,
                   const MediaSet& set, int rounds, const std::filesystem::path& folder) {
    const auto daemon = makeDaemonDrawer(connection);
    const auto thumbnailer = makeThumbnailerDrawer();
    const std::string target = (folder / "picture.jpg").string();
    const auto with = [&](const std::unique_ptr<PictureDrawer>& drawer) {
        return [&drawer, &target, second](const std::string& path) {
            drawer->draw(path, second, target);
        };
    };
    return compare(name, set.films, rounds,
                   {{"daemon", with(daemon)}, {"thumbnailer", with(thumbnailer)}});
}

Row compareTeams(qnsmedia::Connection& connection, const MediaSet& set, int rounds) {
    Row row{"files a second with so many discoverers", "1/s", {}, Better::kHigher};
    for (const std::size_t discoverers : {1U, 2U, 4U, 8U, 10U}) {
        std::vector<double> rates;
        for (int round = 0; round < rounds; ++round) {
            std::for_each(set.all.begin(), set.all.end(), touch);
            rates.push_back(static_cast<double>(set.all.size()) /
                            readSideBySide(connection, set.all, discoverers));
        }
        row.entries.push_back({std::to_string(discoverers), summarize(std::move(rates))});
    }
    return row;
}

} // namespace

int runMedia(const Options& options, Report& report) {
    if (!enterOwnNetwork())
        std::fputs("qnsmedia-bench: no network of its own; using the machine's ports\n", stderr);
    const std::filesystem::path folder =
        std::filesystem::temp_directory_path() / ("qnsmedia-bench-" + std::to_string(::getpid()));
    const MediaSet set = makeMedia(folder);
    if (set.all.empty())
        return 1;
    const int rounds = options.rounds > 0 ? options.rounds : kDefaultRounds;
    const ChildProcess daemon = ChildProcess::run({programFolder() + "/QNSMediaService"});
    connectTo(1008);
    qnsmedia::Connection connection; // the only one: the daemon knows an identity once
    report.add(compareReaders(connection, set, rounds));
    report.add(compareDrawers(connection, "picture of a key frame", 0, set, rounds, folder));
    report.add(compareDrawers(connection, "picture between key frames", 1, set, rounds, folder));
    report.add(compareTeams(connection, set, rounds));
    std::filesystem::remove_all(folder);
    return 0;
}

} // namespace bench
