// SPDX-License-Identifier: MIT
#pragma once

#include <termios.h>

/** Keys of the play command. */
enum class Key { none, pause, back, forward, backFar, forwardFar, loopStart, loopEnd, quit };

/**
 * Standard input and output as a terminal: keys arrive at once and are not shown, until this
 * object ends. Does nothing where either is not a terminal, or for a job in the background.
 */
class Terminal {
public:
    Terminal();
    ~Terminal();
    Terminal(const Terminal&) = delete;
    Terminal& operator=(const Terminal&) = delete;

    [[nodiscard]] bool interactive() const { return mInteractive; }

    /** The descriptor that keys come from; -1 when not interactive. */
    [[nodiscard]] int input() const;

    /** The next key, when the input has something to read; quit when the terminal has gone. */
    [[nodiscard]] Key readKey();

private:
    bool mInteractive;
    termios mBefore{};
};
