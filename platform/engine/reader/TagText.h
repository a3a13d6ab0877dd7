// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "probe/AvTypes.h"

namespace reader {

/**
 * The file's tags, one `KEY=value` a line: the well-known ones first, the others by name. Values
 * that are no UTF-8 are taken for Latin-1, line breaks in them become blanks. Whatever the file
 * holds, the text has no more than kTagBytes in UTF-8: values are cut, and the last tags left out.
 */
std::wstring tagText(const AVFormatContext& context);

inline constexpr std::size_t kTagBytes = 12 * 1024;
inline constexpr std::size_t kTagValueBytes = 2 * 1024;

} // namespace reader
