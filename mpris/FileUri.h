// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <string>
#include <string_view>

namespace mpris {

/** Of an absolute path. */
std::string fileUri(std::string_view path);

/** Whether it is a URI of scheme "file", well-formed or not. */
bool isFileUri(std::string_view text);

/** The path that a URI of scheme "file" names on this machine; nothing when it names none. */
std::optional<std::string> filePath(std::string_view uri);

/** Whether it is a URI of any scheme that names a place, such as "http://...". */
bool isUri(std::string_view text);

} // namespace mpris
