// SPDX-License-Identifier: MIT
#include "base/UniqueFd.h"

#include <fcntl.h>
#include <gtest/gtest.h>

namespace {

bool isOpen(int fd) {
    return ::fcntl(fd, F_GETFD) != -1;
}

int openNull() {
    return ::open("/dev/null", O_RDONLY | O_CLOEXEC);
}

} // namespace

TEST(UniqueFd, ClosesWhatItOwnsWhenItEnds) {
    const int fd = openNull();
    { const qns::UniqueFd owner(fd); }
    EXPECT_FALSE(isOpen(fd));
}

TEST(UniqueFd, MovingHandsTheDescriptorOver) {
    qns::UniqueFd first(openNull());
    const int fd = first.get();
    qns::UniqueFd second(std::move(first));
    EXPECT_EQ(second.get(), fd);
    EXPECT_TRUE(isOpen(fd));
}

TEST(UniqueFd, AssigningClosesTheDescriptorHeldBefore) {
    qns::UniqueFd owner(openNull());
    const int before = owner.get();
    owner = qns::UniqueFd(openNull());
    EXPECT_FALSE(isOpen(before));
    EXPECT_TRUE(isOpen(owner.get()));
}

TEST(UniqueFd, ReleaseLeavesTheDescriptorOpen) {
    qns::UniqueFd owner(openNull());
    const int fd = owner.release();
    EXPECT_FALSE(owner);
    EXPECT_TRUE(isOpen(fd));
    ::close(fd);
}
