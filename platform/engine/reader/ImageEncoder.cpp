// SPDX-License-Identifier: MIT
#include "reader/ImageEncoder.h"

#include "reader/Scaler.h"

namespace reader {

using probe::kAdopt;

namespace {

probe::CodecContext openEncoder(Size size, const Encoding& encoding) {
    const AVCodec* const encoder = avcodec_find_encoder(encoding.codec);
    probe::CodecContext codec(kAdopt, avcodec_alloc_context3(encoder));
    if (!encoder || !codec)
        return {};
    codec->width = size.width;
    codec->height = size.height;
    codec->pix_fmt = encoding.format;
    codec->color_range = AVCOL_RANGE_JPEG;
    codec->time_base = {1, 1};
    codec->thread_count = 1;
    codec->flags |= AV_CODEC_FLAG_QSCALE;
    codec->global_quality = encoding.quality * FF_QP2LAMBDA;
    return avcodec_open2(codec.get(), encoder, nullptr) >= 0 ? std::move(codec)
                                                             : probe::CodecContext();
}

} // namespace

probe::Packet encode(const Canvas& canvas, const Encoding& encoding) {
    const probe::Frame frame = probe::makeFrame();
    if (!convertFromPixels(canvas.pixels, canvas.size, encoding.format, *frame.get()))
        return {};
    const probe::CodecContext codec = openEncoder(canvas.size, encoding);
    if (!codec)
        return {};
    frame->quality = codec->global_quality;
    probe::Packet packet = probe::makePacket();
    const bool isMade = avcodec_send_frame(codec.get(), frame.get()) >= 0 &&
                        avcodec_receive_packet(codec.get(), packet.get()) >= 0;
    return isMade ? std::move(packet) : probe::Packet();
}

} // namespace reader
