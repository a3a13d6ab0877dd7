// SPDX-License-Identifier: MIT
#include "discoverer/ClientFile.h"

#include <cerrno>

#include <fcntl.h>
#include <unistd.h>

#include "base/Text.h"
#include "base/UniqueFd.h"

void qns::writeClientFile(const std::wstring& path, const void* bytes, std::size_t size) {
    constexpr int kFlags = O_WRONLY | O_CREAT | O_TRUNC | O_NONBLOCK | O_NOCTTY | O_CLOEXEC;
    const UniqueFd file(::open(narrow(path).c_str(), kFlags, 0666));
    const auto* next = static_cast<const char*>(bytes);
    while (file && size > 0) {
        const ssize_t written = ::write(file.get(), next, size);
        if (written < 0 && errno == EINTR)
            continue;
        if (written <= 0)
            return;
        next += written;
        size -= static_cast<std::size_t>(written);
    }
}
