// SPDX-License-Identifier: MIT
// Gives a worker whole files to read, and checks what it tells the daemon of them.
#include <string>
#include <sys/mman.h>
#include <unistd.h>
#include <utility>
#include <vector>

#include "LibMediaPlayer/Result.h"
#include "base/UniqueFd.h"
#include "fuzz/support/MetadataCheck.h"
#include "fuzz/support/Require.h"
#include "worker/Answers.h"
#include "worker/Channel.h"
#include "worker/Message.h"

namespace {

using fuzz::require;

qns::UniqueFd fileOf(const uint8_t* data, std::size_t size) {
    qns::UniqueFd file(::memfd_create("input", MFD_CLOEXEC));
    require(::write(file.get(), data, size) == static_cast<ssize_t>(size));
    return file;
}

/** The record when the worker has made one of the file. */
template<typename Record>
bool ask(worker::Kind kind, const uint8_t* data, std::size_t size, Record& record) {
    std::vector<qns::UniqueFd> files;
    files.push_back(fileOf(data, size));
    worker::Request request;
    request.kind = kind;
    const std::string answer = worker::answerWithLibav(request, std::move(files));
    require(answer.size() <= worker::kLargestMessage);
    worker::MessageReader message(answer);
    int result = LibMediaPlayer::kInternal;
    message(result);
    require(result >= LibMediaPlayer::kOk && result < LibMediaPlayer::kInternal);
    if (result == LibMediaPlayer::kOk)
        message(record);
    require(message.isGood());
    return result == LibMediaPlayer::kOk;
}

void requireSound(const probe::MediaLook& look) {
    require(!look.container.empty() && look.duration.time.count() >= 0);
    require(look.videoCount >= 0 && look.audioCount >= 0 && look.textCount >= 0);
    require(look.videoCount + look.audioCount > 0);
    require(look.video.has_value() == (look.videoCount > 0));
    require(look.audio.has_value() == (look.audioCount > 0));
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    worker::Looked looked;
    if (ask(worker::Kind::kLook, data, size, looked) && looked.isDecided)
        requireSound(looked.look);
    discoverer::Details details;
    if (ask(worker::Kind::kDescribe, data, size, details))
        fuzz::requireSound(details.info);
    return 0;
}
