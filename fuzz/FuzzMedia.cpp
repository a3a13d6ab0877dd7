// SPDX-License-Identifier: MIT
// Gives a worker whole files to read, and checks what it tells the daemon of them.
#include <array>
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

/** The last byte of an input, which is not the file's: what is asked, and how the file is made. */
struct Control {
    explicit Control(uint8_t byte)
        : kind(byte & 3U),
          hasHole((byte & 4U) != 0),
          form(static_cast<discoverer::ImageForm>((byte >> 3U) % 3U)),
          side(byte >> 5U) {}

    unsigned int kind;
    bool hasHole;
    discoverer::ImageForm form;
    int32_t side;
};

struct Content {
    const uint8_t* data;
    std::size_t size;
    Control control;
};

/** Of large files only both ends are read: some get a hole in the middle. */
qns::UniqueFd fileOf(const Content& content) {
    constexpr off_t kHole = 300 * 1024;
    const std::size_t half = content.control.hasHole ? content.size / 2 : content.size;
    const std::size_t rest = content.size - half;
    qns::UniqueFd file(::memfd_create("input", MFD_CLOEXEC));
    require(::write(file.get(), content.data, half) == static_cast<ssize_t>(half));
    require(::pwrite(file.get(), content.data + half, rest, static_cast<off_t>(half) + kHole) ==
            static_cast<ssize_t>(rest));
    return file;
}

using Files = std::vector<qns::UniqueFd>;

/** The record when the worker has made one of the file. */
template<typename... Records>
bool ask(const worker::Request& request, Files files, Records&... records) {
    worker::Request asked = request;
    const std::string answer = worker::answerWithLibav(asked, std::move(files));
    require(answer.size() <= worker::kLargestMessage);
    worker::MessageReader message(answer);
    int result = LibMediaPlayer::kInternal;
    message(result);
    require(result >= LibMediaPlayer::kWrongState && result < LibMediaPlayer::kInternal);
    if (result == LibMediaPlayer::kOk)
        message(records...);
    require(message.isGood());
    return result == LibMediaPlayer::kOk;
}

Files filesOf(const Content& content) {
    Files files;
    files.push_back(fileOf(content));
    return files;
}

void requireSound(const probe::MediaLook& look) {
    require(!look.container.empty() && look.duration.time.count() >= 0);
    require(look.videoCount >= 0 && look.audioCount >= 0 && look.textCount >= 0);
    require(look.videoCount + look.audioCount > 0);
    require(look.video.has_value() == (look.videoCount > 0));
    require(look.audio.has_value() == (look.audioCount > 0));
}

void look(const Content& content) {
    worker::Looked looked;
    if (ask({worker::Kind::kLook, {}}, filesOf(content), looked) && looked.isDecided)
        requireSound(looked.look);
}

void describe(const Content& content) {
    discoverer::Details details;
    if (ask({worker::Kind::kDescribe, {}}, filesOf(content), details))
        fuzz::requireSound(details.info);
}

void draw(const Content& content) {
    const int32_t side = content.control.side;
    worker::Request request{worker::Kind::kDraw, {}};
    request.drawing = {static_cast<int64_t>(content.size) * 1'000'000, side, side,
                       content.control.form};
    Files files = filesOf(content);
    files.emplace_back(::memfd_create("output", MFD_CLOEXEC));
    const int output = ::dup(files.back().get());
    const qns::UniqueFd kept(output);
    const bool isDrawn = ask(request, std::move(files));
    const off_t size = ::lseek(output, 0, SEEK_END);
    const off_t pixels = static_cast<off_t>(side) * side * 4;
    require(isDrawn ? size > 0 : size == 0);
    require(!isDrawn || side == 0 || request.drawing.form != discoverer::ImageForm::kPixels ||
            size == pixels);
}

void drawThumbnail(const Content& content) {
    discoverer::Thumbnail thumbnail;
    if (ask({worker::Kind::kThumbnail, {}}, filesOf(content), thumbnail))
        require(thumbnail.jpeg.substr(0, 2) == "\xff\xd8");
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    if (size == 0)
        return 0;
    const Content content{data, size - 1, Control(data[size - 1])};
    constexpr std::array<void (*)(const Content&), 4> kQuestions{describe, look, draw,
                                                                 drawThumbnail};
    kQuestions.at(content.control.kind)(content);
    return 0;
}
