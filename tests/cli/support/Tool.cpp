// SPDX-License-Identifier: MIT
#include "tests/cli/support/Tool.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <csignal>
#include <cstdlib>
#include <cstring>
#include <fcntl.h>
#include <iterator>
#include <poll.h>
#include <sys/ioctl.h>
#include <sys/prctl.h>
#include <sys/wait.h>
#include <unistd.h>
#include <utility>

#include <gtest/gtest.h>

#include "tests/daemon/support/Patience.h"

namespace {

/** What the test keeps and what the process gets. */
struct Channel {
    qns::UniqueFd mine;
    qns::UniqueFd theirs;
};

Channel makePipe() {
    std::array<int, 2> ends{-1, -1};
    EXPECT_EQ(::pipe2(ends.data(), O_CLOEXEC), 0) << std::strerror(errno);
    return {qns::UniqueFd(ends[0]), qns::UniqueFd(ends[1])};
}

Channel makeTerminal() {
    Channel channel;
    channel.mine.reset(::posix_openpt(O_RDWR | O_NOCTTY | O_CLOEXEC));
    EXPECT_EQ(::grantpt(channel.mine.get()), 0);
    EXPECT_EQ(::unlockpt(channel.mine.get()), 0);
    std::array<char, 64> name{};
    EXPECT_EQ(::ptsname_r(channel.mine.get(), name.data(), name.size()), 0);
    channel.theirs.reset(::open(name.data(), O_RDWR | O_NOCTTY | O_CLOEXEC));
    return channel;
}

Channel makeChannel(Tool::Output output) {
    if (output == Tool::Output::terminal)
        return makeTerminal();
    Channel channel = makePipe();
    if (output == Tool::Output::full)
        channel.theirs.reset(::open("/dev/full", O_WRONLY | O_CLOEXEC));
    return channel;
}

std::vector<char*> pointers(std::vector<std::string>& list) {
    std::vector<char*> result;
    std::transform(list.begin(), list.end(), std::back_inserter(result),
                   [](std::string& text) { return text.data(); });
    result.push_back(nullptr);
    return result;
}

/** In the new process: only what is safe between fork and exec. */
[[noreturn]] void become(char* const* command, int in, int out, int err) {
    ::prctl(PR_SET_PDEATHSIG, SIGKILL);
    ::setsid();
    ::ioctl(in, TIOCSCTTY, 0); // fails where it is no terminal
    ::dup2(in, STDIN_FILENO);
    ::dup2(out, STDOUT_FILENO);
    ::dup2(err, STDERR_FILENO);
    ::execv(command[0], command);
    ::_exit(127);
}

} // namespace

Tool::Tool(std::vector<std::string> arguments, Output output)
    : Tool(QNS_TOOL, std::move(arguments), output) {}

Tool::Tool(const std::string& program, std::vector<std::string> arguments, Output output) {
    arguments.insert(arguments.begin(), program);
    const std::vector<char*> command = pointers(arguments);
    Channel out = makeChannel(output);
    Channel err = makePipe();
    const qns::UniqueFd nothing(::open("/dev/null", O_RDONLY | O_CLOEXEC));
    const int in = output == Output::terminal ? out.theirs.get() : nothing.get();
    mPid = ::fork();
    if (mPid == 0)
        become(command.data(), in, out.theirs.get(), err.theirs.get());
    EXPECT_GT(mPid, 0) << std::strerror(errno);
    mOut = std::move(out.mine);
    if (output == Output::terminal)
        mTerminal = std::move(out.theirs);
    mErr = std::move(err.mine);
}

Tool::~Tool() {
    if (mHasEnded || mPid <= 0)
        return;
    ::kill(mPid, SIGKILL);
    ::waitpid(mPid, nullptr, 0);
}

bool Tool::waitUntil(const std::function<bool()>& condition) {
    while (!condition())
        if (!readMore()) {
            ADD_FAILURE() << "It did not come. Output:\n" << mOutput << "\nErrors:\n" << mErrors;
            return false;
        }
    return true;
}

bool Tool::waitFor(std::string_view text) {
    std::size_t found = std::string::npos;
    const bool hasCome = waitUntil([&] {
        found = mOutput.find(text, mSeen);
        return found != std::string::npos;
    });
    if (hasCome)
        mSeen = found + text.size();
    return hasCome;
}

void Tool::press(std::string_view keys) {
    EXPECT_EQ(::write(mOut.get(), keys.data(), keys.size()), static_cast<ssize_t>(keys.size()));
}

void Tool::signal(int number) const {
    EXPECT_EQ(::kill(mPid, number), 0) << std::strerror(errno);
}

void Tool::closeOutput() {
    mOut.reset();
}

termios Tool::terminal() const {
    termios modes{};
    EXPECT_EQ(::tcgetattr(mTerminal.get(), &modes), 0) << std::strerror(errno);
    return modes;
}

int Tool::waitForExit() {
    if (mHasEnded)
        return mStatus;
    while (mErr && readMore()) {
    }
    if (mErr) {
        ADD_FAILURE() << "It does not end. Output:\n" << mOutput;
        ::kill(mPid, SIGKILL);
    }
    while (mOut && readFrom(mOut, mOutput)) {
    }
    int status = 0;
    ::waitpid(mPid, &status, 0);
    mHasEnded = true;
    mStatus = WIFSIGNALED(status) ? 128 + WTERMSIG(status) : WEXITSTATUS(status);
    return mStatus;
}

/** Waits for more of either; false when nothing comes any more. */
bool Tool::readMore() {
    if (!mErr) // the process has ended
        return mOut && readFrom(mOut, mOutput);
    pollfd polls[] = {{mOut.get(), POLLIN, 0}, {mErr.get(), POLLIN, 0}};
    if (::poll(polls, 2, patience::pollTimeout(patience::deadline())) <= 0)
        return false;
    if (polls[0].revents != 0)
        readFrom(mOut, mOutput);
    if (polls[1].revents != 0)
        readFrom(mErr, mErrors);
    return true;
}

bool Tool::readFrom(qns::UniqueFd& end, std::string& text) {
    std::array<char, 4096> buffer{};
    pollfd poll{end.get(), POLLIN, 0};
    if (::poll(&poll, 1, 0) != 1)
        return false;
    const ssize_t count = ::read(end.get(), buffer.data(), buffer.size());
    if (count > 0)
        text.append(buffer.data(), static_cast<std::size_t>(count));
    else
        end.reset();
    return count > 0;
}
