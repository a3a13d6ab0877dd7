// SPDX-License-Identifier: MIT
// What it takes to learn what files are and to get pictures of them: through the daemon, beside
// the libraries called directly and the commands that people use.
#include <algorithm>
#include <chrono>
#include <cstdlib>
#include <deque>
#include <filesystem>
#include <fstream>
#include <functional>
#include <memory>
#include <nlohmann/json.hpp>

#include "bench/Benches.h"
#include "bench/ChildProcess.h"
#include "bench/Programs.h"
#include "bench/Report.h"
#include "bench/ScratchFolder.h"
#include "bench/media/Readers.h"
#include "bench/rpc/PacketSocket.h"

namespace bench {
namespace {

using Clock = std::chrono::steady_clock;

constexpr int kDefaultRounds = 5;

struct Contender {
    std::string name;
    Role role;
    std::function<void(const std::string& path)> work;
};

double milliseconds(const std::function<void()>& work) {
    const auto begin = Clock::now();
    work();
    return std::chrono::duration<double, std::milli>(Clock::now() - begin).count();
}

Row rowOf(const std::string& name, const std::vector<Contender>& contenders,
          std::vector<std::vector<double>> samples) {
    Row row{name, "ms", {}};
    for (std::size_t i = 0; i < contenders.size(); ++i)
        row.entries.push_back(
            {contenders[i].name, summarize(std::move(samples[i])), contenders[i].role});
    return row;
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
    return rowOf(name, contenders, std::move(medians));
}

/** The same, but each has one file again and again before the next contender has it. */
Row compareRepeated(const std::string& name, const std::vector<std::string>& files, int rounds,
                    const std::vector<Contender>& contenders) {
    std::vector<std::vector<double>> medians(contenders.size());
    for (const std::string& file : files)
        for (std::size_t i = 0; i < contenders.size(); ++i) {
            std::vector<double> samples;
            for (int round = 0; round < rounds * 5; ++round) {
                touch(file);
                samples.push_back(milliseconds([&] { contenders[i].work(file); }));
            }
            medians[i].push_back(summarize(std::move(samples)).median);
        }
    return rowOf(name, contenders, std::move(medians));
}

/** The files that can be read, and of these those that are films of two seconds. */
struct MediaSet {
    std::filesystem::path folder;
    std::vector<std::string> all;
    std::vector<std::string> films;
};

MediaSet makeMedia(const std::filesystem::path& folder) {
    const std::string make = std::string(QNS_MAKE_TRUTH) + " '" + folder.string() + "' 2>/dev/null";
    MediaSet set{folder, {}, {}};
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

/** The engine beside the library that it could have left the work to. */
void compareLibraries(const MediaSet& set, int rounds, Report& report) {
    const auto engine = makeEngineReader();
    const auto workerless = makeWorkerlessReader();
    const auto libav = makeLibavReader();
    const std::vector<Contender> contenders = {
        {"engine", Role::ours, [&](const std::string& path) { engine->read(path); }},
        {"without a worker", Role::floor, [&](const std::string& path) { workerless->read(path); }},
        {"libavformat", Role::peer, [&](const std::string& path) { libav->read(path); }}};
    report.add(compareRepeated("metadata by the engine, repeated", set.all, rounds, contenders));
    report.add(compare("metadata by the engine", set.all, rounds, contenders));
}

void compareReaders(qnsmedia::Connection& connection, const MediaSet& set, int rounds,
                    Report& report) {
    std::deque<std::unique_ptr<MediaReader>> readers;
    std::vector<Contender> contenders;
    const auto add = [&](const char* name, Role role, std::unique_ptr<MediaReader> reader) {
        MediaReader& kept = *readers.emplace_back(std::move(reader));
        contenders.push_back({name, role, [&kept](const std::string& path) { kept.read(path); }});
    };
    add("daemon", Role::ours, makeDaemonReader(connection));
    add("engine alone", Role::floor, makeEngineReader());
    if (takesPart("ffprobe", "ffprobe", report))
        add("ffprobe", Role::peer,
            makeCommandReader(
                {"ffprobe", "-v", "quiet", "-of", "json", "-show_format", "-show_streams"}));
    if (takesPart("mediainfo", "mediainfo", report))
        add("mediainfo", Role::peer, makeCommandReader({"mediainfo", "--Output=JSON"}));
    report.add(compare("metadata of a file", set.all, rounds, contenders));
}

/** The first picture is a key frame. */
void compareDrawers(qnsmedia::Connection& connection, const std::string& name, int second,
                    const MediaSet& set, int rounds, Report& report) {
    const auto daemon = makeDaemonDrawer(connection);
    const auto thumbnailer = makeThumbnailerDrawer();
    const std::string target = (set.folder / "picture.jpg").string();
    const auto with = [&](const std::unique_ptr<PictureDrawer>& drawer) {
        return [&drawer, &target, second](const std::string& path) {
            drawer->draw(path, second, target);
        };
    };
    std::vector<Contender> contenders = {{"daemon", Role::ours, with(daemon)}};
    if (takesPart("ffmpegthumbnailer", "ffmpegthumbnailer", report))
        contenders.push_back({"ffmpegthumbnailer", Role::peer, with(thumbnailer)});
    report.add(compare(name, set.films, rounds, contenders));
}

} // namespace

int runMedia(const Options& options, Report& report) {
    isolateNetwork();
    const ScratchFolder scratch;
    const std::filesystem::path& folder = scratch.path();
    const MediaSet set = makeMedia(folder);
    if (set.all.empty())
        return 1;
    const int rounds = roundsOf(options, kDefaultRounds, 1);
    compareLibraries(set, rounds, report);
    const ChildProcess daemon = ChildProcess::run({programFolder() + "/QNSMediaService"});
    connectTo(1008);
    qnsmedia::Connection connection; // the only one: the daemon knows an identity once
    compareReaders(connection, set, rounds, report);
    compareDrawers(connection, "picture of a key frame", 0, set, rounds, report);
    compareDrawers(connection, "picture between key frames", 1, set, rounds, report);
    return 0;
}

} // namespace bench
