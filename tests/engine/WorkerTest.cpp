// SPDX-License-Identifier: MIT
#include "worker/Media.h"

#include <gmock/gmock.h>

#include <atomic>
#include <csignal>
#include <filesystem>
#include <fstream>
#include <mutex>
#include <sched.h>
#include <set>
#include <sys/stat.h>
#include <sys/wait.h>
#include <thread>

#include "LibMediaPlayer/Result.h"
#include "tests/engine/Samples.h"
#include "tests/support/TestFolder.h"

using namespace LibMediaPlayer;
using namespace std::chrono_literals;
using discoverer::Details;
using worker::Pool;
namespace fs = std::filesystem;

namespace {

/** Workers that do what some files say. */
class Worker : public testing::Test {
protected:
    std::string hostile(const std::string& order) {
        std::ofstream(mFolder.path(order)) << "hostile: " << order;
        return mFolder.path(order);
    }

    static int describe(const std::string& path, Details& details, Pool& pool) {
        probe::RegularFile file;
        const int result = file.open(path);
        return result == kOk ? worker::describe(file, path, details, pool) : result;
    }

    int describe(const std::string& path) {
        Details details;
        return describe(path, details, mPool);
    }

    /** What a worker that a file has taken over says. */
    std::string told(const std::string& order, Pool& pool) {
        Details details;
        EXPECT_EQ(describe(hostile(order), details, pool), kOk) << order;
        return details.info.system.mediaType;
    }

    pid_t idleWorker(Pool& pool) { return std::stoi(told("count", pool)); }

    TestFolder mFolder;
    Pool mPool{QNS_HOSTILE_WORKER};
};

std::size_t descriptorCount(pid_t process) {
    const fs::directory_iterator all("/proc/" + std::to_string(process) + "/fd");
    return static_cast<std::size_t>(std::distance(begin(all), end(all)));
}

bool isGone(pid_t process) {
    return ::kill(process, 0) != 0 && errno == ESRCH;
}

} // namespace

TEST_F(Worker, ReadsWhatItIsGiven) {
    Details details;
    ASSERT_EQ(describe(samplePath("film.mp4"), details, mPool), kOk);
    EXPECT_EQ(details.info.video.width, 192);
    EXPECT_TRUE(details.hasPicture);
    EXPECT_EQ(describe(samplePath("text.txt")), kNotMedia);
    EXPECT_EQ(describe(samplePath("missing.mp4")), kNotFound);
}

TEST_F(Worker, AFileThatEndsItIsDamagedAndTheNextIsRead) {
    for (const char* const order : {"crash", "leave"}) {
        EXPECT_EQ(describe(hostile(order)), kDamaged) << order;
        EXPECT_EQ(describe(samplePath("film.mp4")), kOk) << order;
    }
}

TEST_F(Worker, AFileThatHangsTakesTooLongAndTheNextIsRead) {
    const auto begin = std::chrono::steady_clock::now();
    EXPECT_EQ(describe(hostile("hang")), kTimedOut);
    EXPECT_LT(std::chrono::steady_clock::now() - begin, 5s);
    EXPECT_EQ(describe(samplePath("film.mp4")), kOk);
}

TEST_F(Worker, EveryKindOfQuestionSurvivesAFileThatEndsIt) {
    const std::string crash = hostile("crash");
    const auto look = worker::lookAt(crash, mPool);
    ASSERT_TRUE(std::holds_alternative<probe::LookFailure>(look));
    EXPECT_EQ(std::get<probe::LookFailure>(look).result, kDamaged);
    EXPECT_EQ(worker::drawThumbnail(crash, mPool).result, kDamaged);
    EXPECT_EQ(worker::draw(crash, {0, 8, 8, {}}, -1, mPool), kDamaged);
    std::string names;
    EXPECT_EQ(worker::findDemuxers(names, mPool), kOk);
    EXPECT_THAT(names, testing::HasSubstr("matroska"));
}

#ifndef QNS_SANITIZED // the sanitizers need all of memory, and calls that are forbidden otherwise

TEST_F(Worker, AFileThatWantsAllMemoryGetsABoundedPartOfIt) {
    EXPECT_EQ(describe(hostile("bloat")), kInternal);
    EXPECT_EQ(describe(samplePath("film.mp4")), kOk);
}

TEST_F(Worker, AFileThatHasTakenItOverReachesNothing) {
    EXPECT_EQ(told("break out", mPool), "possible: ");
}

#endif

TEST_F(Worker, OneThatSaysWhatCannotBeIsNotBelievedNorAskedAgain) {
    for (const char* const order : {"lie", "boast", "babble"}) {
        const pid_t liar = idleWorker(mPool);
        EXPECT_EQ(describe(hostile(order)), kInternal) << order;
        EXPECT_TRUE(isGone(liar)) << order;
        EXPECT_EQ(describe(samplePath("film.mp4")), kOk) << order;
    }
}

TEST_F(Worker, OneThatWasKilledWhileItWaitedIsReplacedUnnoticed) {
    for (int turn = 0; turn < 10; ++turn) {
        const pid_t worker = idleWorker(mPool);
        // Its end is seen by its parent, which is this process: it does not vanish before.
        ::kill(worker, SIGKILL);
        siginfo_t info{};
        ::waitid(P_PID, static_cast<id_t>(worker), &info, WEXITED | WNOWAIT);
        EXPECT_EQ(describe(samplePath("film.mp4")), kOk);
        EXPECT_TRUE(isGone(worker));
    }
}

TEST_F(Worker, KeepsNothingOfTheFilesItHasRead) {
    const pid_t worker = idleWorker(mPool);
    const std::size_t before = descriptorCount(worker);
    for (int turn = 0; turn < 100; ++turn) {
        EXPECT_EQ(describe(samplePath("film.mp4")), kOk);
        EXPECT_EQ(describe(samplePath("text.txt")), kNotMedia);
    }
    EXPECT_EQ(idleWorker(mPool), worker);
    EXPECT_EQ(descriptorCount(worker), before);
}

TEST_F(Worker, EndsWithWhoHasIt) {
    pid_t worker = 0;
    {
        Pool pool(QNS_HOSTILE_WORKER);
        worker = idleWorker(pool);
        EXPECT_FALSE(isGone(worker));
    }
    EXPECT_TRUE(isGone(worker));
}

TEST_F(Worker, IsLeftAloneWhenItsAnswerIsNoLongerWanted) {
    std::thread asking([this] { EXPECT_EQ(describe(hostile("hang")), kCancelled); });
    const auto begin = std::chrono::steady_clock::now();
    mPool.cancel();
    asking.join();
    EXPECT_LT(std::chrono::steady_clock::now() - begin, 2s) << "before it is too late";
    EXPECT_EQ(describe(samplePath("film.mp4")), kCancelled);
}

TEST_F(Worker, RunsOnlyWhenTheMachineIsIdleIfThatIsWanted) {
    Pool pool(QNS_HOSTILE_WORKER, worker::Haste::kWhenIdle);
    EXPECT_EQ(::sched_getscheduler(idleWorker(pool)), SCHED_IDLE);
    EXPECT_EQ(::sched_getscheduler(idleWorker(mPool)), SCHED_OTHER);
}

TEST_F(Worker, ThatCannotBeStartedIsNotAvailable) {
    for (const char* const program : {"/nowhere/media-worker", "/bin/false"}) {
        Pool pool(program);
        Details details;
        EXPECT_EQ(describe(samplePath("film.mp4"), details, pool), kNotAvailable) << program;
    }
}

TEST_F(Worker, ThatStartsSlowlyServesTheQuestionAfterTheOneThatIsTooEarly) {
    const std::string gate = mFolder.path("gate");
    const std::string program = mFolder.path("slow-worker");
    ASSERT_EQ(::mkfifo(gate.c_str(), 0600), 0);
    std::ofstream(program) << "#!/bin/sh\nread word <'" << gate
                           << "'\nexec " QNS_HOSTILE_WORKER "\n";
    fs::permissions(program, fs::perms::owner_all);
    Pool pool(program);
    EXPECT_EQ(worker::draw(samplePath("film.mp4"), {0, 8, 8, {}}, 1, pool), kTimedOut);
    std::ofstream(gate) << "go\n";
    Details details;
    EXPECT_EQ(describe(samplePath("film.mp4"), details, pool), kOk);
}

TEST_F(Worker, AFileThatEndsItCostsNobodyElse) {
    const std::string crash = hostile("crash");
    std::atomic<int> wrong{0};
    const auto ask = [&](const std::string& path, int expected) {
        for (int turn = 0; turn < 20; ++turn)
            wrong += describe(path) == expected ? 0 : 1;
    };
    std::vector<std::thread> threads;
    threads.emplace_back(ask, crash, kDamaged);
    for (const char* const name : {"film.mp4", "film.mkv", "sound.ogg"})
        threads.emplace_back(ask, samplePath(name), kOk);
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(wrong, 0);
}

TEST_F(Worker, IsSharedByWhoeverAsks) {
    const std::string count = hostile("count");
    std::atomic<int> read{0};
    std::mutex mutex;
    std::set<pid_t> workers;
    std::vector<std::thread> threads;
    for (int number = 0; number < 10; ++number)
        threads.emplace_back([&] {
            for (int turn = 0; turn < 20; ++turn)
                read += describe(samplePath("film.mp4")) == kOk ? 1 : 0;
            Details details;
            EXPECT_EQ(describe(count, details, mPool), kOk);
            const pid_t worker = std::stoi(details.info.system.mediaType);
            const std::lock_guard lock(mutex);
            workers.insert(worker);
        });
    for (std::thread& thread : threads)
        thread.join();
    EXPECT_EQ(read, 200);
    EXPECT_LE(workers.size(), static_cast<std::size_t>(Pool::kMost));
}

TEST(WorkerProgram, RefusesToBeStartedByHand) {
    EXPECT_NE(std::system((worker::defaultProgram() + " 2>/dev/null").c_str()), 0);
}
