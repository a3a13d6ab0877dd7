// SPDX-License-Identifier: MIT
#pragma once

#include <cstdio>
#include <string>

#include <sys/mman.h>
#include <unistd.h>

#include "base/UniqueFd.h"

/** Takes what the process writes to standard output until it is asked for it. */
class OutputCapture {
public:
    OutputCapture() : mStandardOutput(::dup(STDOUT_FILENO)), mFile(::memfd_create("output", 0)) {
        std::fflush(stdout);
        ::dup2(mFile.get(), STDOUT_FILENO);
    }
    ~OutputCapture() { restore(); }
    OutputCapture(const OutputCapture&) = delete;
    OutputCapture& operator=(const OutputCapture&) = delete;

    /** Ends the capture. */
    std::string text() {
        restore();
        std::string result(static_cast<std::size_t>(::lseek(mFile.get(), 0, SEEK_END)), '\0');
        const auto length = ::pread(mFile.get(), result.data(), result.size(), 0);
        result.resize(static_cast<std::size_t>(length < 0 ? 0 : length));
        return result;
    }

private:
    void restore() {
        std::fflush(stdout);
        if (mStandardOutput)
            ::dup2(mStandardOutput.get(), STDOUT_FILENO);
        mStandardOutput.reset();
    }

    qns::UniqueFd mStandardOutput;
    qns::UniqueFd mFile;
};
