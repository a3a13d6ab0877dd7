// SPDX-License-Identifier: MIT
#include "discoverer/Extensions.h"

#include <mutex>
#include <optional>
#include <string>

#include "LibMediaPlayer/Result.h"
#include "gst/Library.h"
#include "gst/Types.h"
#include "worker/Media.h"

namespace discoverer {

using namespace LibMediaPlayer;

namespace {

struct Extension {
    const wchar_t* name;
    const char* format; ///< the demuxer that describes it
    const char* caps;   ///< what the player's first element must take
};

/** Sorted. */
constexpr Extension kExtensions[] = {
    {L"3gp", "mp4", "video/quicktime"},
    {L"aac", "aac", "audio/mpeg, mpegversion=(int)4"},
    {L"ac3", "ac3", "audio/x-ac3"},
    {L"aif", "aiff", "audio/x-aiff"},
    {L"aiff", "aiff", "audio/x-aiff"},
    {L"amr", "amr", "audio/x-amr-nb-sh"},
    {L"asf", "asf", "video/x-ms-asf"},
    {L"au", "au", "audio/x-au"},
    {L"avi", "avi", "video/x-msvideo"},
    {L"bmp", "bmp_pipe", "image/bmp"},
    {L"dts", "dts", "audio/x-dts"},
    {L"eac3", "eac3", "audio/x-eac3"},
    {L"flac", "flac", "audio/x-flac"},
    {L"flv", "flv", "video/x-flv"},
    {L"gif", "gif", "image/gif"},
    {L"jpeg", "jpeg_pipe", "image/jpeg"},
    {L"jpg", "jpeg_pipe", "image/jpeg"},
    {L"m2ts", "mpegts", "video/mpegts"},
    {L"m4a", "mp4", "video/quicktime"},
    {L"m4v", "mp4", "video/quicktime"},
    {L"mka", "matroska", "audio/x-matroska"},
    {L"mkv", "matroska", "video/x-matroska"},
    {L"mov", "mov", "video/quicktime"},
    {L"mp2", "mp3", "audio/mpeg, mpegversion=(int)1"},
    {L"mp3", "mp3", "audio/mpeg, mpegversion=(int)1"},
    {L"mp4", "mp4", "video/quicktime"},
    {L"mpeg", "mpeg", "video/mpeg, systemstream=(boolean)true"},
    {L"mpg", "mpeg", "video/mpeg, systemstream=(boolean)true"},
    {L"mts", "mpegts", "video/mpegts"},
    {L"mxf", "mxf", "application/mxf"},
    {L"oga", "ogg", "application/ogg"},
    {L"ogg", "ogg", "application/ogg"},
    {L"ogv", "ogg", "application/ogg"},
    {L"opus", "ogg", "application/ogg"},
    {L"png", "png_pipe", "image/png"},
    {L"tif", "tiff_pipe", "image/tiff"},
    {L"tiff", "tiff_pipe", "image/tiff"},
    {L"ts", "mpegts", "video/mpegts"},
    {L"tta", "tta", "audio/x-ttafile"},
    {L"vob", "mpeg", "video/mpeg, systemstream=(boolean)true"},
    {L"wav", "wav", "audio/x-wav"},
    {L"webm", "webm", "video/webm"},
    {L"webp", "webp_pipe", "image/webp"},
    {L"wma", "asf", "video/x-ms-asf"},
    {L"wmv", "asf", "video/x-ms-asf"},
    {L"wv", "wv", "audio/x-wavpack"},
};

struct FactoriesTraits {
    using Pointer = GList*;
    static void release(GList* list) { gst_plugin_feature_list_free(list); }
};
using Factories = handle::UniqueHandle<FactoriesTraits>;

bool canPlay(const Factories& decodables, const char* text) {
    const gst::Caps caps(handle::kAdopt, gst_caps_from_string(text));
    const Factories fitting(handle::kAdopt, gst_element_factory_list_filter(
                                                decodables.get(), caps.get(), GST_PAD_SINK, FALSE));
    return static_cast<bool>(fitting);
}

/** True when one of the comma separated names is that. */
bool holds(const std::string& names, const std::string& name) {
    return ("," + names + ",").find("," + name + ",") != std::string::npos;
}

SupportedExtensions list(const std::string& demuxers) {
    gst::initialise();
    const Factories decodables(
        handle::kAdopt, gst_element_factory_list_get_elements(GST_ELEMENT_FACTORY_TYPE_DECODABLE,
                                                              GST_RANK_MARGINAL));
    SupportedExtensions told;
    for (const Extension& extension : kExtensions) {
        if (holds(demuxers, extension.format) && canPlay(decodables, extension.caps))
            told.extensions += (told.count++ == 0 ? L"" : L",") + std::wstring(extension.name);
    }
    return told;
}

} // namespace

int findExtensions(SupportedExtensions& extensions) {
    static std::mutex mutex;
    static std::optional<SupportedExtensions> known;
    const std::lock_guard lock(mutex);
    std::string demuxers;
    if (!known) {
        if (const int result = worker::findDemuxers(demuxers); result != kOk)
            return result;
        known = list(demuxers);
    }
    extensions = *known;
    return kOk;
}

} // namespace discoverer
