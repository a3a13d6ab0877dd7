// SPDX-License-Identifier: MIT
#include "base/StandardOutput.h"
#include "base/UniqueFd.h"

#include <algorithm>
#include <array>
#include <climits>
#include <csignal>
#include <cstdio>
#include <fcntl.h>
#include <gtest/gtest.h>
#include <poll.h>
#include <string>
#include <sys/socket.h>
#include <thread>
#include <vector>

using qns::UniqueFd;

namespace {

/** Standard output goes to `target` until the end of the scope. */
class Redirected {
public:
    explicit Redirected(int target) : mBefore(::dup(STDOUT_FILENO)) {
        std::fflush(stdout);
        ::dup2(target, STDOUT_FILENO);
    }
    ~Redirected() { ::dup2(mBefore.get(), STDOUT_FILENO); }
    Redirected(const Redirected&) = delete;
    Redirected& operator=(const Redirected&) = delete;

private:
    UniqueFd mBefore;
};

struct Channel {
    UniqueFd reader;
    UniqueFd writer;
};

Channel makePipe() {
    std::array<int, 2> ends{};
    EXPECT_EQ(::pipe2(ends.data(), O_CLOEXEC), 0);
    return {UniqueFd(ends[0]), UniqueFd(ends[1])};
}

Channel makeSocket(int type) {
    std::array<int, 2> ends{};
    EXPECT_EQ(::socketpair(AF_UNIX, type | SOCK_CLOEXEC, 0, ends.data()), 0);
    return {UniqueFd(ends[0]), UniqueFd(ends[1])};
}

/** Everything that can be read without waiting. */
std::string drain(int fd) {
    std::string text;
    std::array<char, 4096> chunk;
    pollfd input{fd, POLLIN, 0};
    while (::poll(&input, 1, 0) == 1 && (input.revents & POLLIN) != 0) {
        const ssize_t count = ::read(fd, chunk.data(), chunk.size());
        if (count <= 0)
            break;
        text.append(chunk.data(), static_cast<std::size_t>(count));
    }
    return text;
}

template<class Print>
std::string printed(Print print) {
    const Channel pipe = makePipe();
    {
        const Redirected output(pipe.writer.get());
        print();
    }
    return drain(pipe.reader.get());
}

/** Prints more than the channel holds; a call that blocks would run into the test's time limit. */
void printMoreThanFits(const Channel& channel, const std::string& line) {
    const Redirected output(channel.writer.get());
    for (int i = 0; i < 5000; ++i)
        qns::printLine(line);
}

void expectWholeLines(const std::string& text, const std::string& line) {
    ASSERT_FALSE(text.empty());
    ASSERT_EQ(text.size() % (line.size() + 1), 0u);
    for (std::size_t at = 0; at < text.size(); at += line.size() + 1)
        ASSERT_EQ(text.substr(at, line.size() + 1), line + "\n");
}

} // namespace

TEST(StandardOutput, ALineEndsWithANewline) {
    EXPECT_EQ(printed([] { qns::printLine("MediaServiceMain::initialize"); }),
              "MediaServiceMain::initialize\n");
    EXPECT_EQ(printed([] { qns::printLine(""); }), "\n");
}

TEST(StandardOutput, FormattedTextIsWrittenAsItIs) {
    EXPECT_EQ(printed([] { qns::printFormatted("[Error] %s %d", "bind", 98); }), "[Error] bind 98");
    EXPECT_EQ(printed([] { qns::printFormatted("%s", ""); }), "");
}

TEST(StandardOutput, FormattedTextIsCutAt4095Bytes) {
    const std::string longText(10000, 'x');
    EXPECT_EQ(printed([&] { qns::printFormatted("%s", longText.c_str()); }),
              std::string(4095, 'x'));
}

TEST(StandardOutput, ALineToAPipeIsCutToWhatThePipeTakesAtOnce) {
    EXPECT_EQ(printed([] { qns::printLine(std::string(10000, 'x')); }),
              std::string(PIPE_BUF - 1, 'x') + "\n");
}

TEST(StandardOutput, ALineToAFileIsWrittenWhole) {
    std::FILE* const file = std::tmpfile();
    ASSERT_NE(file, nullptr);
    {
        const Redirected output(::fileno(file));
        qns::printLine(std::string(10000, 'x'));
    }
    EXPECT_EQ(std::fseek(file, 0, SEEK_END), 0);
    EXPECT_EQ(std::ftell(file), 10001);
    std::fclose(file);
}

TEST(StandardOutput, AFullPipeDropsWholeLinesAndTakesNewOnesWhenItIsReadAgain) {
    const Channel pipe = makePipe();
    for (const std::size_t length : {0, 10, 100, 3000, PIPE_BUF - 1}) {
        const std::string line(length, 'x');
        printMoreThanFits(pipe, line);
        expectWholeLines(drain(pipe.reader.get()), line);
    }
    {
        const Redirected output(pipe.writer.get());
        qns::printLine("after");
    }
    EXPECT_EQ(drain(pipe.reader.get()), "after\n");
}

TEST(StandardOutput, AFullSocketDropsLines) {
    for (const int type : {SOCK_STREAM, SOCK_SEQPACKET}) {
        const Channel socket = makeSocket(type);
        printMoreThanFits(socket, std::string(99, 'x'));
        EXPECT_EQ(drain(socket.reader.get()).substr(0, 100), std::string(99, 'x') + "\n");
    }
}

TEST(StandardOutput, AReaderThatHasGoneIsNoReasonToEnd) {
    Channel pipe = makePipe();
    pipe.reader.reset();
    Channel socket = makeSocket(SOCK_STREAM);
    socket.reader.reset();
    for (const int target : {pipe.writer.get(), socket.writer.get()}) {
        const Redirected output(target);
        qns::printLine("nobody reads this");
    }
}

TEST(StandardOutput, WithoutADescriptorNothingIsWritten) {
    const UniqueFd before(::dup(STDOUT_FILENO));
    std::fflush(stdout);
    ::close(STDOUT_FILENO);
    qns::printLine("lost");
    qns::printFormatted("%d", 1);
    ::dup2(before.get(), STDOUT_FILENO);
}

TEST(StandardOutput, LinesOfSeveralThreadsNeverMix) {
    const Channel pipe = makePipe();
    const std::string text = [&] {
        const Redirected output(pipe.writer.get());
        std::vector<std::thread> threads;
        for (int i = 0; i < 8; ++i)
            threads.emplace_back([i] {
                for (int round = 0; round < 50; ++round)
                    qns::printLine(std::string(60, static_cast<char>('a' + i)));
            });
        for (std::thread& thread : threads)
            thread.join();
        return drain(pipe.reader.get());
    }();
    ASSERT_EQ(text.size(), 8u * 50 * 61);
    for (std::size_t at = 0; at < text.size(); at += 61)
        ASSERT_EQ(text.substr(at, 61), std::string(60, text[at]) + "\n");
}
