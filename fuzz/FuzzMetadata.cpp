// SPDX-License-Identifier: MIT
// Makes tags, streams and their parameters of an input, as a demuxer could tell them, and checks
// what becomes of them on the way to a client.
#include <algorithm>
#include <array>
#include <cstring>
#include <iterator>
#include <memory>
#include <string>
#include <sys/mman.h>
#include <unistd.h>
#include <utility>
#include <variant>
#include <vector>

#include "LibMediaPlayer/Result.h"
#include "base/UniqueFd.h"
#include "fuzz/support/Input.h"
#include "fuzz/support/MetadataCheck.h"
#include "fuzz/support/Require.h"
#include "probe/MediaFile.h"
#include "reader/Description.h"
#include "reader/MediaTypes.h"
#include "reader/TagText.h"
#include "text/Text.h"

namespace {

using fuzz::Input;
using fuzz::require;

/** A tenth of a second of silence. */
std::string soundFile() {
    constexpr uint32_t kRate = 8000;
    constexpr uint32_t kSize = kRate / 10;
    const auto number = [](auto value) {
        return std::string(reinterpret_cast<const char*>(&value), sizeof value);
    };
    return "RIFF" + number(kSize + 36) + "WAVEfmt " + number(uint32_t{16}) + number(uint16_t{1}) +
           number(uint16_t{1}) + number(kRate) + number(kRate) + number(uint16_t{1}) +
           number(uint16_t{8}) + "data" + number(kSize) + std::string(kSize, '\x80');
}

std::unique_ptr<probe::MediaFile> openSound() {
    static const std::string bytes = soundFile();
    qns::UniqueFd memory(::memfd_create("sound", MFD_CLOEXEC));
    require(::write(memory.get(), bytes.data(), bytes.size()) ==
            static_cast<ssize_t>(bytes.size()));
    probe::RegularFile file;
    require(file.adopt(std::move(memory)) == LibMediaPlayer::kOk);
    auto opened = probe::MediaFile::open(std::move(file));
    require(opened.index() == 0);
    return std::get<0>(std::move(opened));
}

/** Names that mean something, and any others. */
std::string tagName(Input& input) {
    constexpr std::array<const char*, 8> kNames{
        "title",       "album_artist",      "track",  "major_brand", "DURATION",
        "ALBUMARTIST", "compatible_brands", "COMMENT"};
    const std::size_t choice = input.byte() % (2 * kNames.size());
    return choice < kNames.size() ? kNames.at(choice) : input.bytes(choice);
}

void addTags(Input& input, AVDictionary*& dictionary) {
    for (int left = input.byte() % 32; left > 0 && !input.isEmpty(); --left) {
        const std::string name = tagName(input);
        std::string value = input.bytes(input.byte());
        // Longer than any input, so that the bounds are met.
        if (const auto times = input.byte(); times > 200)
            for (int doubled = times - 200; doubled > 0 && value.size() < 4096; --doubled)
                value += value;
        av_dict_set(&dictionary, name.c_str(), value.c_str(), AV_DICT_DONT_OVERWRITE);
    }
}

AVCodecID codecId(Input& input) {
    static const std::vector<AVCodecID> all = [] {
        std::vector<AVCodecID> ids;
        const AVCodecDescriptor* codec = nullptr;
        while ((codec = avcodec_descriptor_next(codec)))
            ids.push_back(codec->id);
        return ids;
    }();
    return all.at(input.number<uint16_t>() % all.size());
}

AVRational ratio(Input& input) {
    const int numerator = input.number<int>();
    return {numerator, input.number<int>()};
}

void fillStream(Input& input, AVStream& stream) {
    AVCodecParameters& known = *stream.codecpar;
    constexpr std::array<AVMediaType, 4> kTypes{AVMEDIA_TYPE_VIDEO, AVMEDIA_TYPE_AUDIO,
                                                AVMEDIA_TYPE_SUBTITLE, AVMEDIA_TYPE_DATA};
    known.codec_type = kTypes.at(input.byte() % kTypes.size());
    known.codec_id = codecId(input);
    const int formats = known.codec_type == AVMEDIA_TYPE_AUDIO ? AV_SAMPLE_FMT_NB : AV_PIX_FMT_NB;
    known.profile = input.number<int8_t>();
    known.width = input.number<int>();
    known.height = input.number<int>();
    known.format = input.byte() % formats - 1; // -1: unknown
    known.field_order = static_cast<AVFieldOrder>(input.byte() % (AV_FIELD_BT + 1));
    known.bit_rate = input.number<int64_t>();
    known.bits_per_raw_sample = input.number<int>();
    known.sample_rate = input.number<int>();
    known.ch_layout = {};
    known.ch_layout.nb_channels = input.number<int>();
    stream.disposition = input.byte() % 2 == 0 ? 0 : AV_DISPOSITION_ATTACHED_PIC;
    stream.avg_frame_rate = ratio(input);
    stream.r_frame_rate = ratio(input);
    stream.sample_aspect_ratio = ratio(input);
    stream.duration = input.number<int64_t>();
}

void fillContext(Input& input, AVFormatContext& context) {
    addTags(input, context.metadata);
    for (int left = input.byte() % 12; left > 0 && !input.isEmpty(); --left) {
        AVStream* const stream = avformat_new_stream(&context, nullptr);
        fillStream(input, *stream);
        addTags(input, stream->metadata);
    }
    context.duration = input.number<int64_t>();
}

/** Of Ogg, whose streams carry the tags, and of another. */
void requireTagsOf(Input& input) {
    for (const char* const format : {"ogg", "mp3"}) {
        Input again = input;
        probe::FormatContext context(probe::kAdopt, avformat_alloc_context());
        context->iformat = av_find_input_format(format);
        fillContext(again, *context.get());
        fuzz::requireTags(reader::tagText(*context.get()));
        context->iformat = nullptr;
    }
}

void requireText(const std::string& bytes) {
    const std::wstring text = engine::fromUtf8(bytes);
    require(text.size() <= bytes.size());
    const std::string back = engine::toUtf8(text);
    require(engine::fromUtf8(back) == text);
    const std::wstring name = engine::toWide(bytes);
    require(name.size() <= bytes.size());
    if (text.find(0xfffd) == std::wstring::npos)
        require(back == bytes && name == text && engine::toBytes(name) == bytes);
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    Input input(data, size);
    requireText(input.block());
    requireTagsOf(input);
    const auto pFile = openSound();
    fillContext(input, pFile->context());
    fuzz::requireSound(reader::readDetails(*pFile).info);
    return 0;
}
