// SPDX-License-Identifier: MIT
#include "mpris/MimeTypes.h"

#include <algorithm>

namespace mpris {
namespace {

struct MimeType {
    const char* extension;
    const char* type;
};

constexpr MimeType kMimeTypes[] = {
    {"3gp", "video/3gpp"},      {"aac", "audio/aac"},        {"ac3", "audio/ac3"},
    {"aif", "audio/x-aiff"},    {"aiff", "audio/x-aiff"},    {"amr", "audio/AMR"},
    {"asf", "video/x-ms-asf"},  {"au", "audio/basic"},       {"avi", "video/x-msvideo"},
    {"bmp", "image/bmp"},       {"dts", "audio/vnd.dts"},    {"flac", "audio/flac"},
    {"flv", "video/x-flv"},     {"gif", "image/gif"},        {"jpeg", "image/jpeg"},
    {"jpg", "image/jpeg"},      {"m2ts", "video/mp2t"},      {"m4a", "audio/mp4"},
    {"m4v", "video/mp4"},       {"mka", "audio/x-matroska"}, {"mkv", "video/x-matroska"},
    {"mov", "video/quicktime"}, {"mp2", "audio/mpeg"},       {"mp3", "audio/mpeg"},
    {"mp4", "video/mp4"},       {"mpeg", "video/mpeg"},      {"mpg", "video/mpeg"},
    {"mts", "video/mp2t"},      {"mxf", "application/mxf"},  {"oga", "audio/ogg"},
    {"ogg", "audio/ogg"},       {"ogv", "video/ogg"},        {"opus", "audio/ogg"},
    {"png", "image/png"},       {"tif", "image/tiff"},       {"tiff", "image/tiff"},
    {"ts", "video/mp2t"},       {"tta", "audio/x-tta"},      {"vob", "video/mpeg"},
    {"wav", "audio/wav"},       {"webm", "video/webm"},      {"webp", "image/webp"},
    {"wma", "audio/x-ms-wma"},  {"wmv", "video/x-ms-wmv"},   {"wv", "audio/x-wavpack"},
};

} // namespace

std::vector<std::string> mimeTypesOf(const std::vector<std::string>& extensions) {
    std::vector<std::string> types;
    for (const std::string& extension : extensions)
        for (const MimeType& known : kMimeTypes)
            if (extension == known.extension &&
                std::find(types.begin(), types.end(), known.type) == types.end())
                types.emplace_back(known.type);
    return types;
}

} // namespace mpris
