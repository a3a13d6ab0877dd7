// SPDX-License-Identifier: MIT
#include "probe/Formats.h"

#include <algorithm>
#include <iterator>

namespace probe {

namespace {

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

template<std::size_t size>
bool contains(const std::string_view (&names)[size], std::string_view name) {
    return std::find(std::begin(names), std::end(names), name) != std::end(names);
}

} // namespace

bool isTrusted(std::string_view format) {
    return contains(kFormats, format);
}

bool isPictureFormat(std::string_view format) {
    return contains(kPictures, format);
}

} // namespace probe
