// SPDX-License-Identifier: MIT
#include <memory>
#include <sstream>

#include <gmock/gmock.h>

#include "LibMediaPlayer/IMediaDiscoverer.h"
#include "LibMediaPlayer/InterfaceFactory.h"
#include "LibMediaPlayer/Result.h"
#include "tests/engine/CommandOutput.h"
#include "tests/engine/Samples.h"
#include "tests/engine/TestPlayer.h"
#include "tests/engine/truth/Truth.h"

using namespace LibMediaPlayer;
using nlohmann::json;

namespace {

/** Encoders begin and end with a little silence of their own. */
constexpr double kPadding = 0.06;

std::string narrow(const std::wstring& text) {
    std::string bytes;
    for (const wchar_t wide : text)
        bytes += static_cast<char>(wide);
    return bytes;
}

std::wstring fromUtf8(const std::string& text) {
    std::wstring wide;
    for (std::size_t index = 0; index < text.size();) {
        const auto first = static_cast<unsigned char>(text[index]);
        const std::size_t length = first < 0x80 ? 1 : first < 0xe0 ? 2 : first < 0xf0 ? 3 : 4;
        unsigned int code = length == 1 ? first : first & (0x7fU >> length);
        for (std::size_t next = 1; next < length; ++next)
            code = code << 6 | (static_cast<unsigned char>(text[index + next]) & 0x3fU);
        wide += static_cast<wchar_t>(code);
        index += length;
    }
    return wide;
}

std::vector<std::wstring> linesOf(const std::wstring& text) {
    std::vector<std::wstring> lines;
    std::wstringstream stream(text);
    for (std::wstring line; std::getline(stream, line);)
        lines.push_back(line);
    return lines;
}

class Discovery : public testing::TestWithParam<TrueMedium> {
protected:
    Discovery() : mpDiscoverer(InterfaceFactory::createDiscoverer()) {}

    [[nodiscard]] static std::wstring path() { return truthPath(GetParam().name).wstring(); }
    [[nodiscard]] static const json& truth() { return GetParam().fields; }

    MediaMetaInfo discover() {
        EXPECT_EQ(mpDiscoverer->open(path()), kOk);
        MediaMetaInfo info;
        EXPECT_EQ(mpDiscoverer->metadata(info), kOk);
        return info;
    }

    const std::unique_ptr<IMediaDiscoverer> mpDiscoverer;
};

json told(const VideoMetaInfo& video) {
    return {{"type", video.mediaType},
            {"width", video.width},
            {"height", video.height},
            {"depth", video.depth},
            {"frameRate", {video.frameRateNumerator, video.frameRateDenominator}},
            {"pixelAspect", {video.pixelAspectNumerator, video.pixelAspectDenominator}},
            {"interlaced", video.interlaced},
            {"still", video.stillPicture}};
}

json told(const AudioMetaInfo& audio) {
    return {{"type", audio.mediaType},
            {"channels", audio.channels},
            {"rate", audio.sampleRate},
            {"depth", audio.depth}};
}

json toldSounds(const MediaMetaInfo& info) {
    json sounds = json::array();
    for (int index = 0; index < info.audioCount; ++index)
        sounds.push_back(told(info.audio.at(static_cast<std::size_t>(index))));
    return sounds;
}

double seconds(int64_t nanoseconds) {
    return static_cast<double>(nanoseconds) / 1e9;
}

} // namespace

TEST_P(Discovery, TellsWhatTheFileWasMadeWith) {
    if (GetParam().isRefused()) {
        EXPECT_EQ(mpDiscoverer->open(path()), truth().at("result"));
        MediaMetaInfo info;
        EXPECT_EQ(mpDiscoverer->metadata(info), truth().at("result"));
        return;
    }
    const MediaMetaInfo info = discover();
    if (truth().contains("type")) {
        EXPECT_EQ(info.system.mediaType, truth().at("type"));
        EXPECT_NEAR(seconds(info.system.duration), truth().at("seconds").get<double>(), kPadding);
        EXPECT_EQ(info.system.seekable, truth().at("seekable"));
        EXPECT_FALSE(info.system.live);
        EXPECT_EQ(info.videoCount, GetParam().hasVideo() ? 1 : 0);
        EXPECT_EQ(GetParam().hasVideo() ? told(info.video) : json(), truth().at("video"));
        EXPECT_EQ(toldSounds(info), truth().at("audio"));
    }
    if (truth().contains("tags")) {
        std::vector<std::wstring> tags = linesOf(info.system.tags);
        ASSERT_GE(tags.size(), truth().at("tags").size());
        for (std::size_t index = 0; index < truth().at("tags").size(); ++index)
            EXPECT_EQ(tags[index], fromUtf8(truth().at("tags")[index])) << index;
    }
}

TEST_P(Discovery, AgreesWithThePlayer) {
    TestPlayer player;
    const auto opened = player.open(truthPath(GetParam().name));
    if (GetParam().isRefused()) {
        EXPECT_EQ(opened.result, truth().at("result"));
        return;
    }
    ASSERT_EQ(opened.result, kOk) << narrow(opened.text);
    const MediaMetaInfo info = discover();
    EXPECT_EQ(opened.param1, info.videoCount);
    EXPECT_EQ(std::min(opened.param2, 8), info.audioCount);
    EXPECT_EQ((opened.uvalue1 & 1U) != 0, info.system.seekable);
    EXPECT_NEAR(valueOf(opened).count(), seconds(info.system.duration), kPadding);
}

TEST_P(Discovery, AgreesWithFfprobe) {
    const std::string output = outputOf("ffprobe -v quiet -of json -show_format -show_streams '" +
                                        truthPath(GetParam().name).string() + "' 2>/dev/null");
    if (GetParam().isRefused())
        return;
    const json probed = json::parse(output);
    const MediaMetaInfo info = discover();
    int audioCount = 0;
    for (const json& stream : probed.at("streams")) {
        if (stream.at("codec_type") == "audio") {
            if (audioCount < info.audioCount) {
                const auto& audio = info.audio.at(static_cast<std::size_t>(audioCount));
                EXPECT_EQ(audio.channels, stream.at("channels"));
                EXPECT_EQ(std::to_string(audio.sampleRate), stream.at("sample_rate"));
            }
            ++audioCount;
        } else if (stream.at("disposition").at("attached_pic") == 0) {
            EXPECT_EQ(info.video.width, stream.at("width"));
            EXPECT_EQ(info.video.height, stream.at("height"));
        }
    }
    EXPECT_EQ(info.audioCount, std::min(audioCount, 8));
}

INSTANTIATE_TEST_SUITE_P(Engine, Discovery, testing::ValuesIn(trueMedia()),
                         [](const auto& instance) { return testName(instance.param.name); });

TEST(Discoverer, TellsLayersOfMpegSoundApart) {
    const std::unique_ptr<IMediaDiscoverer> pDiscoverer(InterfaceFactory::createDiscoverer());
    for (const auto& [name, layer] :
         {std::pair("bare.mp2", L"MP2"), std::pair("headless.mp3", L"MP3"),
          std::pair("constant.mp3", L"MP3")}) {
        MediaMetaInfo info;
        ASSERT_EQ(pDiscoverer->open(truthPath(name).wstring()), kOk);
        ASSERT_EQ(pDiscoverer->metadata(info), kOk);
        EXPECT_EQ(info.audio[0].description.substr(0, 3), layer) << name;
    }
}

TEST(Discoverer, ReckonsTheBitRateOfBareSoundFromAllOfIt) {
    const std::unique_ptr<IMediaDiscoverer> pDiscoverer(InterfaceFactory::createDiscoverer());
    for (const char* const name : {"bare.aac", "bare.ac3", "headless.mp3"}) {
        MediaMetaInfo info;
        ASSERT_EQ(pDiscoverer->open(truthPath(name).wstring()), kOk);
        ASSERT_EQ(pDiscoverer->metadata(info), kOk);
        const double bits = 8.0 * static_cast<double>(std::filesystem::file_size(truthPath(name)));
        EXPECT_NEAR(info.audio[0].bitRate, bits / seconds(info.system.duration), 1) << name;
    }
}

TEST(Discoverer, ThereAreFiftyFilesAtLeast) {
    EXPECT_GE(trueMedia().size(), 50U);
}
