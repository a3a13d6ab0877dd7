// SPDX-License-Identifier: MIT
#include "tests/ptc/FailingCalls.h"

#include "ptc/EventPacket.h"

#include <atomic>
#include <cerrno>
#include <sys/socket.h>

namespace {

constexpr int kNone = -1;

std::atomic<int> gOption{kNone};
std::atomic<bool> gListenFails{false};
std::atomic<int> gAcknowledgements{0};

int fail(int error) {
    errno = error;
    return -1;
}

bool acknowledgementFails() {
    int left = gAcknowledgements;
    while (left > 0)
        if (gAcknowledgements.compare_exchange_weak(left, left - 1))
            return true;
    return false;
}

} // namespace

// Visible, since the sanitizers' libraries call these functions too.
#pragma GCC visibility push(default)
extern "C" {

int __real_setsockopt(int socket, int level, int option, const void* value, socklen_t length);
int __wrap_setsockopt(int socket, int level, int option, const void* value, socklen_t length) {
    if (level == SOL_SOCKET && option == gOption)
        return fail(ENOBUFS);
    return __real_setsockopt(socket, level, option, value, length);
}

int __real_listen(int socket, int backlog);
int __wrap_listen(int socket, int backlog) {
    return gListenFails ? fail(EADDRINUSE) : __real_listen(socket, backlog);
}

ssize_t __real_send(int socket, const void* data, size_t length, int flags);
ssize_t __wrap_send(int socket, const void* data, size_t length, int flags) {
    if (length == sizeof(PTC::kAcknowledgement) && acknowledgementFails())
        return fail(ENOBUFS);
    return __real_send(socket, data, length, flags);
}
}
#pragma GCC visibility pop

namespace failing_calls {

FailingOption::FailingOption(int option) {
    gOption = option;
}

FailingOption::~FailingOption() {
    gOption = kNone;
}

FailingListen::FailingListen() {
    gListenFails = true;
}

FailingListen::~FailingListen() {
    gListenFails = false;
}

void failAcknowledgements(int count) {
    gAcknowledgements = count;
}

int acknowledgementsToFail() {
    return gAcknowledgements;
}

} // namespace failing_calls
