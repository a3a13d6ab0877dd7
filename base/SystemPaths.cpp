// SPDX-License-Identifier: MIT
#include "base/SystemPaths.h"

#include "base/Text.h"
#include "qnsys.h"

namespace qns {
namespace {

constexpr int kMaxPathBytes = 500;

bool readPath(int (*query)(char* buffer, int capacity), std::wstring& out) {
    char buffer[kMaxPathBytes] = {};
    if (query(buffer, kMaxPathBytes) < 1)
        return false;
    out = widen(buffer);
    return true;
}

} // namespace

bool systemPrefixPath(std::wstring& out) {
    return readPath(qnsys_getenv_hv_prefix, out);
}

bool systemDataPath(std::wstring& out) {
    return readPath(qnsys_getenv_hv_data, out);
}

} // namespace qns
