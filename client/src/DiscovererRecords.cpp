// SPDX-License-Identifier: MIT
#include "client/src/DiscovererRecords.h"

#include <algorithm>
#include <limits>
#include <sstream>
#include <utility>

#include "client/src/Requests.h"

namespace qnsmedia {
namespace {

/** There is no room for more in an answer. */
constexpr int kMostStreams = 64;

void readStream(ArgumentReader& block, VideoStream& stream) {
    block.read(stream.mediaType);
    block.read(stream.description);
    for (int* const field : {&stream.width, &stream.height, &stream.depth,
                             &stream.frameRate.numerator, &stream.frameRate.denominator,
                             &stream.pixelAspect.numerator, &stream.pixelAspect.denominator})
        block.read(*field);
    block.read(stream.interlaced);
    block.read(stream.bitRate);
    block.read(stream.maxBitRate);
    block.read(stream.stillPicture);
}

void readStream(ArgumentReader& block, AudioStream& stream) {
    block.read(stream.mediaType);
    block.read(stream.description);
    for (int* const field :
         {&stream.channels, &stream.sampleRate, &stream.depth, &stream.bitRate, &stream.maxBitRate})
        block.read(*field);
}

/** The count stands behind the block, and its size once more between. */
template<typename Stream>
bool readStreams(ArgumentReader& arguments, std::vector<Stream>& streams) {
    std::string bytes;
    int size = 0;
    arguments.readBytes(bytes);
    arguments.read(size);
    const std::optional<int> count = readInteger(arguments);
    if (!count)
        return false;
    streams.resize(static_cast<std::size_t>(std::clamp(*count, 0, kMostStreams)));
    ArgumentReader block(bytes.data(), static_cast<long>(bytes.size()));
    for (Stream& stream : streams)
        readStream(block, stream);
    return true;
}

std::vector<std::pair<std::string, std::string>> splitTags(const std::string& lines) {
    std::vector<std::pair<std::string, std::string>> tags;
    std::istringstream stream(lines);
    for (std::string line; std::getline(stream, line);) {
        const std::size_t equals = line.find('=');
        if (equals != std::string::npos)
            tags.emplace_back(line.substr(0, equals), line.substr(equals + 1));
    }
    return tags;
}

/** A failure that the engine had no code for is still one. */
Outcome outcome(int failed, int engineResult) {
    if (failed == 0)
        return {0};
    constexpr int kNotAvailable = 5;
    return {engineResult != 0 ? engineResult : kNotAvailable};
}

} // namespace

std::optional<Outcome> readImageOutcome(ArgumentReader& arguments) {
    int failed = 0;
    arguments.read(failed);
    const std::optional<int> result = readInteger(arguments);
    if (!result)
        return std::nullopt;
    return outcome(failed, *result);
}

std::optional<std::vector<std::string>> readExtensions(ArgumentReader& arguments) {
    std::string list;
    int reserved = 0;
    arguments.read(list);
    arguments.read(reserved);
    if (!readInteger(arguments))
        return std::nullopt;
    std::vector<std::string> extensions;
    std::istringstream stream(list);
    for (std::string extension; std::getline(stream, extension, ',');)
        extensions.push_back(extension);
    return extensions;
}

std::optional<MetadataAnswer> readMetadata(ArgumentReader& arguments) {
    MetadataAnswer answer;
    int failed = 0;
    int result = 0;
    std::string tags;
    std::int64_t duration = 0;
    arguments.read(failed);
    arguments.read(result);
    arguments.read(answer.metadata.mediaType);
    arguments.read(tags);
    arguments.read(answer.metadata.seekable);
    arguments.read(answer.metadata.live);
    arguments.read(duration);
    if (!readStreams(arguments, answer.metadata.video) ||
        !readStreams(arguments, answer.metadata.audio))
        return std::nullopt;
    answer.outcome = outcome(failed, result);
    answer.metadata.duration = Nanoseconds(duration);
    answer.metadata.tags = splitTags(tags);
    return answer;
}

} // namespace qnsmedia
