// SPDX-License-Identifier: MIT
#include "library/SetAside.h"

#include <cstdio>
#include <ctime>
#include <unistd.h>

#include "LibMediaPlayer/Result.h"
#include "library/Error.h"

namespace library {

namespace {

std::string stamp() {
    const std::time_t now = std::time(nullptr);
    std::tm time{};
    ::gmtime_r(&now, &time);
    char text[32];
    const std::size_t length = std::strftime(text, sizeof text, "%Y%m%d-%H%M%S", &time);
    return {text, length};
}

std::string freeName(const std::string& file) {
    const std::string first = file + ".damaged-" + stamp();
    std::string name = first;
    for (int number = 2; ::access(name.c_str(), F_OK) == 0; ++number)
        name = first + "-" + std::to_string(number);
    return name;
}

} // namespace

std::string setAside(const std::string& file) {
    const std::string name = freeName(file);
    if (std::rename(file.c_str(), name.c_str()) != 0)
        throw Error(LibMediaPlayer::kAccessDenied,
                    "The media database is damaged and cannot be set aside: " + file);
    for (const char* const ending : {"-wal", "-shm"})
        std::rename((file + ending).c_str(), (name + ending).c_str());
    return name;
}

} // namespace library
