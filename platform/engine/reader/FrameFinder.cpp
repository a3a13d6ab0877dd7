// SPDX-License-Identifier: MIT
#include "reader/FrameFinder.h"

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <string_view>

extern "C" {
#include <libavutil/display.h>
}

#include "LibMediaPlayer/Result.h"

namespace reader {

using namespace LibMediaPlayer;
using probe::kAdopt;

namespace {

constexpr std::int64_t kMostPixels = 16384LL * 16384;
constexpr AVRational kNanoseconds{1, 1'000'000'000};

/** Back from the target when a container without an index has no key frame just before it. */
constexpr std::chrono::seconds kStepsBack[] = {std::chrono::seconds(0), std::chrono::seconds(3),
                                               std::chrono::seconds(15)};

AVStream* findStream(const AVFormatContext& context, bool (*isWanted)(const AVStream&)) {
    for (unsigned int index = 0; index < context.nb_streams; ++index) {
        if (isWanted(*context.streams[index]))
            return context.streams[index];
    }
    return nullptr;
}

/** Of a photograph; 1 to 8 as cameras write it, mirrored ones taken as not mirrored. */
int rotationOfCamera(const AVFrame& frame) {
    const AVDictionaryEntry* const entry = av_dict_get(frame.metadata, "Orientation", nullptr, 0);
    switch (entry ? std::atoi(entry->value) : 1) {
    case 3:
    case 4:
        return 180;
    case 5:
    case 6:
        return 90;
    case 7:
    case 8:
        return 270;
    default:
        return 0;
    }
}

int rotationOf(const AVStream& stream, const AVFrame& frame) {
    const auto* const matrix = reinterpret_cast<const std::int32_t*>(
        av_stream_get_side_data(&stream, AV_PKT_DATA_DISPLAYMATRIX, nullptr));
    if (!matrix)
        return rotationOfCamera(frame);
    const double counterClockwise = av_display_rotation_get(matrix);
    if (std::isnan(counterClockwise))
        return 0;
    const int quarters = static_cast<int>(std::lround(-counterClockwise / 90));
    return (quarters % 4 + 4) % 4 * 90;
}

/** Decodes one stream of a file up to a moment. */
class FrameFinder {
public:
    FrameFinder(probe::MediaFile& file, AVStream& stream, int budget)
        : mFile(file), mStream(stream), mBudget(budget) {}

    int run(std::chrono::nanoseconds position, Picture& picture);
    /** The picture that came with the header: the rest of the file is not read for it. */
    int runOnCover(Picture& picture);

private:
    int take(Picture& picture);
    [[nodiscard]] bool openDecoder();
    [[nodiscard]] std::int64_t beginning() const;
    void search(std::int64_t from);
    void seekTo(std::int64_t from);
    bool readPacket();
    void decode(const AVPacket& packet);
    void drain();
    void receive();
    void consider();
    [[nodiscard]] bool isEarly(const AVPacket& packet) const;
    [[nodiscard]] bool isShownAtTarget(const AVPacket& packet) const;
    [[nodiscard]] bool isDone() const { return mPassed || mBudget <= 0 || mFile.isExhausted(); }

    probe::MediaFile& mFile;
    AVStream& mStream;
    probe::CodecContext mCodec;
    probe::Packet mPacket = probe::makePacket();
    probe::Frame mDecoded = probe::makeFrame();
    probe::Frame mBest = probe::makeFrame();  ///< the last one not after the target
    probe::Frame mLater = probe::makeFrame(); ///< the first one after it
    std::int64_t mTarget = 0;                 ///< in the stream's time base
    int mBudget;
    bool mPassed = false; ///< nothing that comes can be better
};

int FrameFinder::run(std::chrono::nanoseconds position, Picture& picture) {
    if (!openDecoder())
        return kNotMedia;
    mTarget = av_rescale_q(position.count(), kNanoseconds, mStream.time_base) + beginning();
    for (const auto back : kStepsBack) {
        search(mTarget - av_rescale_q(std::chrono::nanoseconds(back).count(), kNanoseconds,
                                      mStream.time_base));
        if (mBest->buf[0] || isDone())
            break;
    }
    return take(picture);
}

int FrameFinder::runOnCover(Picture& picture) {
    if (!openDecoder())
        return kNotMedia;
    decode(mStream.attached_pic);
    drain();
    return take(picture);
}

int FrameFinder::take(Picture& picture) {
    probe::Frame& found = mBest->buf[0] ? mBest : mLater;
    if (!found->buf[0])
        return mFile.isExhausted() ? kTimedOut : kDamaged;
    picture.pixelAspect = av_guess_sample_aspect_ratio(&mFile.context(), &mStream, found.get());
    picture.rotation = rotationOf(mStream, *found.get());
    picture.frame = std::move(found);
    return kOk;
}

bool FrameFinder::openDecoder() {
    const AVCodec* const decoder = avcodec_find_decoder(mStream.codecpar->codec_id);
    if (!decoder)
        return false;
    mCodec = probe::CodecContext(kAdopt, avcodec_alloc_context3(decoder));
    if (avcodec_parameters_to_context(mCodec.get(), mStream.codecpar) < 0)
        return false;
    mCodec->thread_count = 1;
    mCodec->max_pixels = kMostPixels;
    mCodec->pkt_timebase = mStream.time_base;
    return avcodec_open2(mCodec.get(), decoder, nullptr) >= 0;
}

/** Of the file, whose streams need not all begin at once. */
std::int64_t FrameFinder::beginning() const {
    const std::int64_t start = mFile.context().start_time;
    if (start == AV_NOPTS_VALUE)
        return 0;
    return av_rescale_q(start, {1, AV_TIME_BASE}, mStream.time_base);
}

/** From the key frame at or before `from` to the target. */
void FrameFinder::search(std::int64_t from) {
    seekTo(from);
    bool begun = false;
    while (!isDone()) {
        if (!readPacket())
            return drain();
        begun = begun || (mPacket->flags & AV_PKT_FLAG_KEY) != 0;
        if (!begun)
            continue;
        decode(*mPacket.get());
        if (isShownAtTarget(*mPacket.get()) || mBudget <= 0)
            return drain();
    }
}

void FrameFinder::seekTo(std::int64_t from) {
    avcodec_flush_buffers(mCodec.get());
    if (mFile.isPicture())
        return;
    av_seek_frame(&mFile.context(), mStream.index, from, AVSEEK_FLAG_BACKWARD);
}

/** The next one of the stream. */
bool FrameFinder::readPacket() {
    do {
        av_packet_unref(mPacket.get());
        if (av_read_frame(&mFile.context(), mPacket.get()) < 0)
            return false;
    } while (mPacket->stream_index != mStream.index);
    return true;
}

void FrameFinder::decode(const AVPacket& packet) {
    --mBudget;
    mCodec->skip_frame = isEarly(packet) ? AVDISCARD_NONREF : AVDISCARD_DEFAULT;
    avcodec_send_packet(mCodec.get(), &packet);
    receive();
}

void FrameFinder::drain() {
    avcodec_send_packet(mCodec.get(), nullptr);
    receive();
}

void FrameFinder::receive() {
    while (avcodec_receive_frame(mCodec.get(), mDecoded.get()) >= 0)
        consider();
}

void FrameFinder::consider() {
    const std::int64_t shown = mDecoded->best_effort_timestamp;
    const bool isLater = shown != AV_NOPTS_VALUE && shown > mTarget;
    if (!isLater) {
        std::swap(mBest, mDecoded);
    } else {
        mPassed = mPassed || mBest->buf[0];
        if (!mLater->buf[0])
            std::swap(mLater, mDecoded);
    }
    av_frame_unref(mDecoded.get());
}

/** Another picture is shown by then, so this one matters only if others are made from it. */
bool FrameFinder::isEarly(const AVPacket& packet) const {
    return packet.pts != AV_NOPTS_VALUE && packet.duration > 0 &&
           packet.pts + packet.duration <= mTarget;
}

/** Everything it is made from has been decoded then, and nothing else has to be. */
bool FrameFinder::isShownAtTarget(const AVPacket& packet) const {
    return packet.pts != AV_NOPTS_VALUE && packet.duration > 0 && packet.pts <= mTarget &&
           packet.pts + packet.duration > mTarget;
}

} // namespace

int findPicture(probe::MediaFile& file, std::chrono::nanoseconds position, Picture& picture,
                int frameBudget) {
    AVStream* const stream = findStream(file.context(), probe::isVideo);
    if (!stream)
        return findCover(file, picture);
    return FrameFinder(file, *stream, frameBudget).run(position, picture);
}

int findCover(probe::MediaFile& file, Picture& picture) {
    AVStream* const stream = findStream(file.context(), probe::isCover);
    if (!stream)
        return kNotAvailable;
    return FrameFinder(file, *stream, kFrameBudget).runOnCover(picture);
}

} // namespace reader
