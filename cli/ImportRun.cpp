// SPDX-License-Identifier: MIT
#include "cli/ImportRun.h"

#include <algorithm>
#include <utility>

#include "cli/ImportProgress.h"
#include "cli/Output.h"
#include "qnsmedia/Error.h"

using namespace std::chrono_literals;
using qnsmedia::ImporterState;

namespace {

constexpr auto kTick = 100ms;

/** After it the daemon, which is idle, has no more to tell. */
constexpr auto kQuiet = 500ms;

constexpr auto kCancelPatience = 10s;

constexpr int kUnknownResult = -1;

} // namespace

ImportRun::ImportRun(qnsmedia::Connection& connection, const std::vector<ImportFile>& files,
                     std::string folder, bool showsProgress)
    : mFiles(files),
      mFolder(std::move(folder)),
      mShowsProgress(showsProgress),
      mOutcomes(files, mFolder),
      mImporter(connection) {
    for (const ImportFile& file : files)
        mBytesInAll += file.size;
    mImporter.onNotification([this](const qnsmedia::ImportNotification& notification) {
        mLoop.post([this, notification] { notified(notification); });
    });
    connection.onLost([this] {
        mLoop.post([this] {
            mError = std::make_exception_ptr(qnsmedia::ConnectionLost("the daemon has ended"));
        });
    });
}

int ImportRun::run() {
    mLoop.catchSignals();
    sendAll();
    if (mSignal == 0)
        sendOpenOnes();
    if (mSignal != 0)
        cancel();
    hideProgress();
    return mSignal;
}

std::chrono::milliseconds ImportRun::elapsed() const {
    return std::chrono::duration_cast<std::chrono::milliseconds>(Clock::now() - mBegin);
}

void ImportRun::sendAll() {
    for (std::size_t index = 0; index < mFiles.size() && mSignal == 0; ++index)
        if (!mOutcomes.isAmbiguous(index))
            send(index);
    mOutcomes.setNoCurrent();
    waitUntil([this] { return allKnown() || isQuiet(); });
}

/** Nobody else's imports are mistaken for it when it is the only one. */
void ImportRun::sendOpenOnes() {
    mOutcomes.beginOneByOne();
    for (std::size_t index = 0; index < mFiles.size() && mSignal == 0; ++index) {
        const auto isKnown = [&] { return mOutcomes.of(index).known; };
        if (isKnown())
            continue;
        send(index);
        if (waitUntil([&] { return isKnown() || isQuiet(); }) && !isKnown())
            mOutcomes.settle(index, kUnknownResult, "the daemon did not tell what became of it");
    }
}

/** Waits for its turn: the daemon has room for one import that is on its way. */
void ImportRun::send(std::size_t index) {
    mSending = true;
    mOutcomes.setCurrent(index);
    mImporter.importFile(mFiles[index].path, mFolder, [this, index](std::exception_ptr error) {
        mLoop.post([this, index, error] { sent(index, error); });
    });
    waitUntil([this] { return !mSending; });
}

void ImportRun::sent(std::size_t index, std::exception_ptr error) {
    mSending = false;
    mIdle = false;
    mNews = Clock::now();
    try {
        if (error)
            std::rethrow_exception(error);
    } catch (const qnsmedia::TimedOut&) {
        // Another client may have got the answer.
    } catch (const qnsmedia::Refused& refused) {
        mOutcomes.settle(index, kUnknownResult, refused.what());
    } catch (...) {
        mError = std::current_exception();
    }
}

/** All that is queued, whoever asked for it. A second signal does not wait for the end of it. */
void ImportRun::cancel() {
    const int first = mSignal;
    const auto deadline = Clock::now() + kCancelPatience;
    mSignal = 0;
    mIdle = false;
    mImporter.cancel([this](std::exception_ptr) {
        mLoop.post([this] {
            mIdle = false;
            mNews = Clock::now();
        });
    });
    waitUntil([&] { return isQuiet() || Clock::now() > deadline; });
    mSignal = first;
}

/** False when a signal came first. */
bool ImportRun::waitUntil(const Condition& condition) {
    while (mSignal == 0 && !condition())
        wait();
    return mSignal == 0;
}

void ImportRun::wait() {
    mLoop.wait(kTick);
    if (const int signal = mLoop.takeSignal(); signal != 0)
        mSignal = signal;
    if (mError) {
        hideProgress();
        std::rethrow_exception(mError);
    }
    if (Clock::now() - mAsked < kTick)
        return;
    askStatus();
    showProgress();
}

void ImportRun::askStatus() {
    mAsked = Clock::now();
    mImporter.status([this](std::exception_ptr error, const qnsmedia::ImporterStatus& status) {
        mLoop.post([this, error, status] { gotStatus(error, status); });
    });
}

void ImportRun::gotStatus(std::exception_ptr error, const qnsmedia::ImporterStatus& status) {
    if (error)
        return; // another client may have got the answer; it is asked for again
    mIdle = status.state == ImporterState::idle || status.state == ImporterState::unknown;
    mQueueDone = status.bytesDone;
}

void ImportRun::notified(const qnsmedia::ImportNotification& notification) {
    mNews = Clock::now();
    mOutcomes.tell(notification);
}

bool ImportRun::isQuiet() const {
    return mIdle && Clock::now() - mNews > kQuiet;
}

bool ImportRun::allKnown() const {
    return mOutcomes.knownCount() == mFiles.size();
}

void ImportRun::showProgress() {
    if (!mShowsProgress)
        return;
    const std::int64_t bytes = std::clamp(mQueueDone, mOutcomes.knownBytes(),
                                          std::max(mOutcomes.knownBytes(), mBytesInAll));
    const std::string text =
        progressText({mOutcomes.knownCount(), mFiles.size(), bytes, mBytesInAll, elapsed()});
    if (text == mShown)
        return;
    mShown = text;
    show("\r" + text + "\033[K");
}

void ImportRun::hideProgress() {
    if (!mShown.empty())
        show("\r\033[K");
    mShown.clear();
}
