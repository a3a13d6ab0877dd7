// SPDX-License-Identifier: MIT
#include "cli/EventLoop.h"

#include <atomic>
#include <cerrno>
#include <csignal>
#include <sys/eventfd.h>
#include <system_error>
#include <unistd.h>
#include <utility>

namespace {

constexpr int kCaught[] = {SIGINT, SIGTERM, SIGHUP};

/** For the signal handler, which gets nothing but the number. */
std::atomic<int> gWakeUp{-1};
std::atomic<int> gSignal{0};
static_assert(std::atomic<int>::is_always_lock_free);

void onSignal(int number) {
    const int before = errno;
    gSignal = number;
    ::eventfd_write(gWakeUp, 1);
    errno = before;
}

void setHandler(void (*handler)(int)) {
    struct sigaction action {};
    action.sa_handler = handler;
    action.sa_flags = SA_RESTART;
    for (const int number : kCaught)
        ::sigaction(number, &action, nullptr);
}

} // namespace

EventLoop::EventLoop() : mWakeUp(::eventfd(0, EFD_CLOEXEC | EFD_NONBLOCK)) {
    if (mWakeUp < 0)
        throw std::system_error(errno, std::generic_category(), "eventfd");
}

EventLoop::~EventLoop() {
    if (mCatchesSignals)
        setHandler(SIG_DFL);
    gWakeUp = -1;
    ::close(mWakeUp);
}

void EventLoop::post(Task task) {
    {
        const std::lock_guard lock(mMutex);
        mTasks.push_back(std::move(task));
    }
    ::eventfd_write(mWakeUp, 1);
}

void EventLoop::catchSignals() {
    gWakeUp = mWakeUp;
    mCatchesSignals = true;
    setHandler(onSignal);
}

int EventLoop::takeSignal() {
    return gSignal.exchange(0);
}

bool EventLoop::wait(std::chrono::milliseconds time, int input, short events) {
    pollfd watched[] = {{mWakeUp, POLLIN, 0}, {input, events, 0}};
    const int ready = ::poll(watched, 2, static_cast<int>(time.count()));
    eventfd_t count = 0;
    ::eventfd_read(mWakeUp, &count);
    for (const Task& task : takeTasks())
        task();
    return ready > 0 && watched[1].revents != 0;
}

std::vector<EventLoop::Task> EventLoop::takeTasks() {
    const std::lock_guard lock(mMutex);
    return std::exchange(mTasks, {});
}
