// SPDX-License-Identifier: MIT
#pragma once

extern "C" {
#include <libavcodec/avcodec.h>
#include <libavformat/avformat.h>
}

#include "handle/Handle.h"

namespace probe {

using handle::kAdopt;

struct FormatContextTraits {
    using Pointer = AVFormatContext*;
    static void release(AVFormatContext* context) { avformat_close_input(&context); }
};

/** Also frees the buffer, which the library may have exchanged for another. */
struct IoContextTraits {
    using Pointer = AVIOContext*;
    static void release(AVIOContext* context) {
        av_freep(&context->buffer);
        avio_context_free(&context);
    }
};

struct CodecContextTraits {
    using Pointer = AVCodecContext*;
    static void release(AVCodecContext* context) { avcodec_free_context(&context); }
};

struct ParserTraits {
    using Pointer = AVCodecParserContext*;
    static void release(AVCodecParserContext* parser) { av_parser_close(parser); }
};

struct PacketTraits {
    using Pointer = AVPacket*;
    static void release(AVPacket* packet) { av_packet_free(&packet); }
};

struct FrameTraits {
    using Pointer = AVFrame*;
    static void release(AVFrame* frame) { av_frame_free(&frame); }
};

using FormatContext = handle::UniqueHandle<FormatContextTraits>;
using IoContext = handle::UniqueHandle<IoContextTraits>;
using CodecContext = handle::UniqueHandle<CodecContextTraits>;
using Parser = handle::UniqueHandle<ParserTraits>;
using Packet = handle::UniqueHandle<PacketTraits>;
using Frame = handle::UniqueHandle<FrameTraits>;

inline Packet makePacket() {
    return {kAdopt, av_packet_alloc()};
}

inline Frame makeFrame() {
    return {kAdopt, av_frame_alloc()};
}

} // namespace probe
