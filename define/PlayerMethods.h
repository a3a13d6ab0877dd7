// SPDX-License-Identifier: MIT
#pragma once

/** Method ids of the player's three interfaces, as they stand in packets. */
namespace MediaServiceDefine {

/** Requests. The registrations come last although the interface has them before. */
enum class PlayerMethod : long {
    initializePlayer = 1,
    openPlayer = 2,
    closePlayer = 3,
    play = 4,
    pause = 5,
    seek = 6,
    getPlayerStatus = 7,
    setRepeat = 8,
    powerOffMediaPlayer = 9,
    unregisterCallBack = 10,
    unregisterNotify = 11,
    setSystemFormat = 12,
    registerCallBack = 13,
    registerNotify = 14
};

/** Callbacks to a client. */
enum class PlayerCallBack : long {
    setPlayerClientID = 1,
    initializePlayer = 2,
    openPlayer = 3,
    closePlayer = 4,
    play = 5,
    pause = 6,
    seek = 7,
    getPlayerStatus = 8,
    setRepeat = 9,
    powerOffMediaPlayer = 10
};

/** Notifications to a client. */
enum class PlayerNotify : long { mediaPlayerNotify = 1 };

} // namespace MediaServiceDefine
