// SPDX-License-Identifier: MIT
#pragma once

#include <termios.h>

/** Keys of the play command. */
enum class Key { none, pause, back, forward, backFar, forwardFar, loopStart, loopEnd, quit };

/**
 * Standard input and output as a terminal: keys arrive at once and are not shown, until this
 * object ends. Does nothing where either is not a terminal.
 */
class Terminal {
public:
    Terminal();
    ~Terminal();
    Terminal(const Terminal&) = delete;
    Terminal& operator=(const Terminal&) = delete;

    [[nodiscard]] bool interactive() const { return mInteractive; }

    /** The next key that has been pressed, if any; does not wait. */
    [[nodiscard]] Key readKey();

private:
    bool mInteractive;
    termios mBefore{};
};
