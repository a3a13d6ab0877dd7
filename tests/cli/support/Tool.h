// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>
#include <string_view>
#include <sys/types.h>
#include <termios.h>
#include <vector>

#include "base/UniqueFd.h"

/** A program in a process and a session of its own. For one thread; kills it at last. */
class Tool {
public:
    enum class Output {
        pipe,
        terminal, ///< a pseudo terminal is its controlling terminal, and its input too
        full      ///< a device that has no room
    };

    /** The qnsmedia tool with these arguments. */
    explicit Tool(std::vector<std::string> arguments, Output output = Output::pipe);
    Tool(const std::string& program, std::vector<std::string> arguments, Output output);
    ~Tool();
    Tool(const Tool&) = delete;
    Tool& operator=(const Tool&) = delete;

    /** Reads until the condition holds; false when the output ends, or takes too long, before. */
    bool waitUntil(const std::function<bool()>& condition);

    /** Waits until standard output contains the text, after what was waited for before. */
    bool waitFor(std::string_view text);

    /** All that came up to now. */
    [[nodiscard]] const std::string& output() const { return mOutput; }
    [[nodiscard]] const std::string& errors() const { return mErrors; }

    void press(std::string_view keys);
    void signal(int number) const;

    /** Nobody reads its output from now on. */
    void closeOutput();

    [[nodiscard]] termios terminal() const;

    /** Reads all that comes and waits for the end. As a shell tells it: 128 + n for signal n. */
    int waitForExit();

private:
    bool readMore();
    bool readFrom(qns::UniqueFd& end, std::string& text);

    pid_t mPid = -1;
    bool mHasEnded = false;
    int mStatus = 0;
    qns::UniqueFd mOut; ///< the other end of a pipe or terminal
    qns::UniqueFd mErr;
    qns::UniqueFd mTerminal; ///< the process's end, which knows its modes also afterwards
    std::string mOutput;
    std::string mErrors;
    std::size_t mSeen = 0;
};
