// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <filesystem>
#include <iosfwd>
#include <string>
#include <vector>

/** A file that plays. Each has four seconds unless it says otherwise. */
struct Sample {
    std::string name;
    int videoCount = 0;
    int audioCount = 0;
    int textCount = 0;
    /** Between key frames; 0 for sound, and where only an index could tell of them. */
    std::chrono::milliseconds keyDistance{0};
    /** How far from the true place the container lets an accurate seek land. */
    std::chrono::milliseconds tolerance{45};
};

std::ostream& operator<<(std::ostream& stream, const Sample& sample);

/** One film or piece of sound per container and codec. */
const std::vector<Sample>& timedSamples();

const std::vector<std::string>& pictureNames();

std::filesystem::path samplePath(const std::string& name);

/** The sample's name in the characters that test names may have. */
std::string testName(std::string name);
