// SPDX-License-Identifier: MIT
#include "tests/daemon/support/PageEngine.h"

#include <map>
#include <utility>

#include <gmock/gmock.h>

#include "tests/daemon/support/PlayerClient.h"
#include "tests/engine_double/MetadataText.h"

namespace {

constexpr int kDiscoverers = 11;
constexpr std::int64_t kDuration = 10'000'000'000;

std::string filmAnswer() {
    LibMediaPlayer::MediaMetaInfo info;
    info.system = {"video/mp4", L"TITLE=Film\n", true, false, kDuration};
    info.videoCount = 1;
    info.video = {"video/x-h264", L"H.264", 640,       360,  24, 25, 1, 1, 1,
                  false,          800'000,  1'000'000, false};
    info.audioCount = 1;
    info.audio[0] = {"audio/mpeg", L"AAC", 2, 48'000, 0, 128'000, 128'000};
    return script::metadataAnswer(0, info);
}

} // namespace

/** A call of the engine: how it begins, and what is answered. */
struct PageEngine::Call {
    EngineScript PageEngine::*script;
    std::string beginning;
    std::string answer = "return 0";
};

void PageEngine::addTo(DaemonOptions& options) const {
    options.environment["QNS_ENGINE_DOUBLE"] = mPlayer.address();
    options.environment["QNS_DISCOVERER_DOUBLE"] = mDiscoverers.address();
    options.environment["QNS_IMPORTER_DOUBLE"] = mImporter.address();
}

void PageEngine::expectCreation() {
    for (int number = 0; number < kDiscoverers - 1; ++number)
        mDiscoverers.expectCall("discoverer " + std::to_string(number) + " create");
    mImporter.expectCall("importer create");
    mDiscoverers.expectCall("discoverer 10 create");
    mPlayer.expectCall("player create null 15");
}

void PageEngine::carryOut(const PageBlock& request) {
    for (const auto& [script, beginning, answer] : callsFor(request)) {
        EXPECT_THAT((this->*script).nextCall(), testing::StartsWith(beginning));
        (this->*script).answer(answer);
    }
    if (request.service == "player")
        mOpen = request.method != request::kClosePlayer &&
                (mOpen || request.method == request::kOpenPlayer);
}

const std::vector<PageEngine::Call>& PageEngine::callsFor(const PageBlock& request) const {
    constexpr auto kPlayer = &PageEngine::mPlayer;
    constexpr auto kDiscoverer = &PageEngine::mDiscoverers;
    constexpr auto kImporter = &PageEngine::mImporter;
    static const std::map<std::pair<std::string, long>, std::vector<Call>> kCalls{
        {{"player", 1}, {{kPlayer, "player open \"/"}, {kPlayer, "player close"}}},
        {{"player", 2}, {{kPlayer, "player open \"/media/film.mp4\" 2"}}},
        {{"player", 3}, {{kPlayer, "player close"}}},
        {{"player", 4}, {{kPlayer, "player play"}}},
        {{"player", 5}, {{kPlayer, "player pause"}}},
        {{"player", 6}, {{kPlayer, "player seek 1500000000 0"}}},
        {{"player", 7}, {{kPlayer, "player status", "return 3 1500000000 10000000000"}}},
        {{"player", 8}, {{kPlayer, "player repeat true 1000000000 2000000000"}}},
        {{"player", 9}, {{kPlayer, "player destroy"}}},
        {{"discoverer", 2}, {{kDiscoverer, "discoverer 0 open \"/media/film.mp4\""}}},
        {{"discoverer", 3}, {{kDiscoverer, "discoverer 0 close"}}},
        {{"discoverer", 4}, {{kDiscoverer, "discoverer 0 metadata", filmAnswer()}}},
        {{"discoverer", 5},
         {{kDiscoverer, "discoverer 0 metadata", filmAnswer()},
          {kDiscoverer, "discoverer 0 makeImage 1500000000 320 0 \"/srv/film.jpg\""}}},
        {{"discoverer", 6}, {{kDiscoverer, "discoverer 0 extensions", "return 0 \"mkv,mp4\" 2"}}},
        {{"importer", 2},
         {{kDiscoverer, "discoverer 10 open \"/media/film.mp4\""},
          {kDiscoverer, "discoverer 10 metadata", filmAnswer()},
          {kDiscoverer, "discoverer 10 close"},
          {kImporter, "importer import \"/media/film.mp4\" \"Films\""}}},
        {{"importer", 3}, {{kImporter, "importer cancel"}}},
        {{"importer", 4}, {{kImporter, "importer status", "return 1 0 1000000"}}},
    };
    static const std::vector<Call> kNone;
    const bool answeredByTheDaemon =
        request.service == "player" && request.method == request::kGetPlayerStatus && !mOpen;
    const auto calls = kCalls.find({request.service, request.method});
    return answeredByTheDaemon || calls == kCalls.end() ? kNone : calls->second;
}

void PageEngine::notify(const PageBlock& notification) {
    if (notification.service == "importer")
        mImporter.notifyImport({3, 0, L"/media/film.mp4"});
    else if (notification.kind == "packet")
        mPlayer.notify({3, 0, L"", 0, 0, 0, 0, 0, kDuration});
    else
        mPlayer.notify({1, 0, L"/media/film.mp4", 1, 2, 0, 1, 0, kDuration});
}
