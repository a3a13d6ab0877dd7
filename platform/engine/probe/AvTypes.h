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

using FormatContext = handle::UniqueHandle<FormatContextTraits>;
using IoContext = handle::UniqueHandle<IoContextTraits>;

} // namespace probe
