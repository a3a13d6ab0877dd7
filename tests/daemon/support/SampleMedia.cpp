// SPDX-License-Identifier: MIT
#include "tests/daemon/support/SampleMedia.h"

#include <cstdlib>
#include <filesystem>
#include <fstream>
#include <functional>
#include <random>
#include <unistd.h>

#include <gtest/gtest.h>

namespace sample {

namespace {

namespace fs = std::filesystem;

/** Several test programs may want the same file: whoever is first names it. */
std::string provide(const std::string& name, const std::function<void(const fs::path&)>& make) {
    const fs::path folder = QNS_SAMPLE_DIR;
    const auto path = folder / name;
    if (!fs::exists(path)) {
        fs::create_directories(folder);
        const auto unfinished = folder / (std::to_string(::getpid()) + '-' + name);
        make(unfinished);
        EXPECT_TRUE(fs::exists(unfinished)) << unfinished;
        fs::rename(unfinished, path);
    }
    return path.string();
}

void encode(const std::string& arguments, const fs::path& path) {
    const auto command =
        "ffmpeg -nostdin -v error -y " + arguments + " '" + path.string() + "' </dev/null";
    EXPECT_EQ(std::system(command.c_str()), 0) << command;
}

void write(const fs::path& path, const std::string& content) {
    std::ofstream(path, std::ios::binary) << content;
}

} // namespace

std::string film() {
    return provide("film.mp4", [](const fs::path& path) {
        encode("-f lavfi -i testsrc2=size=320x180:rate=25:duration=10 "
               "-f lavfi -i sine=frequency=440:duration=10 "
               "-c:v libx264 -preset ultrafast -g 25 -pix_fmt yuv420p -c:a aac -b:a 64k "
               "-metadata title='A film' -shortest",
               path);
    });
}

std::string shortSound() {
    return provide("short.wav", [](const fs::path& path) {
        encode("-f lavfi -i sine=frequency=440:duration=1", path);
    });
}

std::string filmWithUnicodeName() {
    return provide("Gr\xC3\xBC\xC3\x9F"
                   "e \xE6\x98\xA0\xE7\x94\xBB \xF0\x9F\x8E\xB5 50%.mp4",
                   [](const fs::path& path) { fs::copy_file(film(), path); });
}

std::string truncatedFilm() {
    return provide("truncated.mp4", [](const fs::path& path) {
        fs::copy_file(film(), path);
        fs::resize_file(path, fs::file_size(path) / 2);
    });
}

std::string noise() {
    return provide("noise.mp4", [](const fs::path& path) {
        std::mt19937 random(1);
        std::string bytes(100000, '\0');
        for (auto& byte : bytes)
            byte = static_cast<char>(random());
        write(path, bytes);
    });
}

std::string text() {
    return provide("text.mp4",
                   [](const fs::path& path) { write(path, "This is a text and nothing else.\n"); });
}

} // namespace sample
