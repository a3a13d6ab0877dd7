// SPDX-License-Identifier: MIT
#include "worker/Pool.h"

#include <algorithm>
#include <cerrno>
#include <cstdlib>
#include <dlfcn.h>
#include <syslog.h>
#include <system_error>
#include <unistd.h>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "handle/Barrier.h"
#include "qnsys.h"
#include "worker/Message.h"
#include "worker/Server.h"

namespace worker {

using namespace LibMediaPlayer;

namespace {

/** What a question comes to whose worker is lost. */
struct Loss {
    int result;
    const char* event; ///< null: how the process ended
};

Loss lossOf(Process::Outcome outcome) {
    switch (outcome) {
    case Process::Outcome::kNotStarted:
        return {kNotAvailable, nullptr};
    case Process::Outcome::kTimedOut:
        return {kTimedOut, "took too long"};
    case Process::Outcome::kAnswered:
        return {kInternal, "said what cannot be"};
    case Process::Outcome::kStarting:
    case Process::Outcome::kEnded:
        break;
    }
    return {kDamaged, nullptr};
}

/** The folder of the library, or program, that this code is in. */
std::string ownFolder() {
    static const char mark = 0;
    Dl_info info{};
    const std::string path = ::dladdr(&mark, &info) && info.dli_fname ? info.dli_fname : "";
    return path.substr(0, path.rfind('/') + 1);
}

} // namespace

std::string defaultProgram() {
    if (const char* const chosen = ::secure_getenv("QNS_MEDIA_WORKER"))
        return chosen;
    const std::string beside = ownFolder() + "qnsmedia/media-worker";
    // Programs that have the engine built in lie beside the folder of libraries.
    return ::access(beside.c_str(), X_OK) == 0 ? beside
                                               : ownFolder() + "../lib/qnsmedia/media-worker";
}

Pool& Pool::shared() {
    // Never destroyed: threads that are left behind may still ask. The workers end with this
    // process.
    static Pool& pool = *new Pool;
    return pool;
}

int Pool::ask(const Question& question, const Listener& listen) {
    if (!reserve(question.patience.start))
        return kTimedOut;
    const int result =
        handle::guarded(static_cast<int>(kInternal), [&] { return askReserved(question, listen); });
    release();
    return result;
}

/** False when all workers are busy for so long. */
bool Pool::reserve(std::chrono::milliseconds time) {
    std::unique_lock lock(mMutex);
    if (!mReleased.wait_for(lock, time, [this] { return mReserved < kMost; }))
        return false;
    ++mReserved;
    return true;
}

void Pool::release() {
    const std::lock_guard lock(mMutex);
    --mReserved;
    mReleased.notify_one();
}

int Pool::askReserved(const Question& question, const Listener& listen) {
    auto process = take();
    if (!process)
        return kNotAvailable;
    const Process::Answer answer = askBusy(*process, question);
    if (isCancelled())
        return kCancelled;
    if (answer.outcome == Process::Outcome::kStarting) {
        // On a device that is so slow the next question finds it ready.
        giveBack(std::move(process));
        return kTimedOut;
    }
    if (answer.outcome != Process::Outcome::kAnswered || !listen(answer.bytes))
        return lose(std::move(process), answer.outcome, question.name);
    giveBack(std::move(process));
    return kOk;
}

Process::Answer Pool::askBusy(Process& process, const Question& question) {
    MessageWriter message;
    Request request = question.request;
    message(request);
    {
        const std::lock_guard lock(mMutex);
        mBusy.push_back(&process);
        if (mCancelled)
            process.hangUp();
    }
    Process::Answer answer = process.ask(message.bytes(), question.files, question.patience);
    const std::lock_guard lock(mMutex);
    mBusy.erase(std::find(mBusy.begin(), mBusy.end(), &process));
    return answer;
}

void Pool::cancel() {
    const std::lock_guard lock(mMutex);
    mCancelled = true;
    for (Process* const process : mBusy)
        process->hangUp();
}

bool Pool::isCancelled() {
    const std::lock_guard lock(mMutex);
    return mCancelled;
}

std::unique_ptr<Process> Pool::take() {
    while (auto process = takeIdle()) {
        if (process->isIdle())
            return process;
    }
    return start();
}

std::unique_ptr<Process> Pool::takeIdle() {
    const std::lock_guard lock(mMutex);
    if (mIdle.empty())
        return nullptr;
    auto process = std::move(mIdle.back());
    mIdle.pop_back();
    return process;
}

std::unique_ptr<Process> Pool::start() const {
    auto process = Process::start(mProgram, mHaste == Haste::kWhenIdle ? kIdleOption : nullptr);
    if (!process)
        qnsys_syslog(LOG_ERR, "Media worker cannot be started: %s: %s", mProgram.c_str(),
                     std::generic_category().message(errno).c_str());
    return process;
}

void Pool::giveBack(std::unique_ptr<Process> process) {
    const std::lock_guard lock(mMutex);
    if (process)
        mIdle.push_back(std::move(process));
}

int Pool::lose(std::unique_ptr<Process> process, Process::Outcome outcome,
               const std::string& name) {
    const std::string end = process->end();
    const Loss loss = lossOf(outcome);
    qnsys_syslog(LOG_WARNING, "Media worker %s, reading %s", loss.event ? loss.event : end.c_str(),
                 name.c_str());
    if (outcome != Process::Outcome::kNotStarted)
        giveBack(start());
    return loss.result;
}

} // namespace worker
