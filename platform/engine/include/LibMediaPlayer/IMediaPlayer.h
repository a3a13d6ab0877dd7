// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>

namespace LibMediaPlayer {

/** What a player can be asked to produce; the second argument of createPlayer(). */
enum PlayerFlag : unsigned int {
    kPlayVideo = 1,
    kPlayAudio = 2,
    kPlayText = 4,
    kPlayVisualisation = 8 ///< only where there is a window
};

/** Display rate; the format value of IMediaPlayer::open(). */
enum DisplayFormat : int { kDisplay60Hz = 2, kDisplay50Hz = 3 };

/** What IMediaPlayer::status() returns. */
enum PlayerState : int {
    kClosed = 0,
    kPaused = 1,
    kNotReady = 2, ///< opening
    kPlaying = 3,
    kEnded = 4,
    kFailed = 5
};

/** The mode of IMediaPlayer::seek(). */
enum SeekMode : int { kSeekAccurate = 0, kSeekKeyFrame = 1, kSeekRelative = 2 };

/** MediaPlayerNotify::type. Fields that a kind does not name are 0 or empty. */
enum PlayerNotifyType : int {
    /**
     * An open has finished. result; text = path, or message when result is not 0; param1..3 =
     * number of video, audio and text streams; value = duration; uvalue1 bit 0 seekable, bit 1
     * live.
     */
    kNotifyOpened = 1,
    /** The state has changed. param1 = new state, param2 = old state; value = position. */
    kNotifyState = 2,
    /** The end of the file was reached. value = position. */
    kNotifyEnd = 3,
    /** Playback has failed. result is not 0; text = message. */
    kNotifyFailure = 4,
    /** The A-B loop went back to its start. value = position of the start. */
    kNotifyLoop = 5,
    /** param1 = buffered percentage. */
    kNotifyBuffering = 6,
    /** A seek has finished. result; value = position. */
    kNotifySeekDone = 7
};

/** One event of a player. Times are nanoseconds. */
struct MediaPlayerNotify {
    int type = 0;
    int result = 0;
    std::wstring text;
    int param1 = 0;
    int param2 = 0;
    int param3 = 0;
    unsigned long uvalue1 = 0;
    unsigned long uvalue2 = 0;
    long value = 0;
};

/** The A-B loop: while `repeat`, playback goes from `end` back to `start`. */
struct RepeatParam {
    bool repeat = false;
    long start = 0; ///< nanoseconds
    long end = -1;  ///< nanoseconds; -1 is the end of the file
};

/**
 * Plays one medium at a time.
 *
 * Threads: all operations come from one thread, which needs no event loop of any kind.
 * Notifications arrive one after another on a thread of the player's own; the function must not
 * call the player. Operations only order what is to be done and return within milliseconds; the
 * outcome is told by notification. They return 0 when the order was accepted, or a Result.
 *
 * The order of the virtual operations is part of the binary interface.
 */
class IMediaPlayer {
public:
    virtual ~IMediaPlayer() = default;

    /**
     * Opens a path or a URI, closing what was open, and stops at its first picture. Answered by
     * one kNotifyOpened within five seconds. A still picture opens like a film without an end.
     * `format` is a DisplayFormat: no more frames a second are produced than that display shows,
     * and no fewer than the file has below that.
     */
    virtual int open(const std::wstring& path, int format) = 0;

    /** Closes what is open, or being opened. No notification arrives after it has returned. */
    virtual int close() = 0;

    virtual int play() = 0;
    virtual int pause() = 0;

    /**
     * Goes to `position` (nanoseconds; a distance, also negative, when `mode` is kSeekRelative).
     * Positions outside the medium are moved to its nearest end. Answered by kNotifySeekDone.
     */
    virtual int seek(long position, int mode) = 0;

    /** Returns a PlayerState and sets position and duration (nanoseconds, 0 when unknown). */
    virtual int status(long& position, long& duration) = 0;

    /** Sets who is told of events. Call before the first open(). Empty: nobody. */
    virtual void setNotify(std::function<void(MediaPlayerNotify&)> notify) = 0;

    /** Writes the processing graph to `path` in Graphviz's dot format. */
    virtual int dumpGraph(const std::wstring& path) = 0;

    /**
     * Sets or ends the A-B loop, before or while something plays. It ends with the medium. The
     * record is in and out: an engine may write back what it made of the ends.
     */
    virtual int repeat(RepeatParam& param) = 0;
};

} // namespace LibMediaPlayer
