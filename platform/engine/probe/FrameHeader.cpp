// SPDX-License-Identifier: MIT
#include "probe/FrameHeader.h"

#include <algorithm>
#include <iterator>

namespace probe {

namespace {

/** Fields of a header as its format's description numbers them: bit 0 is the first. */
class Bits {
public:
    explicit Bits(std::string_view bytes) {
        for (std::size_t index = 0; index < sizeof mBits; ++index)
            mBits =
                mBits << 8 | (index < bytes.size() ? static_cast<unsigned char>(bytes[index]) : 0U);
    }

    [[nodiscard]] unsigned int get(int first, int count) const {
        return static_cast<unsigned int>(mBits << first >> (64 - count));
    }

private:
    std::uint64_t mBits = 0;
};

/** kb/s, for the first version by layer and for the later ones by whether it is layer I. */
constexpr int kMpegBitRates[][15] = {
    {0, 32, 64, 96, 128, 160, 192, 224, 256, 288, 320, 352, 384, 416, 448},
    {0, 32, 48, 56, 64, 80, 96, 112, 128, 160, 192, 224, 256, 320, 384},
    {0, 32, 40, 48, 56, 64, 80, 96, 112, 128, 160, 192, 224, 256, 320},
    {0, 32, 48, 56, 64, 80, 96, 112, 128, 144, 160, 176, 192, 224, 256},
    {0, 8, 16, 24, 32, 40, 48, 56, 64, 80, 96, 112, 128, 144, 160}};

constexpr int kMpegRates[] = {44100, 48000, 32000};

constexpr int kAacRates[] = {96000, 88200, 64000, 48000, 44100, 32000, 24000,
                             22050, 16000, 12000, 11025, 8000,  7350};

constexpr int kAc3Rates[] = {48000, 44100, 32000};

/** kb/s. */
constexpr int kAc3BitRates[] = {32,  40,  48,  56,  64,  80,  96,  112, 128, 160,
                                192, 224, 256, 320, 384, 448, 512, 576, 640};

constexpr int kAc3Block = 256;
constexpr unsigned int kLastOfAc3 = 10; // version
constexpr unsigned int kLaterKinds = 1U << 16;

struct MpegVersion {
    bool isFirst = false;
    int divisor = 1; ///< of the sampling rate
};

std::optional<MpegVersion> mpegVersion(unsigned int code) {
    switch (code) {
    case 0:
        return MpegVersion{false, 4};
    case 2:
        return MpegVersion{false, 2};
    case 3:
        return MpegVersion{true, 1};
    default:
        return std::nullopt;
    }
}

unsigned int ac3Version(const Bits& bits) {
    return bits.get(40, 5);
}

std::optional<FrameHeader> readFirstAc3(const Bits& bits) {
    constexpr unsigned int kUsual = 8; // later ones halve the rate
    const unsigned int rate = bits.get(32, 2);
    const unsigned int size = bits.get(34, 6);
    const unsigned int version = ac3Version(bits);
    if (rate >= std::size(kAc3Rates) || size / 2 >= std::size(kAc3BitRates))
        return std::nullopt;
    FrameHeader header;
    // 1536 samples in words of 16 bits; at 44.1 kHz every other frame is a word longer.
    const int words = kAc3BitRates[size / 2] * 96'000 / kAc3Rates[rate];
    header.size = 2U * (static_cast<unsigned int>(words) + (rate == 1 ? size & 1U : 0U));
    header.samples = 6 * kAc3Block;
    header.rate = kAc3Rates[rate] >> (std::max(version, kUsual) - kUsual);
    header.kind = version << 2 | rate;
    return header;
}

std::optional<FrameHeader> readLaterAc3(const Bits& bits) {
    constexpr int kBlocks[] = {1, 2, 3, 6};
    const unsigned int rate = bits.get(32, 2);
    const unsigned int second = bits.get(34, 2); // blocks, or another table of rates
    const bool isReduced = rate == 3;
    if (bits.get(16, 2) == 3 || (isReduced && second == 3))
        return std::nullopt;
    const bool goesWithAnother = bits.get(16, 2) == 1 || bits.get(18, 3) != 0;
    FrameHeader header;
    header.size = (bits.get(21, 11) + 1) * 2U;
    header.rate = isReduced ? kAc3Rates[second] / 2 : kAc3Rates[rate];
    header.samples = goesWithAnother ? 0 : kAc3Block * (isReduced ? 6 : kBlocks[second]);
    header.kind = kLaterKinds + static_cast<unsigned int>(header.rate);
    return header;
}

} // namespace

std::optional<FrameHeader> readMpegHeader(std::string_view bytes) {
    constexpr std::size_t kSize = 4;
    constexpr unsigned int kSync = 0x7ff;
    const Bits bits(bytes);
    const auto version = mpegVersion(bits.get(11, 2));
    const unsigned int layer = 4 - bits.get(13, 2);
    const unsigned int rate = bits.get(20, 2);
    const unsigned int bitRate = bits.get(16, 4);
    if (bytes.size() < kSize || bits.get(0, 11) != kSync || !version || layer > 3 || rate > 2 ||
        bitRate == 0 || bitRate == 15)
        return std::nullopt;
    const auto& bitRates = kMpegBitRates[version->isFirst ? layer - 1 : layer == 1 ? 3 : 4];
    FrameHeader header;
    header.rate = kMpegRates[rate] / version->divisor;
    header.samples = layer == 1 ? 384 : layer == 3 && !version->isFirst ? 576 : 1152;
    const int slot = layer == 1 ? 4 : 1; // bytes by which frames differ
    const int slots = header.samples / 8 / slot * bitRates[bitRate] * 1000 / header.rate;
    header.size =
        static_cast<std::size_t>(slot) * (static_cast<std::size_t>(slots) + bits.get(22, 1));
    header.kind = bits.get(11, 4) << 2 | rate;
    return header;
}

std::optional<FrameHeader> readAdtsHeader(std::string_view bytes) {
    constexpr std::size_t kSize = 7;
    constexpr unsigned int kSync = 0xfff;
    const Bits bits(bytes);
    const unsigned int rate = bits.get(18, 4);
    FrameHeader header;
    header.size = bits.get(30, 13);
    if (bytes.size() < kSize || bits.get(0, 12) != kSync || bits.get(13, 2) != 0 ||
        rate >= std::size(kAacRates) || header.size < kSize)
        return std::nullopt;
    header.rate = kAacRates[rate];
    header.samples = 1024 * static_cast<int>(bits.get(54, 2) + 1);
    header.kind = bits.get(16, 6) << 1 | bits.get(12, 1);
    return header;
}

std::optional<FrameHeader> readAc3Header(std::string_view bytes) {
    constexpr unsigned int kSync = 0x0b77;
    constexpr unsigned int kLast = 16;
    const Bits bits(bytes);
    if (bytes.size() < kLongestHeader || bits.get(0, 16) != kSync || ac3Version(bits) > kLast)
        return std::nullopt;
    return ac3Version(bits) <= kLastOfAc3 ? readFirstAc3(bits) : readLaterAc3(bits);
}

bool isEnhancedAc3(std::string_view header) {
    return ac3Version(Bits(header)) > kLastOfAc3;
}

} // namespace probe
