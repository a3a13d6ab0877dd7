// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <memory>
#include <string>
#include <string_view>
#include <sys/types.h>
#include <vector>

#include "base/UniqueFd.h"

namespace worker {

/** One worker process, as the process that has it sees it. For one thread at a time. */
class Process {
public:
    enum class Outcome {
        kAnswered,
        kStarting,   ///< it is not ready yet
        kNotStarted, ///< it never was ready, and has ended
        kEnded,
        kTimedOut
    };

    struct Answer {
        Outcome outcome = Outcome::kNotStarted;
        std::string bytes; ///< when it answered
    };

    /**
     * Begins to start `program`, with an option unless that is null, without waiting for it. Null,
     * and errno, when it cannot.
     */
    static std::unique_ptr<Process> start(const std::string& program, const char* option);

    /** Kills it. */
    ~Process();
    Process(const Process&) = delete;
    Process& operator=(const Process&) = delete;

    /** How long to wait. */
    struct Patience {
        std::chrono::milliseconds start;  ///< for the worker to be ready
        std::chrono::milliseconds answer; ///< from then on
    };

    Answer ask(std::string_view request, const std::vector<int>& files, Patience patience);

    /** Ends the connection, so that ask() returns. Any thread. */
    void hangUp() const;

    /** False when it has ended, or said something unasked. */
    [[nodiscard]] bool isIdle() const;

    /** Kills it, if it lives, and tells how it ended, such as "was killed by signal 11". */
    std::string end();

private:
    Process(pid_t pid, qns::UniqueFd socket);
    Outcome awaitReady(std::chrono::milliseconds time);

    pid_t mPid;
    qns::UniqueFd mSocket;
    bool mReady = false;
};

} // namespace worker
