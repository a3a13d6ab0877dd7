// SPDX-License-Identifier: MIT
#include "worker/Media.h"

#include <utility>

#include "LibMediaPlayer/Result.h"
#include "text/Text.h"
#include "worker/Message.h"

namespace worker {

using namespace LibMediaPlayer;
using namespace std::chrono_literals;

namespace {

/** Sanitizers make the start of a program take many times as long. */
#ifdef QNS_SANITIZED
constexpr int kStartFactor = 5;
#else
constexpr int kStartFactor = 1;
#endif

/**
 * Half a second more than the worker allows itself, so that only one that hangs is too late. With
 * the time to start one an answer comes within five seconds.
 */
constexpr Process::Patience kLookPatience{kStartFactor * 2700ms, 2000ms};
constexpr Process::Patience kDrawPatience{kStartFactor * 700ms, 4000ms};

/** Nobody waits for a thumbnail, and its worker runs only when nothing else does. */
constexpr Process::Patience kThumbnailPatience{10s, 10s};

struct Nothing {};

template<typename Message>
void fields(Message& /*message*/, Nothing& /*nothing*/) {}

// A worker that a file has taken over can answer anything.

bool isResult(int result) {
    return result >= kWrongState && result <= kInternal;
}

template<typename Reply>
bool isPossible(const Reply& /*reply*/) {
    return true;
}

/** With all else that is told of a file they must fit into one answer to a client. */
constexpr std::size_t kTextBytes = 18 * 1024;

std::size_t textBytes(const MediaMetaInfo& info) {
    const auto bytesOf = [](const std::string& type, const std::wstring& text) {
        return type.size() + engine::toUtf8(text).size();
    };
    std::size_t bytes = bytesOf(info.system.mediaType, info.system.tags) +
                        bytesOf(info.video.mediaType, info.video.description);
    for (const AudioMetaInfo& audio : info.audio)
        bytes += bytesOf(audio.mediaType, audio.description);
    return bytes;
}

bool isPossible(const discoverer::Details& details) {
    const MediaMetaInfo& info = details.info;
    return info.videoCount >= 0 && info.videoCount <= 1 && info.audioCount >= 0 &&
           info.audioCount <= static_cast<std::int32_t>(info.audio.size()) &&
           textBytes(info) <= kTextBytes;
}

template<typename Reply>
int ask(Pool& pool, const Pool::Question& question, Reply& reply) {
    int result = kInternal;
    const int outcome = pool.ask(question, [&](std::string_view bytes) {
        MessageReader message(bytes);
        message(result);
        if (result == kOk)
            message(reply);
        return message.isGood() && isResult(result) && isPossible(reply);
    });
    return outcome == kOk ? result : outcome;
}

} // namespace

probe::LookResult lookAt(const std::string& path, Pool& pool) {
    probe::RegularFile file;
    if (const int result = file.open(path); result != kOk)
        return probe::LookFailure{result};
    Looked looked;
    const int result = ask(pool, {{Kind::kLook, {}}, {file.fd.get()}, kLookPatience, path}, looked);
    if (result != kOk)
        return probe::LookFailure{result};
    if (!looked.isDecided)
        return probe::LookUndecided{};
    return std::move(looked.look);
}

int describe(const probe::RegularFile& file, const std::string& name, discoverer::Details& details,
             Pool& pool) {
    return ask(pool, {{Kind::kDescribe, {}}, {file.fd.get()}, kLookPatience, name}, details);
}

int draw(const std::string& path, const Drawing& drawing, int output, Pool& pool) {
    probe::RegularFile file;
    if (const int result = file.open(path); result != kOk)
        return result;
    Nothing nothing;
    return ask(pool, {{Kind::kDraw, drawing}, {file.fd.get(), output}, kDrawPatience, path},
               nothing);
}

discoverer::Thumbnail drawThumbnail(const std::string& path, Pool& pool) {
    discoverer::Thumbnail thumbnail;
    probe::RegularFile file;
    thumbnail.result = file.open(path);
    if (thumbnail.result == kOk)
        thumbnail.result = ask(
            pool, {{Kind::kThumbnail, {}}, {file.fd.get()}, kThumbnailPatience, path}, thumbnail);
    return thumbnail;
}

int findDemuxers(std::string& names, Pool& pool) {
    Demuxers demuxers;
    const int result = ask(pool, {{Kind::kDemuxers, {}}, {}, kLookPatience, "no file"}, demuxers);
    names = std::move(demuxers.names);
    return result;
}

} // namespace worker
