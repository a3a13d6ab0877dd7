// SPDX-License-Identifier: MIT
#include "probe/Duration.h"

#include <algorithm>
#include <iterator>
#include <string_view>
#include <vector>

#include "probe/Fragments.h"
#include "probe/MediaFile.h"
#include "probe/SoundWalk.h"
#include "probe/Tail.h"

namespace probe {

namespace {

constexpr AVRational kNanoseconds{1, 1'000'000'000};

/** What one stream's packets have told, in its own time base. */
class StreamTime {
public:
    void add(const AVPacket& packet) {
        mSum += std::max<std::int64_t>(packet.duration, 0);
        if (packet.pts == AV_NOPTS_VALUE) {
            mEnd += mStamped ? packet.duration : 0;
            return;
        }
        mFirst = mStamped ? std::min(mFirst, packet.pts) : packet.pts;
        const std::int64_t end = packet.pts + packet.duration;
        mEnd = mStamped ? std::max(mEnd, end) : end;
        mStamped = true;
    }

    [[nodiscard]] std::int64_t length() const { return mStamped ? mEnd - mFirst : mSum; }

    /** From the stream's beginning on, when only its end has been read. */
    [[nodiscard]] std::int64_t lengthSince(std::int64_t begin) const {
        return mStamped && begin != AV_NOPTS_VALUE ? mEnd - begin : 0;
    }

private:
    bool mStamped = false;
    std::int64_t mFirst = 0;
    std::int64_t mEnd = 0;
    std::int64_t mSum = 0;
};

std::vector<StreamTime> readToEnd(AVFormatContext& context) {
    std::vector<StreamTime> times;
    const Packet packet = makePacket();
    while (av_read_frame(&context, packet.get()) >= 0) {
        times.resize(context.nb_streams);
        const AVStream& stream = *context.streams[packet->stream_index];
        if (isVideo(stream) || isAudio(stream))
            times[static_cast<std::size_t>(packet->stream_index)].add(*packet.get());
        av_packet_unref(packet.get());
    }
    return times;
}

template<typename Length>
std::chrono::nanoseconds longest(AVFormatContext& context, Length&& length) {
    const std::vector<StreamTime> times = readToEnd(context);
    std::int64_t longest = 0;
    for (std::size_t index = 0; index < times.size(); ++index) {
        const AVStream& stream = *context.streams[index];
        longest = std::max(
            longest, av_rescale_q(length(times[index], stream), stream.time_base, kNanoseconds));
    }
    return std::chrono::nanoseconds(longest);
}

/** Of bare sound: how its headers are read. */
struct BareSound {
    std::string_view format;
    ReadHeader& read;
};

constexpr BareSound kBareSound[] = {{"aac", readAdtsHeader},
                                    {"ac3", readAc3Header},
                                    {"eac3", readAc3Header},
                                    {"mp3", readMpegHeader}};

/** Of what keeps time stamps: how one gets near its end. */
struct Stamped {
    std::string_view format;
    bool (*seek)(AVFormatContext& context, FileInput& input, std::int64_t reach);
};

constexpr Stamped kStamped[] = {
    {"matroska,webm", seekToCluster}, {"mpeg", seekToTail}, {"mpegts", seekToTail}};

template<typename Row, std::size_t size>
const Row* find(const Row (&table)[size], std::string_view format) {
    const Row* const row = std::find_if(std::begin(table), std::end(table),
                                        [=](const Row& known) { return known.format == format; });
    return row == std::end(table) ? nullptr : row;
}

std::chrono::nanoseconds fromTail(AVFormatContext& context, FileInput& input,
                                  const Stamped& stamped) {
    constexpr std::int64_t kReaches[] = {256 * 1024, 8 * 1024 * 1024};
    for (const std::int64_t reach : kReaches) {
        if (!stamped.seek(context, input, reach))
            continue;
        const auto found = longest(context, [](const StreamTime& time, const AVStream& stream) {
            return time.lengthSince(stream.start_time);
        });
        if (found.count() > 0)
            return found;
    }
    return {};
}

} // namespace

bool isBareSound(std::string_view format) {
    return find(kBareSound, format) != nullptr;
}

CountedDuration countDuration(AVFormatContext& context, FileInput& input) {
    const std::string_view format = context.iformat->name;
    if (format.substr(0, 4) == "mov,")
        return {timeOfFragments(input), true};
    if (const BareSound* const sound = find(kBareSound, format)) {
        const WalkedSound walked = walkSound(input, sound->read);
        return {walked.time, walked.isWhole};
    }
    if (const Stamped* const stamped = find(kStamped, format)) {
        const auto found = fromTail(context, input, *stamped);
        if (found.count() > 0)
            return {found, true};
        av_seek_frame(&context, -1, 0, AVSEEK_FLAG_BYTE);
    }
    return {longest(context, [](const StreamTime& time, const AVStream&) { return time.length(); }),
            true};
}

} // namespace probe
