// SPDX-License-Identifier: MIT
#pragma once

#include <condition_variable>
#include <cstddef>
#include <mutex>
#include <string>
#include <string_view>
#include <vector>

/** Lines that one thread collects and others wait for. */
class Lines {
public:
    void add(std::string line);

    /** No line comes any more. */
    void close();

    /**
     * Waits until `count` lines contain `text`. False when the deadline passes, or the lines
     * end, before.
     */
    bool waitFor(std::string_view text, std::size_t count = 1);

    /** Waits for close(). */
    bool waitForEnd();

    [[nodiscard]] std::vector<std::string> all() const;

    /** The lines that contain `text`, in order. */
    [[nodiscard]] std::vector<std::string> with(std::string_view text) const;

    /** All of them as one text, for messages. */
    [[nodiscard]] std::string joined() const;

private:
    [[nodiscard]] std::size_t count(std::string_view text) const;

    mutable std::mutex mMutex; ///< guards all below
    std::condition_variable mChanged;
    std::vector<std::string> mLines;
    bool mClosed = false;
};
