// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace engine {

/** What open() was given, as the libraries want it. */
struct Medium {
    std::string uri;
    std::string path; ///< empty when it is no file
};

/** Takes a path, or a URI of any scheme. */
Medium toMedium(const std::wstring& text);

} // namespace engine
