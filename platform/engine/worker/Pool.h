// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <condition_variable>
#include <functional>
#include <memory>
#include <mutex>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "worker/Process.h"
#include "worker/Request.h"

namespace worker {

/** What QNS_MEDIA_WORKER names, else qnsmedia/media-worker beside the library. */
std::string defaultProgram();

/** When workers run. */
enum class Haste {
    kNormal,
    kWhenIdle ///< only while the machine, processor and disk, has nothing else to do
};

/**
 * Worker processes, so that a file that crashes, hangs or swells what reads it costs the question
 * about that file and nothing else. As many run as are asked at once, at most kMost. Any thread.
 */
class Pool {
public:
    /** As many as the engine has threads that ask: its caller's, the player's, the importer's. */
    static constexpr int kMost = 3;

    explicit Pool(std::string program = defaultProgram(), Haste haste = Haste::kNormal)
        : mProgram(std::move(program)), mHaste(haste) {}

    /** The one that serves who asks for somebody who waits. */
    static Pool& shared();

    struct Question {
        Request request;
        std::vector<int> files; ///< what the request is about
        Process::Patience patience;
        std::string name; ///< of the file, for the log
    };

    /** Takes an answer's bytes; false when no worker in its right mind says that. */
    using Listener = std::function<bool(std::string_view bytes)>;

    /** Returns 0 once the listener has taken the answer, or a LibMediaPlayer::Result. Ends in time.
     */
    int ask(const Question& question, const Listener& listen);

    /** From now on every question, also those that wait, is answered by kCancelled. */
    void cancel();

private:
    bool reserve(std::chrono::milliseconds time);
    void release();
    int askReserved(const Question& question, const Listener& listen);
    std::unique_ptr<Process> take();
    std::unique_ptr<Process> takeIdle();
    std::unique_ptr<Process> start() const;
    Process::Answer askBusy(Process& process, const Question& question);
    void giveBack(std::unique_ptr<Process> process);
    int lose(std::unique_ptr<Process> process, Process::Outcome outcome, const std::string& name);
    [[nodiscard]] bool isCancelled();

    const std::string mProgram;
    const Haste mHaste;
    std::mutex mMutex; ///< guards what follows
    std::vector<std::unique_ptr<Process>> mIdle;
    std::vector<Process*> mBusy;
    int mReserved = 0; ///< questions that have a worker, or may start one
    std::condition_variable mReleased;
    bool mCancelled = false;
};

} // namespace worker
