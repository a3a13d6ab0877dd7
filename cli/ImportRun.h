// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <cstddef>
#include <exception>
#include <functional>
#include <string>
#include <vector>

#include "cli/EventLoop.h"
#include "cli/ImportFiles.h"
#include "cli/ImportOutcomes.h"
#include "qnsmedia/Importer.h"

/**
 * Imports files and finds out what has become of each. All of it runs on the thread that made
 * it; what the library tells on its own thread is handed over.
 */
class ImportRun {
public:
    using Clock = std::chrono::steady_clock;

    /** `files` must outlive it. Progress is shown on standard output, a terminal. */
    ImportRun(qnsmedia::Connection& connection, const std::vector<ImportFile>& files,
              std::string folder, bool showsProgress);

    /** Returns the signal that cancelled it, else 0. Throws qnsmedia::Error and OutputFailed. */
    int run();

    [[nodiscard]] const ImportOutcomes& outcomes() const { return mOutcomes; }
    [[nodiscard]] std::chrono::milliseconds elapsed() const;

private:
    using Condition = std::function<bool()>;

    void sendAll();
    void sendOpenOnes();
    void send(std::size_t index);
    void cancel();

    bool waitUntil(const Condition& condition);
    void wait();
    void askStatus();
    [[nodiscard]] bool isQuiet() const;
    [[nodiscard]] bool allKnown() const;

    void sent(std::size_t index, std::exception_ptr error);
    void notified(const qnsmedia::ImportNotification& notification);
    void gotStatus(std::exception_ptr error, const qnsmedia::ImporterStatus& status);
    void showProgress();
    void hideProgress();

    const std::vector<ImportFile>& mFiles;
    const std::string mFolder;
    const bool mShowsProgress;
    const Clock::time_point mBegin = Clock::now();
    std::int64_t mBytesInAll = 0;
    ImportOutcomes mOutcomes;
    EventLoop mLoop;
    std::exception_ptr mError;
    int mSignal = 0;
    bool mSending = false;
    bool mIdle = false;       ///< the daemon has worked off all that was sent
    Clock::time_point mNews;  ///< when the daemon told something last
    Clock::time_point mAsked; ///< when its status was asked for last
    std::int64_t mQueueDone = 0;
    std::string mShown;
    qnsmedia::Importer mImporter; ///< last: what it tells uses the others
};
