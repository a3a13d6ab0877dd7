// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <condition_variable>
#include <cstdint>
#include <deque>
#include <functional>
#include <mutex>
#include <optional>
#include <string>

#include "LibMediaPlayer/IMediaImporter.h"

namespace importer {

/** One import as it was asked for. */
struct Job {
    std::uint64_t number = 0; ///< counts up, in the order of the requests
    std::wstring text;        ///< the file, as the client wrote it
    std::wstring folder;
    std::int64_t size = 0; ///< bytes, as far as it could be told at once
};

/**
 * The imports that wait, and the account of those that are under way. Jobs are answered in the
 * order in which they came. Any thread.
 */
class JobQueue {
public:
    /** False when there is room for no more. */
    bool add(std::wstring text, std::wstring folder, std::int64_t size);

    /** Everything that has no answer yet is to be cancelled. */
    void cancel();

    /** Everything that has no answer yet is to be dropped without one. */
    void close();

    LibMediaPlayer::ImporterState status(LibMediaPlayer::MediaImporterStatus& status) const;
    [[nodiscard]] std::size_t waitingCount() const;

    /** The worker has something else to do. */
    void wake();

    /** The worker's side. */
    std::optional<Job> take();
    /** The next job if it suits; waits so long for there to be one. */
    std::optional<Job> takeIf(const std::function<bool(const Job&)>& suits,
                              std::chrono::milliseconds patience);
    /** Until there is a job to take, somebody has called wake(), or the queue is closed. */
    void wait();
    [[nodiscard]] bool isClosed() const;
    [[nodiscard]] bool isCancelled(const Job& job) const;
    /** Bytes of the jobs under way, beyond those that were answered. */
    void setProgress(std::int64_t bytes);
    /** The job counts as done: before its last notification, so that the two agree. */
    void answer(const Job& job);

private:
    mutable std::mutex mMutex; ///< guards all below
    std::condition_variable mChanged;
    std::deque<Job> mWaiting;
    std::uint64_t mLast = 0;          ///< number of the newest job
    std::uint64_t mAnswered = 0;      ///< jobs up to this one have their answer
    std::uint64_t mCancelledUpTo = 0; ///< jobs up to this one are to be cancelled
    bool mClosed = false;
    bool mWoken = false;
    std::int64_t mBytesAnswered = 0;
    std::int64_t mBytesUnderWay = 0;
    std::int64_t mBytesInAll = 0;
};

} // namespace importer
