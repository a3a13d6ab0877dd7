// SPDX-License-Identifier: MIT
#include "player/Medium.h"

#include "gst/Types.h"
#include "text/Text.h"

namespace engine {

namespace {

std::string fileUri(const std::string& path) {
    const gst::Chars uri(gst::kAdopt, gst_filename_to_uri(path.c_str(), nullptr));
    return uri ? uri.get() : "";
}

std::string filePath(const std::string& uri) {
    const gst::Chars path(gst::kAdopt, g_filename_from_uri(uri.c_str(), nullptr, nullptr));
    return path ? path.get() : "";
}

} // namespace

Medium toMedium(const std::wstring& text) {
    std::string bytes = toBytes(text);
    if (bytes.find("://") == std::string::npos || !gst_uri_is_valid(bytes.c_str()))
        return {fileUri(bytes), bytes};
    if (gst_uri_has_protocol(bytes.c_str(), "file"))
        return {bytes, filePath(bytes)};
    return {bytes, {}};
}

} // namespace engine
