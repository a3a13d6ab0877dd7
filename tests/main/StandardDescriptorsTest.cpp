// SPDX-License-Identifier: MIT
#include "main/StandardDescriptors.h"

#include <fcntl.h>
#include <sys/stat.h>
#include <sys/wait.h>
#include <unistd.h>

#include <gtest/gtest.h>

namespace {

/** The exit status of `body` in a child process, whose standard descriptors it may close. */
template<typename Body>
int statusInChild(Body body) {
    const pid_t child = ::fork();
    if (child == 0)
        ::_exit(body());
    int status = 0;
    ::waitpid(child, &status, 0);
    return WIFEXITED(status) ? WEXITSTATUS(status) : -1;
}

bool isSame(int descriptor, const struct stat& expected) {
    struct stat status {};
    return ::fstat(descriptor, &status) == 0 && status.st_dev == expected.st_dev &&
           status.st_ino == expected.st_ino;
}

struct stat statusOf(const char* path) {
    struct stat status {};
    ::stat(path, &status);
    return status;
}

TEST(StandardDescriptors, ThatAreClosedLeadNowhere) {
    const auto nowhere = statusOf("/dev/null");
    const auto opened = [&] {
        for (const int standard : {0, 1, 2})
            ::close(standard);
        openStandardDescriptors();
        for (const int standard : {0, 1, 2})
            if (!isSame(standard, nowhere) || (::fcntl(standard, F_GETFL) & O_ACCMODE) != O_RDWR)
                return 10 + standard;
        return 0;
    };
    EXPECT_EQ(statusInChild(opened), 0);
}

TEST(StandardDescriptors, ThatAreOpenStayAsTheyAre) {
    const auto nowhere = statusOf("/dev/null");
    const auto zeros = statusOf("/dev/zero");
    const auto opened = [&] {
        const int zero = ::open("/dev/zero", O_RDWR);
        ::dup2(zero, 0);
        ::dup2(zero, 2);
        ::close(zero);
        ::close(1);
        openStandardDescriptors();
        const int next = ::dup(0);
        return isSame(0, zeros) && isSame(1, nowhere) && isSame(2, zeros) && next == zero ? 0 : 1;
    };
    EXPECT_EQ(statusInChild(opened), 0);
}

} // namespace
