// SPDX-License-Identifier: MIT
// Loaded into the daemon before the C library: a clock that is set back all the time, as on a
// device without a battery whose network tells it other times.
#include <atomic>
#include <ctime>
#include <sys/syscall.h>
#include <sys/time.h>
#include <unistd.h>

namespace {

constexpr std::time_t kStep = 60;

/** The time of day: a minute earlier each time it is asked for. */
int timeOfDay(timespec* result) {
    static std::atomic<std::time_t> back{0};
    const auto failed = static_cast<int>(::syscall(SYS_clock_gettime, CLOCK_REALTIME, result));
    result->tv_sec -= back += kStep;
    return failed;
}

} // namespace

extern "C" int clock_gettime(clockid_t clock, timespec* result) noexcept {
    if (clock == CLOCK_REALTIME)
        return timeOfDay(result);
    return static_cast<int>(::syscall(SYS_clock_gettime, clock, result));
}

extern "C" int gettimeofday(timeval* result, void* /*zone*/) noexcept {
    timespec now{};
    const int failed = timeOfDay(&now);
    *result = {now.tv_sec, now.tv_nsec / 1000};
    return failed;
}

extern "C" std::time_t time(std::time_t* result) noexcept {
    timespec now{};
    timeOfDay(&now);
    if (result)
        *result = now.tv_sec;
    return now.tv_sec;
}
