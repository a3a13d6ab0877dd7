// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <cstdint>
#include <string>
#include <utility>

namespace engine {

/** One open(): what is asked for, and how far its answer has come. Any thread may use it. */
class OpenTicket {
public:
    OpenTicket(std::uint64_t session, std::wstring path, int format)
        : mSession(session), mPath(std::move(path)), mFormat(format) {}

    [[nodiscard]] std::uint64_t session() const { return mSession; }
    [[nodiscard]] const std::wstring& path() const { return mPath; }
    [[nodiscard]] int format() const { return mFormat; }

    void setTaken() { mTaken = true; }
    [[nodiscard]] bool isTaken() const { return mTaken; }

    /** True for the first who asks, who then delivers the one answer. */
    bool claimAnswer() { return !mAnswered.exchange(true); }
    [[nodiscard]] bool isAnswered() const { return mAnswered; }

private:
    const std::uint64_t mSession;
    const std::wstring mPath;
    const int mFormat;
    std::atomic<bool> mTaken{false};
    std::atomic<bool> mAnswered{false};
};

} // namespace engine
