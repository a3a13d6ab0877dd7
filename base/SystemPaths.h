// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace qns {

/**
 * The two directories that the platform tells: the installation prefix (below it
 * "share/mediaplayer/...") and the data directory. Each returns true and sets `out`, or returns
 * false and leaves `out` as it was when the platform knows none. Any thread may call them.
 */
bool systemPrefixPath(std::wstring& out);
bool systemDataPath(std::wstring& out);

} // namespace qns
