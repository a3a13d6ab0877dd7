// SPDX-License-Identifier: MIT
#include "importer/JobQueue.h"

#include <algorithm>
#include <utility>

namespace importer {

using namespace LibMediaPlayer;

namespace {

constexpr std::size_t kCapacity = 100'000;

} // namespace

bool JobQueue::add(std::wstring text, std::wstring folder, std::int64_t size) {
    {
        const std::lock_guard lock(mMutex);
        if (mWaiting.size() >= kCapacity)
            return false;
        if (mAnswered == mLast)
            mBytesAnswered = mBytesUnderWay = mBytesInAll = 0;
        mWaiting.push_back({++mLast, std::move(text), std::move(folder), size});
        mBytesInAll += size;
    }
    mChanged.notify_one();
    return true;
}

void JobQueue::cancel() {
    const std::lock_guard lock(mMutex);
    mCancelledUpTo = mLast;
}

void JobQueue::close() {
    {
        const std::lock_guard lock(mMutex);
        mClosed = true;
    }
    mChanged.notify_one();
}

void JobQueue::wake() {
    {
        const std::lock_guard lock(mMutex);
        mWoken = true;
    }
    mChanged.notify_one();
}

ImporterState JobQueue::status(MediaImporterStatus& status) const {
    const std::lock_guard lock(mMutex);
    status.done = std::min(mBytesAnswered + mBytesUnderWay, mBytesInAll);
    status.total = mBytesInAll;
    if (mAnswered == mLast)
        return kImporterIdle;
    return mCancelledUpTo > mAnswered ? kImporterCancelling : kImporterRunning;
}

std::size_t JobQueue::waitingCount() const {
    const std::lock_guard lock(mMutex);
    return mWaiting.size();
}

std::optional<Job> JobQueue::take() {
    return takeIf([](const Job&) { return true; }, std::chrono::milliseconds(0));
}

std::optional<Job> JobQueue::takeIf(const std::function<bool(const Job&)>& suits,
                                    std::chrono::milliseconds patience) {
    std::unique_lock lock(mMutex);
    mChanged.wait_for(lock, patience, [this] { return mClosed || !mWaiting.empty(); });
    if (mClosed || mWaiting.empty() || !suits(mWaiting.front()))
        return std::nullopt;
    Job job = std::move(mWaiting.front());
    mWaiting.pop_front();
    return job;
}

void JobQueue::wait() {
    std::unique_lock lock(mMutex);
    mChanged.wait(lock, [this] { return mClosed || mWoken || !mWaiting.empty(); });
    mWoken = false;
}

bool JobQueue::isClosed() const {
    const std::lock_guard lock(mMutex);
    return mClosed;
}

bool JobQueue::isCancelled(const Job& job) const {
    const std::lock_guard lock(mMutex);
    return mClosed || job.number <= mCancelledUpTo;
}

void JobQueue::setProgress(std::int64_t bytes) {
    const std::lock_guard lock(mMutex);
    mBytesUnderWay = bytes;
}

void JobQueue::answer(const Job& job) {
    const std::lock_guard lock(mMutex);
    mAnswered = job.number;
    mBytesAnswered += job.size;
    mBytesUnderWay = std::max<std::int64_t>(mBytesUnderWay - job.size, 0);
}

} // namespace importer
