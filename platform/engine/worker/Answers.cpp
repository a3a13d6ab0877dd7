// SPDX-License-Identifier: MIT
#include "worker/Answers.h"

#include <utility>
#include <variant>

#include "LibMediaPlayer/Result.h"
#include "probe/MediaFile.h"
#include "reader/Description.h"
#include "reader/DrawThumbnail.h"
#include "reader/Image.h"
#include "reader/OpenMedia.h"
#include "worker/Message.h"

namespace worker {

using namespace LibMediaPlayer;
using Files = std::vector<qns::UniqueFd>;

namespace {

template<typename... Records>
std::string message(int result, Records&&... records) {
    MessageWriter writer;
    writer(result);
    if (result == kOk)
        writer(records...);
    return writer.bytes();
}

int takeMedia(Files& files, probe::RegularFile& file) {
    return files.empty() ? static_cast<int>(kInternal) : file.adopt(std::move(files.front()));
}

std::string findDemuxers() {
    Demuxers demuxers;
    void* place = nullptr;
    while (const AVInputFormat* const format = av_demuxer_iterate(&place))
        demuxers.names += std::string(demuxers.names.empty() ? "" : ",") + format->name;
    return message(kOk, demuxers);
}

std::string look(Files& files) {
    probe::RegularFile file;
    if (const int result = takeMedia(files, file); result != kOk)
        return message(result);
    probe::LookResult seen = probe::lookAt(std::move(file));
    if (const auto* const failure = std::get_if<probe::LookFailure>(&seen))
        return message(failure->result);
    auto* const told = std::get_if<probe::MediaLook>(&seen);
    return message(kOk, Looked{told != nullptr, told ? std::move(*told) : probe::MediaLook{}});
}

std::string describe(Files& files) {
    probe::RegularFile file;
    std::unique_ptr<probe::MediaFile> pMedia;
    int result = takeMedia(files, file);
    if (result == kOk)
        result = reader::openMedia(std::move(file), probe::MediaFile::kLook, pMedia);
    return result == kOk ? message(result, reader::readDetails(*pMedia)) : message(result);
}

std::string draw(const Drawing& drawing, Files& files) {
    probe::RegularFile file;
    int result = files.size() == kMostFiles ? takeMedia(files, file) : static_cast<int>(kInternal);
    if (result == kOk)
        result =
            reader::drawImage(std::move(file), std::chrono::nanoseconds(drawing.position),
                              {drawing.width, drawing.height}, drawing.form, files.back().get());
    return message(result);
}

std::string drawThumbnail(Files& files) {
    probe::RegularFile file;
    if (const int result = takeMedia(files, file); result != kOk)
        return message(result);
    discoverer::Thumbnail thumbnail = reader::drawThumbnail(std::move(file));
    return message(thumbnail.result, thumbnail);
}

} // namespace

std::string answerWithLibav(Request& request, Files files) {
    switch (request.kind) {
    case Kind::kDemuxers:
        return findDemuxers();
    case Kind::kLook:
        return look(files);
    case Kind::kDescribe:
        return describe(files);
    case Kind::kDraw:
        return draw(request.drawing, files);
    case Kind::kThumbnail:
        return drawThumbnail(files);
    }
    return message(kInternal);
}

} // namespace worker
