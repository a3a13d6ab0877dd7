// SPDX-License-Identifier: MIT
#include "probe/Signature.h"

#include <algorithm>
#include <iterator>

#include "probe/FrameHeader.h"

namespace probe {

namespace {

using namespace std::string_view_literals;

struct Signature {
    const char* format;
    std::string_view first;
    std::size_t place = 0; ///< of the second
    std::string_view second = {};
};

constexpr Signature kSignatures[] = {
    {"flac", "fLaC"sv},
    {"ogg", "OggS\0"sv},
    {"avi", "RIFF"sv, 8, "AVI "sv},
    {"wav", "RIFF"sv, 8, "WAVE"sv},
    {"webp_pipe", "RIFF"sv, 8, "WEBP"sv},
    {"aiff", "FORM"sv, 8, "AIFF"sv},
    {"aiff", "FORM"sv, 8, "AIFC"sv},
    {"au", ".snd\0\0"sv},
    {"gif", "GIF89a"sv},
    {"gif", "GIF87a"sv},
    {"asf", "\x30\x26\xb2\x75\x8e\x66\xcf\x11\xa6\xd9\x00\xaa\x00\x62\xce\x6c"sv},
};

bool stands(std::string_view head, std::string_view what, std::size_t place) {
    return place <= head.size() && head.substr(place, what.size()) == what;
}

bool stands(std::string_view head, const Signature& signature) {
    return stands(head, signature.first, 0) && stands(head, signature.second, signature.place);
}

/** JPEG's containers look the same but for the brand. */
bool isMp4(std::string_view head) {
    return stands(head, "ftyp"sv, 4) && !stands(head, "j"sv, 8);
}

/** The name of what an EBML file holds is among its first fields. */
bool isMatroska(std::string_view head) {
    constexpr std::size_t kReach = 64;
    const std::string_view header = head.substr(0, kReach);
    return stands(head, "\x1a\x45\xdf\xa3"sv, 0) &&
           (header.find("matroska"sv) != header.npos || header.find("webm"sv) != header.npos);
}

/** So many packets in a row are no chance. */
bool isTransportStream(std::string_view head) {
    constexpr std::size_t kPacket = 188;
    constexpr std::size_t kPackets = 16;
    if (head.size() < kPacket * kPackets)
        return false;
    for (std::size_t packet = 0; packet < kPackets; ++packet) {
        if (head[packet * kPacket] != 'G')
            return false;
    }
    return true;
}

/** Still or moving: a moving one says so before its first picture. */
const char* kindOfPng(std::string_view head) {
    if (!stands(head, "\x89PNG\r\n\x1a\n"sv, 0))
        return nullptr;
    const std::size_t picture = head.find("IDAT"sv);
    if (picture == head.npos || head.substr(0, picture).find("acTL"sv) != head.npos)
        return nullptr;
    return "png_pipe";
}

/** Each frame says where the next one begins. */
bool isSound(std::string_view head, ReadHeader& read) {
    constexpr int kFrames = 5;
    const auto first = read(head);
    for (int count = 0; count < kFrames; ++count) {
        const auto header = read(head);
        if (!header || header->kind != first->kind || header->size > head.size())
            return false;
        head.remove_prefix(header->size);
    }
    return true;
}

} // namespace

std::size_t sizeOfTag(std::string_view head) {
    constexpr std::size_t kHeader = 10;
    constexpr std::size_t kFlags = 5;
    constexpr unsigned int kHasFooter = 0x10;
    if (head.size() < kHeader || !stands(head, "ID3"sv, 0))
        return 0;
    std::size_t size = 0;
    for (const char byte : head.substr(kFlags + 1, 4))
        size = size << 7 | (static_cast<unsigned char>(byte) & 0x7fU);
    const bool hasFooter = (static_cast<unsigned char>(head[kFlags]) & kHasFooter) != 0;
    return size + kHeader * (hasFooter ? 2 : 1);
}

const char* formatBySignature(std::string_view head) {
    const auto* const found =
        std::find_if(std::begin(kSignatures), std::end(kSignatures),
                     [&](const Signature& signature) { return stands(head, signature); });
    if (found != std::end(kSignatures))
        return found->format;
    if (isMp4(head))
        return "mov,mp4,m4a,3gp,3g2,mj2";
    if (isMatroska(head))
        return "matroska,webm";
    if (isTransportStream(head))
        return "mpegts";
    if (isSound(head, readMpegHeader))
        return "mp3";
    if (isSound(head, readAdtsHeader))
        return "aac";
    if (isSound(head, readAc3Header))
        return isEnhancedAc3(head) ? "eac3" : "ac3";
    return kindOfPng(head);
}

} // namespace probe
