// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstdio>
#include <memory>
#include <string>

/** What a command prints. */
inline std::string outputOf(const std::string& command) {
    const std::unique_ptr<FILE, int (*)(FILE*)> pipe(::popen(command.c_str(), "r"), ::pclose);
    std::string output;
    std::array<char, 4096> block{};
    while (const std::size_t size = std::fread(block.data(), 1, block.size(), pipe.get()))
        output.append(block.data(), size);
    return output;
}
