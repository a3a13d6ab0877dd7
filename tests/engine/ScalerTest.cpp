// SPDX-License-Identifier: MIT
#include "reader/Scaler.h"

#include <gtest/gtest.h>

#include <algorithm>

#include "reader/ImageEncoder.h"

namespace {

constexpr std::uint32_t kWhite = 0xffffffff;

probe::Frame whiteFrame(int width, int height) {
    probe::Frame frame = probe::makeFrame();
    frame->format = AV_PIX_FMT_YUVJ420P;
    frame->color_range = AVCOL_RANGE_JPEG;
    frame->width = width;
    frame->height = height;
    EXPECT_GE(av_frame_get_buffer(frame.get(), 0), 0);
    for (int plane = 0; plane < 3; ++plane)
        std::fill_n(frame->data[plane], frame->linesize[plane] * height / (plane == 0 ? 1 : 2),
                    static_cast<std::uint8_t>(plane == 0 ? 255 : 128));
    return frame;
}

bool isAlmostWhite(std::uint32_t pixel) {
    return (pixel & 0xf8f8f8f8) == 0xf8f8f8f8;
}

} // namespace

TEST(Scaler, EveryPixelOfEveryWidthIsDrawn) {
    av_log_set_level(AV_LOG_QUIET);
    for (int width = 1; width <= 100; ++width) {
        const auto frame = whiteFrame(width, 6);
        for (const int height : {6, 3}) {
            std::vector<std::uint32_t> pixels;
            ASSERT_TRUE(reader::scaleToPixels(*frame.get(), {width, height}, pixels));
            EXPECT_EQ(pixels.size(), static_cast<std::size_t>(width * height));
            EXPECT_TRUE(std::all_of(pixels.begin(), pixels.end(), isAlmostWhite)) << width;
        }
    }
}

TEST(ImageEncoder, TakesPicturesOfEveryWidth) {
    av_log_set_level(AV_LOG_QUIET);
    for (int width = 1; width <= 100; ++width) {
        reader::Canvas canvas{{width, 3}, {}};
        canvas.pixels.reserve(static_cast<std::size_t>(width) * 3 + reader::kReadAhead);
        canvas.pixels.assign(static_cast<std::size_t>(width) * 3, kWhite);
        for (const auto& encoding : {reader::kPng, reader::kJpeg, reader::kSmallJpeg})
            EXPECT_TRUE(reader::encode(canvas, encoding)) << width;
    }
}
