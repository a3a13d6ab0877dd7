// SPDX-License-Identifier: MIT
#include "tests/ptc/CountedWaits.h"

#include <atomic>
#include <cerrno>
#include <semaphore.h>

namespace {

std::atomic<int> gWakeUps{0};
std::atomic<bool> gNextWaitFails{false};
std::atomic<bool> gPostsFail{false};

int fail(int error) {
    errno = error;
    return -1;
}

} // namespace

// Visible, since the sanitizers' libraries call these functions too.
#pragma GCC visibility push(default)
extern "C" {

int __real_sem_wait(sem_t* semaphore);
int __wrap_sem_wait(sem_t* semaphore) {
    if (gNextWaitFails.exchange(false))
        return fail(EINVAL);
    const int result = __real_sem_wait(semaphore);
    gWakeUps += result == 0 ? 1 : 0;
    return result;
}

int __real_sem_post(sem_t* semaphore);
int __wrap_sem_post(sem_t* semaphore) {
    return gPostsFail ? fail(EOVERFLOW) : __real_sem_post(semaphore);
}
}
#pragma GCC visibility pop

namespace counted_waits {

int wakeUps() {
    return gWakeUps;
}

void failNextWait() {
    gNextWaitFails = true;
}

FailingPosts::FailingPosts() {
    gPostsFail = true;
}

FailingPosts::~FailingPosts() {
    gPostsFail = false;
}

} // namespace counted_waits
