// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace MediaServiceDefine {

/** The file that a client wants opened; used by player and discoverer. */
struct _tagFileName {
    int iClientID = -1;
    std::wstring strFileName;
};

} // namespace MediaServiceDefine
