// SPDX-License-Identifier: MIT
#include "probe/Signature.h"

#include <fstream>
#include <string>

#include <gtest/gtest.h>

#include "probe/AvTypes.h"
#include "probe/FrameHeader.h"
#include "tests/engine/Samples.h"
#include "tests/engine/truth/Truth.h"

using namespace std::string_literals;
using namespace std::string_view_literals;

namespace {

std::string beginningOf(const std::filesystem::path& path) {
    std::string head(probe::kSignatureReach, '\0');
    std::ifstream file(path, std::ios::binary);
    file.read(head.data(), static_cast<std::streamsize>(head.size()));
    head.resize(static_cast<std::size_t>(file.gcount()));
    if (const std::size_t tag = probe::sizeOfTag(head); tag > 0) {
        file.clear();
        file.seekg(static_cast<std::streamoff>(tag));
        head.resize(probe::kSignatureReach);
        file.read(head.data(), static_cast<std::streamsize>(head.size()));
        head.resize(static_cast<std::size_t>(file.gcount()));
    }
    return head;
}

/** What all formats together take it for. */
std::string probed(const std::filesystem::path& path) {
    AVFormatContext* context = nullptr;
    if (avformat_open_input(&context, path.c_str(), nullptr, nullptr) < 0)
        return {};
    std::string name = context->iformat->name;
    avformat_close_input(&context);
    return name;
}

std::string signatureOf(std::string_view head) {
    const char* const format = probe::formatBySignature(head);
    return format ? format : "";
}

class SignatureOf : public testing::TestWithParam<TrueMedium> {};

} // namespace

TEST_P(SignatureOf, IsWhatAllFormatsTogetherSay) {
    const auto path = truthPath(GetParam().name);
    const std::string format = signatureOf(beginningOf(path));
    if (GetParam().isRefused() || format.empty())
        return;
    EXPECT_EQ(format, probed(path));
    EXPECT_TRUE(avformat_version() > 0 && av_find_input_format(format.c_str()));
}

INSTANTIATE_TEST_SUITE_P(Engine, SignatureOf, testing::ValuesIn(trueMedia()),
                         [](const auto& instance) { return testName(instance.param.name); });

TEST(Signature, IsThereForWhatMostFilesAre) {
    for (const char* const name :
         {"h264.mp4", "h264.mkv", "vp9.webm", "mpeg4.avi", "h264.ts", "tagged.mp3", "constant.mp3",
          "headless.mp3", "cover.mp3", "cd.flac", "pcm.wav", "vorbis.ogg", "bare.aac", "bare.ac3",
          "glass.png"})
        EXPECT_NE(signatureOf(beginningOf(truthPath(name))), "") << name;
}

TEST(Signature, IsNotTakenFromTextOrPieces) {
    EXPECT_EQ(signatureOf(""), "");
    EXPECT_EQ(signatureOf("RIFF"), "");
    EXPECT_EQ(signatureOf("RIFF....no media"), "");
    EXPECT_EQ(signatureOf("\x1a\x45\xdf\xa3 of another kind"sv), "");
    EXPECT_EQ(signatureOf(std::string(probe::kSignatureReach, 'a')), "");
    EXPECT_EQ(signatureOf("\0\0\0\x0c"s + "ftypjp2 "), "");
    EXPECT_EQ(signatureOf(beginningOf(truthPath("constant.mp3")).substr(0, 1000)), "");
}

TEST(Signature, OfAMovingPngIsLeftToOthers) {
    const std::string still = "\x89PNG\r\n\x1a\n\0\0\0\rIHDR"s + std::string(17, '\0');
    EXPECT_EQ(signatureOf(still + "\0\0\0\1IDAT"s), "png_pipe");
    EXPECT_EQ(signatureOf(still + "\0\0\0\x08"s + "acTL" + std::string(12, '\0') + "IDAT"), "");
    EXPECT_EQ(signatureOf(still), "");
}

TEST(Signature, StandsBehindATag) {
    EXPECT_EQ(probe::sizeOfTag("ID3\x04\0\0\0\0\1\2"sv), 10U + 130);
    EXPECT_EQ(probe::sizeOfTag("ID3\x04\0\x10\0\0\1\2"sv), 20U + 130);
    EXPECT_EQ(probe::sizeOfTag("ID3\x04\0\0\0\0\1"sv), 0U);
    EXPECT_EQ(probe::sizeOfTag("TAG\x04\0\0\0\0\1\2"sv), 0U);
}

namespace {

/** Size, samples and rate; all 0 for what is no header. */
std::vector<int> fields(const std::optional<probe::FrameHeader>& header) {
    if (!header)
        return {0, 0, 0};
    return {static_cast<int>(header->size), header->samples, header->rate};
}

using Fields = std::vector<int>;

} // namespace

TEST(FrameHeader, OfMpegSound) {
    using probe::readMpegHeader;
    EXPECT_EQ(fields(readMpegHeader("\xff\xfb\x90\xc0"sv)), Fields({417, 1152, 44100}));
    EXPECT_EQ(fields(readMpegHeader("\xff\xfb\x92\xc0"sv)), Fields({418, 1152, 44100}));
    EXPECT_EQ(fields(readMpegHeader("\xff\xf3\x84\xc0"sv)), Fields({192, 576, 24000}));
    EXPECT_EQ(fields(readMpegHeader("\xff\xe3\x88\xc0"sv)), Fields({576, 576, 8000}));
    EXPECT_EQ(fields(readMpegHeader("\xff\xfd\xa4\xc0"sv)), Fields({576, 1152, 48000}));
    EXPECT_EQ(fields(readMpegHeader("\xff\xff\xc4\xc0"sv)), Fields({384, 384, 48000}));
    for (const std::string_view no :
         {"\xff\xfb\xf0\xc0"sv, "\xff\xfb\x00\xc0"sv, "\xff\xfb\x9c\xc0"sv, "\xff\xf9\x90\xc0"sv,
          "\xff\xeb\x90\xc0"sv, "\xff\x1b\x90\xc0"sv, "\xff\xfb\x90"sv})
        EXPECT_FALSE(readMpegHeader(no));
}

TEST(FrameHeader, OfAac) {
    using probe::readAdtsHeader;
    EXPECT_EQ(fields(readAdtsHeader("\xff\xf1\x50\x40\x2e\x7f\xfc"sv)), Fields({371, 1024, 44100}));
    EXPECT_EQ(fields(readAdtsHeader("\xff\xf9\x4c\x80\x2e\x7f\xfd"sv)), Fields({371, 2048, 48000}));
    for (const std::string_view no :
         {"\xff\xf3\x50\x40\x2e\x7f\xfc"sv, "\xff\xe1\x50\x40\x2e\x7f\xfc"sv,
          "\xff\xf1\x74\x40\x2e\x7f\xfc"sv, "\xff\xf1\x50\x40\x00\x7f\xfc"sv,
          "\xff\xf1\x50\x40\x2e\x7f"sv})
        EXPECT_FALSE(readAdtsHeader(no));
}

TEST(FrameHeader, OfAc3AndItsSuccessor) {
    using probe::readAc3Header;
    EXPECT_EQ(fields(readAc3Header("\x0b\x77\0\0\x1e\x40\xe1"sv)), Fields({1792, 1536, 48000}));
    EXPECT_EQ(fields(readAc3Header("\x0b\x77\0\0\x55\x40\xe1"sv)), Fields({836, 1536, 44100}));
    EXPECT_EQ(fields(readAc3Header("\x0b\x77\0\0\x1e\x48\xe1"sv)), Fields({1792, 1536, 24000}));
    EXPECT_EQ(fields(readAc3Header("\x0b\x77\x02\xff\x34\x80\xe1"sv)), Fields({1536, 1536, 48000}));
    EXPECT_EQ(fields(readAc3Header("\x0b\x77\x02\xff\x04\x80\xe1"sv)), Fields({1536, 256, 48000}));
    EXPECT_EQ(fields(readAc3Header("\x0b\x77\x42\xff\x34\x80\xe1"sv)), Fields({1536, 0, 48000}));
    EXPECT_EQ(fields(readAc3Header("\x0b\x77\x02\xff\xc4\x80\xe1"sv)), Fields({1536, 1536, 24000}));
    for (const std::string_view no :
         {"\x0b\x77\0\0\xde\x40\xe1"sv, "\x0b\x77\0\0\x26\x40\xe1"sv, "\x0b\x78\0\0\x1e\x40\xe1"sv,
          "\x0b\x77\0\0\x1e\x90\xe1"sv, "\x0b\x77\xc2\xff\x34\x80\xe1"sv, "\x0b\x77\0\0\x1e\x40"sv})
        EXPECT_FALSE(readAc3Header(no));
}
