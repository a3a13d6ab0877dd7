// SPDX-License-Identifier: MIT
#include "tests/engine/Samples.h"

#include <cctype>
#include <ostream>

using std::chrono::milliseconds;

std::ostream& operator<<(std::ostream& stream, const Sample& sample) {
    return stream << sample.name;
}

const std::vector<Sample>& timedSamples() {
    static const std::vector<Sample> kSamples = {
        {"film.mp4", 1, 1, 0, milliseconds(1000)},
        {"film.mkv", 1, 1, 0, milliseconds(1000)},
        {"film.webm", 1, 1, 0, milliseconds(1000)},
        {"vp8.webm", 1, 1, 0, milliseconds(1000)},
        {"film.avi", 1, 1, 0, milliseconds(1000)},
        {"film.ts", 1, 1},
        {"film.mpg", 1, 1, 0, milliseconds(0), milliseconds(1000)},
        {"film.flv", 1, 1},
        {"ac3.mkv", 1, 1, 0, milliseconds(1000)},
        {"subtitles.mkv", 1, 1, 1, milliseconds(1000)},
        {"silent.mp4", 1, 0, 0, milliseconds(1000)},
        {"fast.mp4", 1, 0, 0, milliseconds(250)},
        {"sound.ogg", 0, 1},
        {"sound.opus", 0, 1},
        {"sound.flac", 0, 1, 0, milliseconds(0), milliseconds(110)},
        {"sound.wav", 0, 1},
        {"sound.mp3", 0, 1},
        {"cover.mp3", 0, 1},
        {"sound.m4a", 0, 1},
        {"sound.aac", 0, 1, 0, milliseconds(0), milliseconds(110)},
    };
    return kSamples;
}

const std::vector<std::string>& pictureNames() {
    static const std::vector<std::string> kNames = {"picture.jpg", "picture.png", "picture.gif",
                                                    "picture.bmp"};
    return kNames;
}

std::filesystem::path samplePath(const std::string& name) {
    return std::filesystem::path(QNS_SAMPLES) / name;
}

std::string testName(std::string name) {
    for (char& character : name) {
        if (!std::isalnum(static_cast<unsigned char>(character)))
            character = '_';
    }
    return name;
}
