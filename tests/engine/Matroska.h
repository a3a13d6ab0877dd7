// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>

/** Files of one stream and one packet of zeros, whose headers can tell anything. */
namespace matroska {

inline std::string bigEndian(std::uint64_t value, int bytes) {
    std::string text;
    while (bytes-- > 0)
        text += static_cast<char>(value >> (8 * bytes));
    return text;
}

inline std::string element(std::uint32_t id, const std::string& content) {
    constexpr std::uint64_t kEightByteSize = 1ULL << 56;
    const int idBytes = id > 0xffffff ? 4 : id > 0xffff ? 3 : id > 0xff ? 2 : 1;
    return bigEndian(id, idBytes) + bigEndian(content.size() | kEightByteSize, 8) + content;
}

inline std::string number(std::uint32_t id, std::uint64_t value) {
    return element(id, bigEndian(value, 8));
}

inline std::string track(int type, const std::string& codec, const std::string& parameters) {
    return element(0xae, number(0xd7, 1) + number(0x73c5, 1) +
                             number(0x83, static_cast<std::uint64_t>(type)) + element(0x86, codec) +
                             parameters);
}

inline std::string soundTrack(std::uint32_t channels) {
    return track(2, "A_PCM/INT/LIT", element(0xe1, number(0x9f, channels) + number(0x6264, 16)));
}

inline std::string filmTrack(std::uint32_t width, std::uint32_t height) {
    return track(1, "V_VP8", element(0xe0, number(0xb0, width) + number(0xba, height)));
}

/** `duration` is the bits of a double, in milliseconds. */
inline std::string file(const std::string& track, std::uint64_t duration = 0x40b3880000000000) {
    const std::string packet = std::string("\x81\0\0\x80", 4) + std::string(64, '\0');
    return element(0x1a45dfa3, element(0x4282, "matroska")) +
           element(0x18538067,
                   element(0x1549a966, number(0x2ad7b1, 1'000'000) + number(0x4489, duration)) +
                       element(0x1654ae6b, track) +
                       element(0x1f43b675, number(0xe7, 0) + element(0xa3, packet)));
}

} // namespace matroska
