// SPDX-License-Identifier: MIT
#include "ptc/LTReceiver.h"

#include "tests/ptc/CountedWaits.h"
#include "tests/ptc/Eventually.h"
#include "tests/ptc/Gate.h"
#include "tests/ptc/ProcessState.h"
#include "tests/ptc/TestAdapter.h"

#include <gtest/gtest.h>

#include <chrono>
#include <future>
#include <memory>
#include <stdexcept>
#include <thread>
#include <vector>

using namespace std::chrono_literals;

namespace {

/** Posts one more event and waits until the worker has come to it. */
void waitForWorker(LTReceiver& receiver, long lastMethod, const Gate& last) {
    receiver.recv(makeEvent(1, lastMethod).release());
    ASSERT_TRUE(last.wait());
}

} // namespace

TEST(LTReceiver, DispatchesOnAThreadOfItsOwnWithoutHoldingTheCallerUp) {
    Gate started;
    Gate mayReturn;
    Gate done;
    std::thread::id worker;
    LTReceiver receiver(8);
    EXPECT_EQ(receiver.getId(), 8);
    EXPECT_TRUE(receiver.isQueueEmpty());
    receiver.addAdapter(new TestAdapter(1, [&](PTC::Event& event) {
        if (event.methodId == 2)
            return done.open();
        worker = std::this_thread::get_id();
        started.open();
        EXPECT_TRUE(mayReturn.wait());
    }));
    receiver.recv(makeEvent(1, 1).release());
    ASSERT_TRUE(started.wait());
    receiver.recv(makeEvent(1, 2).release());
    EXPECT_FALSE(receiver.isQueueEmpty());
    EXPECT_FALSE(done.isOpen());
    mayReturn.open();
    ASSERT_TRUE(done.wait());
    EXPECT_NE(worker, std::this_thread::get_id());
}

TEST(LTReceiver, DispatchesEventsThatWaitedInOnePassAndInOrder) {
    Gate started;
    Gate mayReturn;
    Gate done;
    std::vector<long> methods;
    std::vector<int> wakeUps;
    LTReceiver receiver(8);
    receiver.addAdapter(new TestAdapter(1, [&](PTC::Event& event) {
        methods.push_back(event.methodId);
        wakeUps.push_back(counted_waits::wakeUps());
        if (event.methodId == 0) {
            started.open();
            EXPECT_TRUE(mayReturn.wait());
        }
        if (event.methodId == 3)
            done.open();
    }));
    receiver.recv(makeEvent(1, 0).release());
    ASSERT_TRUE(started.wait());
    for (const long method : {1L, 2L, 3L})
        receiver.recv(makeEvent(1, method).release());
    mayReturn.open();
    ASSERT_TRUE(done.wait());
    EXPECT_EQ(methods, (std::vector<long>{0, 1, 2, 3}));
    EXPECT_EQ(wakeUps, std::vector<int>(4, wakeUps.front()));
}

TEST(LTReceiver, KeepsTheOrderOfEachOfEightThreadsAndCallsOneAtATime) {
    constexpr long kThreads = 8;
    constexpr long kEvents = 500;
    Gate done;
    std::vector<long> next(kThreads, 0);
    std::atomic<int> inside{0};
    long total = 0;
    LTReceiver receiver(8);
    for (long object = 0; object < kThreads; ++object)
        receiver.addAdapter(new TestAdapter(object, [&, object](PTC::Event& event) {
            EXPECT_EQ(++inside, 1);
            EXPECT_EQ(event.methodId, next[static_cast<std::size_t>(object)]++);
            --inside;
            if (++total == kThreads * kEvents)
                done.open();
        }));
    std::vector<std::thread> threads;
    for (long object = 0; object < kThreads; ++object)
        threads.emplace_back([&receiver, object] {
            for (long method = 0; method < kEvents; ++method)
                receiver.recv(makeEvent(object, method).release());
        });
    for (auto& thread : threads)
        thread.join();
    EXPECT_TRUE(done.wait());
}

TEST(LTReceiver, EndsPromptlyWhenIdle) {
    const auto start = std::chrono::steady_clock::now();
    { LTReceiver receiver(8); }
    EXPECT_LT(std::chrono::steady_clock::now() - start, kPatience);
}

TEST(LTReceiver, WaitsForTheCallThatIsBeingDispatchedAndDropsTheRest) {
    Gate started;
    Gate mayReturn;
    std::atomic<bool> returned{false};
    std::atomic<int> calls{0};
    auto receiver = std::make_unique<LTReceiver>(8);
    receiver->addAdapter(new TestAdapter(1, [&](PTC::Event&) {
        ++calls;
        started.open();
        EXPECT_TRUE(mayReturn.wait());
        returned = true;
    }));
    for (const long method : {1L, 2L, 3L})
        receiver->recv(makeEvent(1, method).release());
    ASSERT_TRUE(started.wait());
    auto end = std::async(std::launch::async, [&receiver] { receiver.reset(); });
    EXPECT_EQ(end.wait_for(50ms), std::future_status::timeout);
    mayReturn.open();
    ASSERT_EQ(end.wait_for(kPatience), std::future_status::ready);
    EXPECT_TRUE(returned);
    EXPECT_EQ(calls, 1);
}

TEST(LTReceiver, DeletesItsAdaptersAfterTheWorkerHasEnded) {
    Gate started;
    Gate mayReturn;
    std::atomic<bool> returned{false};
    bool deletedAfterwards = false;
    auto receiver = std::make_unique<LTReceiver>(8);
    auto* const adapter = new TestAdapter(1, [&](PTC::Event&) {
        started.open();
        EXPECT_TRUE(mayReturn.wait());
        returned = true;
    });
    adapter->onDestroyed = [&] { deletedAfterwards = returned; };
    receiver->addAdapter(adapter);
    receiver->recv(makeEvent(1, 1).release());
    ASSERT_TRUE(started.wait());
    auto end = std::async(std::launch::async, [&receiver] { receiver.reset(); });
    mayReturn.open();
    end.get();
    EXPECT_TRUE(deletedAfterwards);
}

TEST(LTReceiver, GoesOnAfterAnAdapterThatThrows) {
    Gate done;
    LTReceiver receiver(8);
    receiver.addAdapter(new TestAdapter(1, [&done](PTC::Event& event) {
        switch (event.methodId) {
        case 1:
            throw std::runtime_error("a call that failed");
        case 2:
            throw 2;
        default:
            done.open();
        }
    }));
    receiver.recv(makeEvent(1, 1).release());
    receiver.recv(makeEvent(1, 2).release());
    waitForWorker(receiver, 3, done);
}

TEST(LTReceiver, IgnoresEventsForUnknownObjects) {
    Gate done;
    LTReceiver receiver(8);
    receiver.addAdapter(new TestAdapter(1, [&done](PTC::Event&) { done.open(); }));
    receiver.recv(makeEvent(2, 1).release());
    receiver.recv(makeEvent(1, 1, true).release());
    waitForWorker(receiver, 1, done);
}

TEST(LTReceiver, GoesOnAfterASignalHandlerHasRunOnItsWorker) {
    Gate done;
    LTReceiver receiver(8);
    receiver.addAdapter(new TestAdapter(1, [&done](PTC::Event& event) {
        if (event.methodId == 1)
            done.open();
    }));
    for (int round = 0; round < 100; ++round) {
        interruptOtherThreads();
        receiver.recv(makeEvent(1, 0).release());
    }
    waitForWorker(receiver, 1, done);
}

TEST(LTReceiver, LetsACallPostAnEventToItsOwnReceiver) {
    Gate done;
    LTReceiver receiver(8);
    receiver.addAdapter(new TestAdapter(1, [&](PTC::Event& event) {
        if (event.methodId == 5)
            return done.open();
        receiver.recv(makeEvent(1, event.methodId + 1).release());
    }));
    receiver.recv(makeEvent(1, 0).release());
    EXPECT_TRUE(done.wait());
}

TEST(LTReceiver, KeepsAnEventWhosePostFailedForTheNextOne) {
    Gate done;
    std::vector<long> methods;
    LTReceiver receiver(8);
    receiver.addAdapter(new TestAdapter(1, [&](PTC::Event& event) {
        methods.push_back(event.methodId);
        if (event.methodId == 2)
            done.open();
    }));
    {
        const counted_waits::FailingPosts failing;
        receiver.recv(makeEvent(1, 1).release());
    }
    EXPECT_FALSE(receiver.isQueueEmpty());
    waitForWorker(receiver, 2, done);
    EXPECT_EQ(methods, (std::vector<long>{1, 2}));
}

// What is queued for it is freed all the same, which is for the sanitizers to find.
TEST(LTReceiver, EndsItsWorkerQuietlyWhenThatCanWaitNoLonger) {
    const auto threads = threadCount();
    Gate done;
    auto* const adapter = new TestAdapter(1, [&done](PTC::Event&) {
        counted_waits::failNextWait();
        done.open();
    });
    LTReceiver receiver(8);
    receiver.addAdapter(adapter);
    waitForWorker(receiver, 1, done);
    ASSERT_TRUE(eventually([threads] { return threadCount() == threads; }));
    receiver.recv(makeEvent(1, 2).release());
    EXPECT_FALSE(receiver.isQueueEmpty());
    EXPECT_EQ(adapter->calls, 1);
}
