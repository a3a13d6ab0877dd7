// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string>

namespace qnsmedia {

enum class ImporterState {
    unknown = -1, ///< the daemon has no importer
    idle = 0,
    running = 1,
    cancelling = 2
};

/** How far the importer is with all that has been asked for, by all clients. */
struct ImporterStatus {
    ImporterState state = ImporterState::idle;
    std::int64_t bytesDone = 0;
    std::int64_t bytesTotal = 0;
};

enum class ImportNotificationKind {
    progress = 1, ///< text = path of the file
    finished = 2, ///< result; text = path in the library, or message; both may be empty
    started = 3   ///< text = path of the file
};

/**
 * An event of the daemon's importer, whichever client caused it. The daemon keeps one at a time:
 * of several that come very quickly the last may be told several times and the others not. The
 * fields after the text are those of the file that was asked for last.
 */
struct ImportNotification {
    ImportNotificationKind kind{};
    int result = 0;    ///< 0 when all is well, else as MediaError::result()
    std::string text;  ///< bytes in the daemon's locale
    std::string video; ///< the video stream in words
    std::string audio; ///< the first audio stream in words
    int width = 0;
    int height = 0;
    int frameRateNumerator = 0;
    int frameRateDenominator = 0;
    int sampleRate = 0; ///< Hz
};

} // namespace qnsmedia
