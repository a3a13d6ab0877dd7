// SPDX-License-Identifier: MIT
#include "cli/Output.h"

#include <cerrno>
#include <unistd.h>

void show(std::string_view text) {
    while (!text.empty()) {
        const ssize_t count = ::write(STDOUT_FILENO, text.data(), text.size());
        if (count < 0 && errno != EINTR)
            throw OutputFailed(errno, std::generic_category(), "standard output");
        if (count > 0)
            text.remove_prefix(static_cast<std::size_t>(count));
    }
}
