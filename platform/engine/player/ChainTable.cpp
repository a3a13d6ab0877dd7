// SPDX-License-Identifier: MIT
#include "player/ChainTable.h"

#include <string_view>
#include <utility>

namespace engine {

namespace {

/** Who cuts the stream into frames as decoders want them. */
enum class Framing {
    kContainer, ///< the container keeps whole frames and says what they are
    kParser     ///< the container's packets have to be parsed
};

struct ContainerEntry {
    std::string_view name; ///< libavformat's
    const char* element;   ///< null: the stream itself, from its parser
    Framing framing;
};

constexpr ContainerEntry kContainers[] = {
    {"mov,mp4,m4a,3gp,3g2,mj2", "qtdemux", Framing::kContainer},
    {"matroska,webm", "matroskademux", Framing::kContainer},
    {"flv", "flvdemux", Framing::kParser},
    {"ogg", "oggdemux", Framing::kContainer},
    {"avi", "avidemux", Framing::kParser},
    {"mpegts", "tsdemux", Framing::kParser},
    {"mpeg", "mpegpsdemux", Framing::kParser},
    {"wav", "wavparse", Framing::kContainer},
    {"mp3", nullptr, Framing::kParser},
    {"aac", nullptr, Framing::kParser},
    {"flac", nullptr, Framing::kParser},
    {"ac3", nullptr, Framing::kParser},
    {"jpeg_pipe", nullptr, Framing::kContainer},
    {"png_pipe", nullptr, Framing::kContainer},
    {"gif", nullptr, Framing::kContainer},
    {"bmp_pipe", nullptr, Framing::kContainer},
    {"tiff_pipe", nullptr, Framing::kContainer},
    {"webp_pipe", nullptr, Framing::kContainer},
};

struct CodecEntry {
    std::string_view name; ///< libavcodec's
    const char* parser;    ///< where the container does not frame
    bool alwaysParsed;
    const char* decoder;
};

constexpr CodecEntry kCodecs[] = {
    {"h264", "h264parse", false, "avdec_h264"},
    {"hevc", "h265parse", false, "avdec_h265"},
    {"vp8", nullptr, false, "vp8dec"},
    {"vp9", nullptr, false, "vp9dec"},
    {"mpeg4", "mpeg4videoparse", false, "avdec_mpeg4"},
    {"mpeg2video", "mpegvideoparse", true, "avdec_mpeg2video"},
    {"mpeg1video", "mpegvideoparse", true, "avdec_mpeg2video"},
    {"mjpeg", nullptr, false, "jpegdec"},
    {"png", nullptr, false, "pngdec"},
    {"gif", nullptr, false, "gdkpixbufdec"},
    {"bmp", nullptr, false, "gdkpixbufdec"},
    {"tiff", nullptr, false, "gdkpixbufdec"},
    {"webp", nullptr, false, "webpdec"},
    {"aac", "aacparse", false, "avdec_aac"},
    {"mp3", "mpegaudioparse", true, "mpg123audiodec"},
    {"mp2", "mpegaudioparse", true, "mpg123audiodec"},
    {"ac3", "ac3parse", true, "avdec_ac3"},
    {"opus", nullptr, false, "opusdec"},
    {"vorbis", nullptr, false, "vorbisdec"},
    {"flac", "flacparse", true, "flacdec"},
    {"pcm_s16le", nullptr, false, nullptr},
};

template<typename Entry, std::size_t size>
const Entry* find(const Entry (&table)[size], std::string_view name) {
    for (const Entry& entry : table) {
        if (entry.name == name)
            return &entry;
    }
    return nullptr;
}

/** False when the stream is there but not in the table. */
template<typename Stream>
bool planBranch(const std::optional<Stream>& stream, const ContainerEntry& container,
                std::optional<BranchPlan>& plan) {
    if (!stream)
        return true;
    const CodecEntry* const codec = find(kCodecs, stream->codec);
    if (!codec)
        return false;
    const bool parsed = codec->alwaysParsed || container.framing == Framing::kParser;
    plan = BranchPlan{parsed ? codec->parser : nullptr, codec->decoder};
    return true;
}

bool isIndexed(const probe::MediaLook& look) {
    return look.container != "mpegts" && look.container != "mpeg" && look.container != "flv";
}

} // namespace

std::optional<ChainPlan> planChain(const probe::MediaLook& look, const PlayerOptions& options) {
    const ContainerEntry* const container = find(kContainers, look.container);
    if (!container)
        return std::nullopt;
    ChainPlan plan;
    plan.tagReader = look.tagged ? "id3demux" : nullptr;
    if ((options.video() && !planBranch(look.video, *container, plan.video)) ||
        (options.audio() && !planBranch(look.audio, *container, plan.audio)))
        return std::nullopt;
    if (!plan.video && !plan.audio)
        return std::nullopt;
    // A bare stream is cut up by its parser, in the place of a container.
    plan.container = container->element;
    if (!container->element && plan.audio)
        plan.container = std::exchange(plan.audio->parser, nullptr);
    return plan;
}

bool knowsKeyFrames(const probe::MediaLook& look) {
    return look.video && isIndexed(look);
}

bool loopsSeamlessly(const probe::MediaLook& look) {
    return look.container != "ogg" && isIndexed(look);
}

} // namespace engine
