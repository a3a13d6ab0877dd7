// SPDX-License-Identifier: MIT
#include "probe/Duration.h"

#include <algorithm>
#include <vector>

#include "probe/MediaFile.h"

namespace probe {

namespace {

constexpr AVRational kNanoseconds{1, 1'000'000'000};

/** What one stream's packets have told, in its own time base. */
class StreamTime {
public:
    void add(const AVPacket& packet) {
        mSum += std::max<std::int64_t>(packet.duration, 0);
        if (packet.pts == AV_NOPTS_VALUE)
            return;
        mFirst = mStamped ? std::min(mFirst, packet.pts) : packet.pts;
        const std::int64_t end = packet.pts + packet.duration;
        mEnd = mStamped ? std::max(mEnd, end) : end;
        mStamped = true;
    }

    [[nodiscard]] std::int64_t length() const { return mStamped ? mEnd - mFirst : mSum; }

private:
    bool mStamped = false;
    std::int64_t mFirst = 0;
    std::int64_t mEnd = 0;
    std::int64_t mSum = 0;
};

} // namespace

std::chrono::nanoseconds countDuration(AVFormatContext& context) {
    std::vector<StreamTime> times;
    const Packet packet = makePacket();
    while (av_read_frame(&context, packet.get()) >= 0) {
        times.resize(context.nb_streams);
        const AVStream& stream = *context.streams[packet->stream_index];
        if (isVideo(stream) || isAudio(stream))
            times[static_cast<std::size_t>(packet->stream_index)].add(*packet.get());
        av_packet_unref(packet.get());
    }
    std::int64_t longest = 0;
    for (std::size_t index = 0; index < times.size(); ++index)
        longest = std::max(longest, av_rescale_q(times[index].length(),
                                                 context.streams[index]->time_base, kNanoseconds));
    return std::chrono::nanoseconds(longest);
}

} // namespace probe
