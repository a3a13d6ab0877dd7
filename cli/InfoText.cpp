// SPDX-License-Identifier: MIT
#include "cli/InfoText.h"

#include <array>
#include <cstdio>

#include "cli/HumanTime.h"

using qnsmedia::AudioStream;
using qnsmedia::Metadata;
using qnsmedia::Ratio;
using qnsmedia::VideoStream;

namespace {

/** "  name        value"; nothing when there is no value. */
std::string line(const std::string& name, const std::string& value) {
    constexpr std::size_t kColumn = 14;
    if (value.empty())
        return {};
    std::string text = "  " + name + " ";
    text.resize(std::max(text.size(), kColumn), ' ');
    return text + value + '\n';
}

std::string number(double value) {
    std::array<char, 32> text{};
    std::snprintf(text.data(), text.size(), "%.5g", value);
    return text.data();
}

std::string bitRateText(int bitsPerSecond) {
    return bitsPerSecond > 0 ? ", " + number(bitsPerSecond / 1000) + " kb/s" : "";
}

std::string frameRateText(Ratio rate) {
    if (rate.numerator <= 0 || rate.denominator <= 0)
        return {};
    return ", " + number(static_cast<double>(rate.numerator) / rate.denominator) + " fps";
}

std::string videoText(const VideoStream& video) {
    std::string text =
        video.description + ", " + std::to_string(video.width) + "x" + std::to_string(video.height);
    if (video.pixelAspect.numerator != video.pixelAspect.denominator)
        text += ", pixels " + std::to_string(video.pixelAspect.numerator) + ":" +
                std::to_string(video.pixelAspect.denominator);
    text += frameRateText(video.frameRate) + (video.interlaced ? ", interlaced" : "");
    return text + bitRateText(video.bitRate);
}

std::string audioText(const AudioStream& audio) {
    std::string text = audio.description + ", " + std::to_string(audio.channels) +
                       (audio.channels == 1 ? " channel, " : " channels, ") +
                       std::to_string(audio.sampleRate) + " Hz";
    if (audio.depth > 0)
        text += ", " + std::to_string(audio.depth) + " bits";
    return text + bitRateText(audio.bitRate);
}

nlohmann::ordered_json ratioJson(Ratio ratio) {
    return {ratio.numerator, ratio.denominator};
}

nlohmann::ordered_json videoJson(const VideoStream& video) {
    return {{"media_type", video.mediaType},
            {"description", video.description},
            {"width", video.width},
            {"height", video.height},
            {"depth", video.depth},
            {"frame_rate", ratioJson(video.frameRate)},
            {"pixel_aspect", ratioJson(video.pixelAspect)},
            {"interlaced", video.interlaced},
            {"bit_rate", video.bitRate},
            {"max_bit_rate", video.maxBitRate},
            {"still_picture", video.stillPicture}};
}

nlohmann::ordered_json audioJson(const AudioStream& audio) {
    return {{"media_type", audio.mediaType},
            {"description", audio.description},
            {"channels", audio.channels},
            {"sample_rate", audio.sampleRate},
            {"depth", audio.depth},
            {"bit_rate", audio.bitRate},
            {"max_bit_rate", audio.maxBitRate}};
}

} // namespace

std::string infoText(const Metadata& metadata) {
    std::string text = line("container", metadata.mediaType);
    if (metadata.duration.count() > 0)
        text += line("duration", humanTime(metadata.duration));
    for (const VideoStream& video : metadata.video)
        text += line("video", videoText(video));
    for (const AudioStream& audio : metadata.audio)
        text += line("audio", audioText(audio));
    for (const auto& [name, value] : metadata.tags)
        text += line(name, value);
    return text;
}

nlohmann::ordered_json infoJson(const Metadata& metadata) {
    nlohmann::ordered_json object = {{"media_type", metadata.mediaType},
                                     {"duration_ns", metadata.duration.count()},
                                     {"seekable", metadata.seekable},
                                     {"live", metadata.live},
                                     {"tags", nlohmann::ordered_json::object()},
                                     {"video", nlohmann::ordered_json::array()},
                                     {"audio", nlohmann::ordered_json::array()}};
    for (const auto& [name, value] : metadata.tags)
        object["tags"][name] = value;
    for (const VideoStream& video : metadata.video)
        object["video"].push_back(videoJson(video));
    for (const AudioStream& audio : metadata.audio)
        object["audio"].push_back(audioJson(audio));
    return object;
}
