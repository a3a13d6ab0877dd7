// SPDX-License-Identifier: MIT
#include "probe/Tail.h"

#include <algorithm>
#include <optional>
#include <string_view>

#include "probe/Window.h"

namespace probe {

namespace {

using namespace std::string_view_literals;

struct Number {
    std::uint64_t value = 0;
    std::size_t size = 0; ///< bytes
};

/** A number whose first bit that is set tells its length. */
std::optional<Number> readNumber(std::string_view bytes) {
    constexpr std::size_t kLongest = 8;
    Number number;
    const unsigned int first = bytes.empty() ? 0 : static_cast<unsigned char>(bytes[0]);
    while (number.size < kLongest && (first & (0x80U >> number.size)) == 0)
        ++number.size;
    if (++number.size > std::min(kLongest, bytes.size()))
        return std::nullopt;
    number.value = first & (0xffU >> number.size);
    for (const char byte : bytes.substr(1, number.size - 1))
        number.value = number.value << 8 | static_cast<unsigned char>(byte);
    return number;
}

/** When a cluster begins, from the bytes behind its id; nothing when it is none. */
std::optional<std::int64_t> timeOfCluster(std::string_view bytes) {
    constexpr std::string_view kChecksum = "\xbf\x84"sv;
    constexpr std::size_t kChecksumSize = 6;
    const auto length = readNumber(bytes);
    if (!length)
        return std::nullopt;
    bytes.remove_prefix(length->size);
    if (bytes.substr(0, 2) == kChecksum)
        bytes.remove_prefix(std::min(kChecksumSize, bytes.size()));
    if (bytes.size() < 2 || bytes[0] != '\xe7')
        return std::nullopt;
    // The first bit tells that the number has one byte; without it, the result is too large.
    const std::size_t size = static_cast<unsigned char>(bytes[1]) ^ 0x80U;
    if (size > 7 || bytes.size() < size + 2)
        return std::nullopt;
    std::int64_t time = 0;
    for (const char byte : bytes.substr(2, size))
        time = time << 8 | static_cast<unsigned char>(byte);
    return time;
}

struct Cluster {
    std::int64_t place = 0;
    std::int64_t time = 0; ///< in the streams' time base
};

std::optional<Cluster> findCluster(FileInput& input, std::int64_t from) {
    constexpr std::string_view kId = "\x1f\x43\xb6\x75"sv;
    constexpr std::size_t kHeader = 32;
    constexpr std::size_t kPiece = 256 * 1024;
    Window window(input, kPiece);
    while (true) {
        const std::string_view bytes = window.at(from, kHeader);
        if (bytes.size() <= kId.size())
            return std::nullopt;
        const std::size_t found = bytes.find(kId);
        if (found == bytes.npos) {
            from += static_cast<std::int64_t>(bytes.size() - kId.size() + 1);
            continue;
        }
        from += static_cast<std::int64_t>(found);
        if (const auto time = timeOfCluster(window.at(from, kHeader).substr(kId.size())))
            return Cluster{from, *time};
        from += static_cast<std::int64_t>(kId.size());
    }
}

std::int64_t placeOfTail(const FileInput& input, std::int64_t reach) {
    return std::max<std::int64_t>(input.size() - reach, 0);
}

} // namespace

bool seekToTail(AVFormatContext& context, FileInput& input, std::int64_t reach) {
    return av_seek_frame(&context, -1, placeOfTail(input, reach), AVSEEK_FLAG_BYTE) >= 0;
}

bool seekToCluster(AVFormatContext& context, FileInput& input, std::int64_t reach) {
    const auto cluster = findCluster(input, placeOfTail(input, reach));
    if (!cluster || context.nb_streams == 0)
        return false;
    // The demuxer goes where its index says; behind the last entry it would read on.
    for (const int later : {0, 1})
        av_add_index_entry(context.streams[0], cluster->place, cluster->time + later, 0, 0,
                           AVINDEX_KEYFRAME);
    return av_seek_frame(&context, 0, cluster->time, AVSEEK_FLAG_BACKWARD | AVSEEK_FLAG_ANY) >= 0;
}

} // namespace probe
