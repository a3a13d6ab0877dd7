// SPDX-License-Identifier: MIT
#include "probe/MediaFile.h"

#include <algorithm>
#include <array>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "probe/Duration.h"
#include "probe/Formats.h"
#include "probe/Fragments.h"
#include "probe/PictureHeader.h"
#include "probe/Signature.h"

namespace probe {

using namespace LibMediaPlayer;

namespace {

/** Below it a few bytes agree by chance. */
constexpr int kLeastScore = AVPROBE_SCORE_RETRY / 2;

bool isPlayable(const AVStream& stream) {
    return isVideo(stream) || isAudio(stream);
}

/** Of the longest stream, in AV_TIME_BASE; 0 when one of them does not say. */
std::int64_t durationOfStreams(const AVFormatContext& context) {
    std::int64_t longest = 0;
    for (unsigned int index = 0; index < context.nb_streams; ++index) {
        const AVStream& stream = *context.streams[index];
        if (!isPlayable(stream))
            continue;
        if (stream.duration <= 0)
            return 0;
        longest =
            std::max(longest, av_rescale_q(stream.duration, stream.time_base, {1, AV_TIME_BASE}));
    }
    return longest;
}

/** A header can tell of more years than nanoseconds can count. */
std::chrono::nanoseconds toldDuration(const AVFormatContext& context) {
    using std::chrono::microseconds;
    constexpr auto kLongest = std::chrono::floor<microseconds>(std::chrono::nanoseconds::max());
    return std::clamp(microseconds(context.duration), microseconds(0), kLongest);
}

/** Formats whose header tells everything of a file that holds nothing but sound ... */
constexpr std::string_view kTellOfSound[] = {"aiff", "asf", "au",  "caf", "flac",
                                             "mp3",  "ogg", "tta", "wav", "wv"};

/** ... and of one that holds films, too. */
constexpr std::string_view kTellOfFilms[] = {"avi", "mxf"};

template<std::size_t size>
bool contains(const std::string_view (&names)[size], std::string_view name) {
    return std::find(std::begin(names), std::end(names), name) != std::end(names);
}

/** Whether the header says what the stream is, and of a film also how fast it is. */
bool isNamed(const AVStream& stream) {
    if (!isPlayable(stream))
        return true;
    return stream.codecpar->codec_id != AV_CODEC_ID_NONE &&
           (!isVideo(stream) || stream.avg_frame_rate.num > 0);
}

bool isToldByHeader(const AVFormatContext& context) {
    const std::string_view format = context.iformat->name;
    const AVStream* const* const begin = context.streams;
    const AVStream* const* const end = begin + context.nb_streams;
    const bool isFilm =
        std::any_of(begin, end, [](const AVStream* stream) { return isVideo(*stream); });
    return (contains(kTellOfFilms, format) || (!isFilm && contains(kTellOfSound, format))) &&
           std::all_of(begin, end, [](const AVStream* stream) { return isNamed(*stream); });
}

template<std::size_t size>
std::string_view readAt(AVIOContext& input, std::int64_t place, std::array<char, size>& buffer) {
    if (avio_seek(&input, place, SEEK_SET) < 0)
        return {};
    const int count = avio_read(&input, reinterpret_cast<unsigned char*>(buffer.data()), size);
    return {buffer.data(), static_cast<std::size_t>(std::max(count, 0))};
}

/** Compressed sound passes for samples in WAV files made to be copied to CDs. */
bool isDisguised(AVIOContext& input) {
    using namespace std::string_view_literals;
    constexpr std::string_view kMarks[] = {"\x7f\xfe\x80\x01"sv, "\xfe\x7f\x01\x80"sv,
                                           "\x1f\xff\xe8\x00"sv, "\xff\x1f\x00\xe8"sv,
                                           "\x72\xf8\x1f\x4e"sv};
    std::array<char, 16 * 1024> buffer;
    const std::int64_t begin = avio_tell(&input);
    const std::string_view sound = readAt(input, begin, buffer);
    avio_seek(&input, begin, SEEK_SET);
    return std::any_of(std::begin(kMarks), std::end(kMarks),
                       [&](std::string_view mark) { return sound.find(mark) != sound.npos; });
}

/** An AVI file that was never finished, or of which the end is missing: its header is wrong. */
bool isCutOff(AVIOContext& input) {
    constexpr std::int64_t kLengthAt = 4;
    const std::int64_t place = avio_tell(&input);
    avio_seek(&input, kLengthAt, SEEK_SET);
    const std::int64_t end = kLengthAt + 4 + static_cast<std::int64_t>(avio_rl32(&input));
    avio_seek(&input, place, SEEK_SET);
    return end > avio_size(&input);
}

} // namespace

MediaFile::MediaFile(RegularFile file, Bounds bounds)
    : mInput(std::move(file), bounds.bytes, bounds.time) {}

MediaFile::Opened MediaFile::open(RegularFile file, Bounds bounds) {
    av_log_set_level(AV_LOG_QUIET);
    std::unique_ptr<MediaFile> pMedia(new MediaFile(std::move(file), bounds));
    if (const int result = pMedia->readHeader(); result != kOk)
        return pMedia->failed(result);
    return pMedia;
}

MediaFile::Opened MediaFile::failed(int result) const {
    if (mInput.isExhausted())
        return LookUndecided{};
    return LookFailure{result};
}

int MediaFile::readHeader() {
    if (!findFormat())
        return kNotMedia;
    if (openInput() < 0)
        return kDamaged;
    if (isPicture() && mContext->nb_streams == 1)
        mReadPicture = readPictureHeader(*mContext->pb, *mContext->streams[0]->codecpar);
    if (!isClear())
        analyse();
    if (mContext->nb_streams == 0)
        return kDamaged;
    const AVStream* const* const streams = mContext->streams;
    const bool plays = std::any_of(streams, streams + mContext->nb_streams,
                                   [](const AVStream* stream) { return isPlayable(*stream); });
    return plays ? kOk : kNotMedia;
}

bool MediaFile::findFormat() {
    std::array<char, kSignatureReach> buffer;
    std::string_view head = readAt(*mInput.context(), 0, buffer);
    const std::size_t tagSize = sizeOfTag(head);
    mTagged = tagSize > 0;
    if (mTagged)
        head = readAt(*mInput.context(), static_cast<std::int64_t>(tagSize), buffer);
    avio_seek(mInput.context(), 0, SEEK_SET);
    if (const char* const format = formatBySignature(head))
        return (mpFormat = av_find_input_format(format)) != nullptr;
    // Without the file's name: its ending proves nothing.
    const int score = av_probe_input_buffer2(mInput.context(), &mpFormat, nullptr, nullptr, 0, 0);
    return mpFormat && score >= kLeastScore && isTrusted(mpFormat->name);
}

int MediaFile::openInput() {
    // The library frees a context that it could not open.
    AVFormatContext* context = avformat_alloc_context();
    context->pb = mInput.context();
    context->interrupt_callback = {isInterrupted, &mInput};
    context->probesize = 1024 * 1024;
    context->skip_estimate_duration_from_pts = 1; // it is exact only for films
    const int error = avformat_open_input(&context, nullptr, mpFormat, nullptr);
    mContext = FormatContext(kAdopt, context);
    mCutOff = error >= 0 && formatName() == "avi" && isCutOff(*mContext->pb);
    if (error >= 0 && mContext->duration <= 0 && !mCutOff && isToldByHeader(*mContext.get()))
        mContext->duration = durationOfStreams(*mContext.get());
    return error;
}

/** True when the file's header has told all that playing needs. */
bool MediaFile::isClear() const {
    if (isPicture())
        return mReadPicture;
    return mContext->nb_streams > 0 && (mContext->ctx_flags & AVFMTCTX_NOHEADER) == 0 &&
           (mContext->duration > 0 || isBareSound(formatName())) &&
           !(formatName() == "wav" && isDisguised(*mContext->pb));
}

bool MediaFile::isPicture() const {
    return isPictureFormat(mpFormat->name);
}

void MediaFile::analyse() {
    if (std::exchange(mAnalysed, true))
        return;
    mContext->probesize = 256 * 1024;
    mContext->max_analyze_duration = AV_TIME_BASE / 2;
    const std::int64_t told = mContext->duration;
    avformat_find_stream_info(mContext.get(), nullptr);
    if (told > 0)
        mContext->duration = told;
}

bool MediaFile::isEstimate() {
    return mContext->duration <= 0 || mCutOff ||
           (formatName().substr(0, 4) == "mov," && hasFragments(mInput)) ||
           (mAnalysed && mContext->duration_estimation_method == AVFMT_DURATION_FROM_BITRATE);
}

const Duration& MediaFile::duration() {
    if (std::exchange(mDurationKnown, true) || isPicture())
        return mDuration;
    mDuration.time = toldDuration(*mContext.get());
    if (!isEstimate()) {
        mDuration.isMeasured =
            mAnalysed && mContext->duration_estimation_method == AVFMT_DURATION_FROM_PTS;
        return mDuration;
    }
    const CountedDuration counted = countDuration(*mContext.get(), mInput);
    if (counted.time.count() == 0 || (counted.isExact && mInput.isExhausted()))
        return mDuration;
    return mDuration = {counted.time, counted.isExact};
}

bool isVideo(const AVStream& stream) {
    return stream.codecpar->codec_type == AVMEDIA_TYPE_VIDEO && !isCover(stream);
}

bool isCover(const AVStream& stream) {
    return (stream.disposition & AV_DISPOSITION_ATTACHED_PIC) != 0;
}

bool isAudio(const AVStream& stream) {
    return stream.codecpar->codec_type == AVMEDIA_TYPE_AUDIO;
}

} // namespace probe
