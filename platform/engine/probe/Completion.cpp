// SPDX-License-Identifier: MIT
#include "probe/Completion.h"

#include <algorithm>
#include <vector>

#include "probe/CodecHeader.h"

namespace probe {

namespace {

/** Streams are interleaved: whose first packet is not among so many hardly has one. */
constexpr int kMostPackets = 200;

/** Pictures larger than this are not decoded; nobody's memory is taken on a file's word. */
constexpr std::int64_t kMostPixels = 16384LL * 16384;

bool isKnown(const AVStream& stream) {
    const AVCodecParameters& known = *stream.codecpar;
    if (isVideo(stream))
        return known.width > 0 && known.height > 0 && known.format != AV_PIX_FMT_NONE;
    return known.sample_rate > 0 && known.ch_layout.nb_channels > 0;
}

/** Sound that is kept exactly has a number of bits, which some containers do not tell. */
bool lacksDepth(const AVCodecParameters& known) {
    const AVCodecDescriptor* const codec = avcodec_descriptor_get(known.codec_id);
    return codec && known.codec_type == AVMEDIA_TYPE_AUDIO &&
           (codec->props & AV_CODEC_PROP_LOSSLESS) != 0 && known.bits_per_raw_sample == 0 &&
           av_get_bits_per_sample(known.codec_id) == 0;
}

/** Containers say of AAC what the format was before its extensions doubled rate or channels. */
bool hidesItsFormat(const AVCodecParameters& known) {
    const bool isAac = known.codec_id == AV_CODEC_ID_AAC || known.codec_id == AV_CODEC_ID_AAC_LATM;
    return (isAac && !tellsAacFormat(known)) || lacksDepth(known);
}

/** Whether only its packets can tell what the stream is. */
bool needsPacket(const AVStream& stream) {
    if (isVideo(stream))
        return true; // of cropping and interlacing containers know nothing
    return isAudio(stream) && (!isKnown(stream) || hidesItsFormat(*stream.codecpar));
}

void takeFromParser(const AVCodecParserContext& parser, const AVCodecContext& codec,
                    AVCodecParameters& known) {
    if (parser.width > 0 && parser.height > 0) {
        known.width = parser.width;
        known.height = parser.height;
    }
    if (known.format == AV_PIX_FMT_NONE && parser.format >= 0)
        known.format = parser.format;
    if (known.field_order == AV_FIELD_UNKNOWN || known.field_order == AV_FIELD_PROGRESSIVE)
        known.field_order = parser.field_order;
    if (known.profile == FF_PROFILE_UNKNOWN)
        known.profile = codec.profile;
}

void parse(const AVPacket& packet, AVCodecParameters& known) {
    const Parser parser(kAdopt, av_parser_init(known.codec_id));
    const CodecContext codec(kAdopt, avcodec_alloc_context3(nullptr));
    if (!parser || avcodec_parameters_to_context(codec.get(), &known) < 0)
        return;
    parser->flags |= PARSER_FLAG_COMPLETE_FRAMES;
    std::uint8_t* data = nullptr;
    int size = 0;
    av_parser_parse2(parser.get(), codec.get(), &data, &size, packet.data, packet.size, packet.pts,
                     packet.dts, packet.pos);
    takeFromParser(*parser.get(), *codec.get(), known);
}

void takeFromFrame(const AVFrame& frame, AVCodecParameters& known) {
    known.format = frame.format;
    if (known.codec_type == AVMEDIA_TYPE_VIDEO) {
        known.width = frame.width;
        known.height = frame.height;
        if (frame.interlaced_frame != 0)
            known.field_order = frame.top_field_first != 0 ? AV_FIELD_TT : AV_FIELD_BB;
        return;
    }
    known.sample_rate = frame.sample_rate;
    av_channel_layout_copy(&known.ch_layout, &frame.ch_layout);
}

void decode(const AVPacket& packet, AVCodecParameters& known) {
    const AVCodec* const decoder = avcodec_find_decoder(known.codec_id);
    const CodecContext codec(kAdopt, avcodec_alloc_context3(decoder));
    if (!decoder || avcodec_parameters_to_context(codec.get(), &known) < 0)
        return;
    codec->thread_count = 1;
    codec->max_pixels = kMostPixels;
    const Frame frame = makeFrame();
    if (avcodec_open2(codec.get(), decoder, nullptr) < 0 ||
        avcodec_send_packet(codec.get(), &packet) < 0 ||
        avcodec_send_packet(codec.get(), nullptr) < 0 ||
        avcodec_receive_frame(codec.get(), frame.get()) < 0)
        return;
    takeFromFrame(*frame.get(), known);
    if (lacksDepth(known))
        known.bits_per_raw_sample = codec->bits_per_raw_sample;
}

void completeFrom(const AVPacket& packet, AVStream& stream) {
    AVCodecParameters& known = *stream.codecpar;
    if (isVideo(stream))
        parse(packet, known);
    if (known.codec_id == AV_CODEC_ID_MP3)
        known.codec_id = layerOfMpeg(packet);
    if (known.codec_id == AV_CODEC_ID_VP9 && known.format == AV_PIX_FMT_NONE)
        known.format = pixelFormatOfVp9(packet);
    if (!isKnown(stream) || hidesItsFormat(known))
        decode(packet, known);
}

/** The streams whose first packet has not come yet. */
class Awaited {
public:
    explicit Awaited(const AVFormatContext& context) {
        for (unsigned int index = 0; index < context.nb_streams; ++index) {
            mAwaited.push_back(needsPacket(*context.streams[index]));
        }
    }

    [[nodiscard]] bool any() const {
        return std::find(mAwaited.begin(), mAwaited.end(), true) != mAwaited.end();
    }

    bool take(int index) {
        const auto place = static_cast<std::size_t>(index);
        const bool was = place < mAwaited.size() && mAwaited[place];
        if (was)
            mAwaited[place] = false;
        return was;
    }

private:
    std::vector<bool> mAwaited;
};

void readHeaders(AVFormatContext& context) {
    for (unsigned int index = 0; index < context.nb_streams; ++index) {
        if (lacksDepth(*context.streams[index]->codecpar))
            readLossless(*context.streams[index]->codecpar);
    }
}

void readFirstPackets(AVFormatContext& context) {
    Awaited awaited(context);
    const Packet packet = makePacket();
    for (int count = 0; count < kMostPackets && awaited.any(); ++count) {
        if (av_read_frame(&context, packet.get()) < 0)
            return;
        if (awaited.take(packet->stream_index))
            completeFrom(*packet.get(), *context.streams[packet->stream_index]);
        av_packet_unref(packet.get());
    }
}

bool lacksSomething(const AVFormatContext& context, bool isPicture) {
    return std::any_of(
        context.streams, context.streams + context.nb_streams, [=](const AVStream* stream) {
            if (!isVideo(*stream) && !isAudio(*stream))
                return false;
            const bool hasRate = isPicture || !isVideo(*stream) || stream->avg_frame_rate.num > 0;
            return !hasRate || !isKnown(*stream);
        });
}

} // namespace

void complete(MediaFile& file) {
    AVFormatContext& context = file.context();
    readHeaders(context);
    if (!file.isAnalysed() && !file.isPicture())
        readFirstPackets(context);
    if (lacksSomething(context, file.isPicture()))
        file.analyse();
}

} // namespace probe
