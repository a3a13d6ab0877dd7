// SPDX-License-Identifier: MIT
#pragma once

extern "C" {
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

struct DictionaryTraits {
    using Pointer = AVDictionary*;
    static void release(AVDictionary* dictionary) { av_dict_free(&dictionary); }
};

struct PacketTraits {
    using Pointer = AVPacket*;
    static void release(AVPacket* packet) { av_packet_free(&packet); }
};

using FormatContext = handle::UniqueHandle<FormatContextTraits>;
using IoContext = handle::UniqueHandle<IoContextTraits>;
using Dictionary = handle::UniqueHandle<DictionaryTraits>;
using Packet = handle::UniqueHandle<PacketTraits>;

} // namespace probe
