// SPDX-License-Identifier: MIT
#include "cli/Output.h"

#include <cerrno>
#include <cstdio>

void show(std::string_view text) {
    errno = 0;
    const bool isWritten = std::fwrite(text.data(), 1, text.size(), stdout) == text.size();
    if (!isWritten || std::fflush(stdout) != 0)
        throw OutputFailed(errno, std::generic_category(), "standard output");
}
