// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <string>

namespace qnsmedia {

using Nanoseconds = std::chrono::nanoseconds;

enum class PlayerState {
    unknown = -1, ///< the daemon has no player
    closed = 0,
    paused = 1,
    notReady = 2, ///< nothing has been opened, or it is being opened
    playing = 3,
    ended = 4,
    failed = 5
};

struct PlayerStatus {
    PlayerState state = PlayerState::closed;
    Nanoseconds position{0};
    Nanoseconds duration{0}; ///< 0 when unknown
};

enum class SeekMode {
    accurate = 0, ///< exactly there
    keyFrame = 1, ///< the nearest key frame: quicker
    relative = 2  ///< that far from where it is; negative goes back
};

/** The rate of the device's display. */
enum class SystemFormat { display50Hz = 0, display60Hz = 1 };

/** What was found when a medium was opened. */
struct MediaInfo {
    int videoStreams = 0;
    int audioStreams = 0;
    int textStreams = 0;
    Nanoseconds duration{0}; ///< 0 when unknown
    bool seekable = false;
    bool live = false;
};

enum class NotificationKind {
    opened = 1,      ///< an open has finished, well or not: see result; text = path, or message
    state = 2,       ///< param1 = new PlayerState, param2 = old one; value = position
    end = 3,         ///< the end was reached; value = position
    failure = 4,     ///< playback has failed; text = message
    loop = 5,        ///< the A-B loop went back to its start; value = position of the start
    buffering = 6,   ///< param1 = percentage
    seekFinished = 7 ///< value = position
};

/** An event of the daemon's player, whichever client caused it. */
struct PlayerNotification {
    NotificationKind kind{};
    int result = 0;   ///< 0 when all is well, else as MediaError::result()
    std::string text; ///< bytes in the daemon's locale: UTF-8, unless it was started otherwise
    int param1 = 0;
    int param2 = 0;
    int param3 = 0;
    unsigned long value1 = 0;
    unsigned long value2 = 0;
    long value = 0; ///< nanoseconds where it is a position or a duration
};

/** What a NotificationKind::opened with result 0 tells. */
inline MediaInfo mediaInfoOf(const PlayerNotification& opened) {
    return {opened.param1,
            opened.param2,
            opened.param3,
            Nanoseconds(opened.value),
            (opened.value1 & 1) != 0,
            (opened.value1 & 2) != 0};
}

} // namespace qnsmedia
