// SPDX-License-Identifier: MIT
#include "probe/MediaLook.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <fcntl.h>
#include <sys/stat.h>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "base/UniqueFd.h"
#include "probe/AvTypes.h"
#include "probe/FileInput.h"

namespace probe {

using namespace LibMediaPlayer;

namespace {

constexpr std::int64_t kByteBudget = 64 * 1024 * 1024;
constexpr std::chrono::milliseconds kTimeBudget{1500};

/** Formats that are told by little more than a file name or a few bytes would accept any text. */
constexpr std::string_view kFormats[] = {"aac",
                                         "ac3",
                                         "aiff",
                                         "amr",
                                         "ape",
                                         "apng",
                                         "asf",
                                         "au",
                                         "av1",
                                         "avi",
                                         "bmp_pipe",
                                         "caf",
                                         "dirac",
                                         "dts",
                                         "dv",
                                         "eac3",
                                         "flac",
                                         "flv",
                                         "gif",
                                         "h264",
                                         "hevc",
                                         "ivf",
                                         "jpeg_pipe",
                                         "m4v",
                                         "matroska,webm",
                                         "mov,mp4,m4a,3gp,3g2,mj2",
                                         "mp3",
                                         "mpc",
                                         "mpc8",
                                         "mpeg",
                                         "mpegts",
                                         "mpegvideo",
                                         "mxf",
                                         "nut",
                                         "obu",
                                         "ogg",
                                         "png_pipe",
                                         "rm",
                                         "tiff_pipe",
                                         "tta",
                                         "voc",
                                         "w64",
                                         "wav",
                                         "webp_pipe",
                                         "wv",
                                         "yuv4mpegpipe"};

constexpr std::string_view kPictures[] = {"apng",     "bmp_pipe",  "gif",      "jpeg_pipe",
                                          "png_pipe", "tiff_pipe", "webp_pipe"};

/** Below it a few bytes agree by chance. */
constexpr int kLeastScore = AVPROBE_SCORE_RETRY / 2;

template<std::size_t size>
bool contains(const std::string_view (&names)[size], std::string_view name) {
    return std::find(std::begin(names), std::end(names), name) != std::end(names);
}

int resultOfErrno(int error) {
    switch (error) {
    case EACCES:
    case EPERM:
        return kAccessDenied;
    case ENOENT:
    case ENOTDIR:
    case ENAMETOOLONG:
    case ELOOP:
        return kNotFound;
    default:
        return kNotAvailable;
    }
}

double frameRate(const AVStream& stream) {
    const AVRational rate = stream.avg_frame_rate;
    return rate.den == 0 ? 0 : av_q2d(rate);
}

struct OpenedFile {
    qns::UniqueFd file;
    std::int64_t size = 0;
};

/** A pipe or a device could block, or be set going, by opening it alone. */
std::variant<OpenedFile, LookFailure> openRegularFile(const std::string& path) {
    struct stat status {};
    if (::stat(path.c_str(), &status) != 0)
        return LookFailure{resultOfErrno(errno)};
    if (!S_ISREG(status.st_mode))
        return LookFailure{kNotMedia};
    qns::UniqueFd file(::open(path.c_str(), O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY));
    if (!file)
        return LookFailure{resultOfErrno(errno)};
    if (::fstat(file.get(), &status) != 0 || !S_ISREG(status.st_mode) || status.st_size == 0)
        return LookFailure{kNotMedia};
    return OpenedFile{std::move(file), status.st_size};
}

/** One look: the steps share the input and the context. */
class Look {
public:
    explicit Look(OpenedFile file)
        : mInput(std::move(file.file), file.size, kByteBudget, kTimeBudget) {}

    LookResult run();

private:
    bool findFormat();
    int open();
    [[nodiscard]] bool isClear() const;
    void readOn();
    MediaLook describe();
    void describe(const AVStream& stream, MediaLook& look) const;
    LookResult failed(int result) const;

    static int isInterrupted(void* input) {
        return static_cast<FileInput*>(input)->isExhausted() ? 1 : 0;
    }

    FileInput mInput;
    const AVInputFormat* mpFormat = nullptr;
    bool mTagged = false;
    FormatContext mContext; ///< after the input, so that it goes first
};

LookResult Look::run() {
    if (!findFormat())
        return failed(kNotMedia);
    if (open() < 0)
        return failed(kDamaged);
    if (!isClear())
        readOn();
    if (mContext->nb_streams == 0)
        return failed(kDamaged);
    MediaLook look = describe();
    if (!look.video && !look.audio)
        return failed(kNotMedia);
    return look;
}

LookResult Look::failed(int result) const {
    if (mInput.isExhausted())
        return LookUndecided{};
    return LookFailure{result};
}

bool Look::findFormat() {
    std::array<unsigned char, 3> head{};
    avio_read(mInput.context(), head.data(), head.size());
    mTagged = head[0] == 'I' && head[1] == 'D' && head[2] == '3';
    avio_seek(mInput.context(), 0, SEEK_SET);
    // Without the file's name: its ending proves nothing.
    const int score = av_probe_input_buffer2(mInput.context(), &mpFormat, nullptr, nullptr, 0, 0);
    return mpFormat && score >= kLeastScore && contains(kFormats, mpFormat->name);
}

int Look::open() {
    // The library frees a context that it could not open.
    AVFormatContext* context = avformat_alloc_context();
    context->pb = mInput.context();
    context->interrupt_callback = {isInterrupted, &mInput};
    context->probesize = 1024 * 1024;
    const int error = avformat_open_input(&context, nullptr, mpFormat, nullptr);
    mContext = FormatContext(kAdopt, context);
    return error;
}

/** True when the file's header has told all. */
bool Look::isClear() const {
    return mContext->nb_streams > 0 && (mContext->ctx_flags & AVFMTCTX_NOHEADER) == 0 &&
           (mContext->duration > 0 || contains(kPictures, mpFormat->name));
}

void Look::readOn() {
    mContext->probesize = 256 * 1024;
    mContext->max_analyze_duration = AV_TIME_BASE / 2;
    avformat_find_stream_info(mContext.get(), nullptr);
}

MediaLook Look::describe() {
    MediaLook look;
    look.container = mpFormat->name;
    look.tagged = mTagged;
    for (unsigned int index = 0; index < mContext->nb_streams; ++index)
        describe(*mContext->streams[index], look);
    look.duration = std::chrono::microseconds(std::max<std::int64_t>(mContext->duration, 0));
    look.still = contains(kPictures, look.container);
    return look;
}

void Look::describe(const AVStream& stream, MediaLook& look) const {
    const AVCodecParameters& parameters = *stream.codecpar;
    const char* const codec = avcodec_get_name(parameters.codec_id);
    switch (parameters.codec_type) {
    case AVMEDIA_TYPE_VIDEO:
        if ((stream.disposition & AV_DISPOSITION_ATTACHED_PIC) != 0)
            return;
        if (look.videoCount++ == 0)
            look.video =
                MediaLook::Video{codec, parameters.width, parameters.height, frameRate(stream)};
        return;
    case AVMEDIA_TYPE_AUDIO:
        if (look.audioCount++ == 0)
            look.audio = MediaLook::Audio{codec};
        return;
    case AVMEDIA_TYPE_SUBTITLE:
        ++look.textCount;
        return;
    default:
        return;
    }
}

} // namespace

LookResult lookAt(const std::string& path) {
    av_log_set_level(AV_LOG_QUIET);
    auto opened = openRegularFile(path);
    if (const auto* const failure = std::get_if<LookFailure>(&opened))
        return *failure;
    return Look(std::get<OpenedFile>(std::move(opened))).run();
}

} // namespace probe
