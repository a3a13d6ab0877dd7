// SPDX-License-Identifier: MIT
#include "qnsys.h"

#include <array>
#include <csignal>
#include <string>

#include <gmock/gmock.h>
#include <gtest/gtest.h>
#include <sys/mman.h>
#include <unistd.h>

#include "base/UniqueFd.h"

#define VISIBLE __attribute__((noinline, visibility("default")))

extern "C" {

VISIBLE void functionThatPrints() {
    qnsys_print_backtrace();
    asm volatile(""); // not a tail call
}

VISIBLE void handlerThatPrints(int) {
    qnsys_print_backtrace();
    asm volatile("");
}

VISIBLE void functionThatIsInterrupted() {
    std::raise(SIGUSR1);
    asm volatile("");
}
}

namespace {

/** What `function` writes to standard error. */
std::string standardErrorOf(void (*function)()) {
    const qns::UniqueFd original(::dup(STDERR_FILENO));
    const qns::UniqueFd file(::memfd_create("stderr", MFD_CLOEXEC));
    ::dup2(file.get(), STDERR_FILENO);
    function();
    ::dup2(original.get(), STDERR_FILENO);
    std::array<char, 1 << 16> text{};
    const ssize_t length = ::pread(file.get(), text.data(), text.size(), 0);
    return std::string(text.data(), static_cast<std::size_t>(length));
}

} // namespace

TEST(SystemServices, CanBePreparedMoreThanOnce) {
    EXPECT_EQ(qnsys_init(), 0);
    EXPECT_EQ(qnsys_init(), 0);
}

TEST(Backtrace, NamesTheFunctionsThatWereCalled) {
    EXPECT_THAT(standardErrorOf(functionThatPrints), testing::HasSubstr("functionThatPrints"));
}

TEST(Backtrace, OfASignalHandlerNamesTheInterruptedFunctionToo) {
    struct sigaction before {};
    struct sigaction action {};
    action.sa_handler = handlerThatPrints;
    ::sigaction(SIGUSR1, &action, &before);
    const std::string text = standardErrorOf(functionThatIsInterrupted);
    ::sigaction(SIGUSR1, &before, nullptr);
    EXPECT_THAT(text, testing::HasSubstr("handlerThatPrints"));
    EXPECT_THAT(text, testing::HasSubstr("functionThatIsInterrupted"));
}
