// SPDX-License-Identifier: MIT
#pragma once

#include <string_view>

namespace probe {

/** Whether a file that libavformat takes for this is believed to be it. */
bool isTrusted(std::string_view format);

bool isPictureFormat(std::string_view format);

} // namespace probe
