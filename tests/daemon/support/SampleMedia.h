// SPDX-License-Identifier: MIT
#pragma once

#include <string>

/** Media files made by the ffmpeg command on first use and kept in the build tree. */
namespace sample {

/** 320x180 H.264 and AAC, ten seconds, a key frame every second, tagged. */
std::string film();

/** A sound file of one second. */
std::string shortSound();

/** The film under a name with spaces, letters of several scripts and a symbol. */
std::string filmWithUnicodeName();

/** The film without its second half, where its index is. */
std::string truncatedFilm();

/** Random bytes named like a film. */
std::string noise();

/** A text file named like a film. */
std::string text();

} // namespace sample
