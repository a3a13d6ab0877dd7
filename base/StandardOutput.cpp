// SPDX-License-Identifier: MIT
#include "base/StandardOutput.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <climits>
#include <cstdarg>
#include <cstdio>
#include <mutex>
#include <poll.h>
#include <sys/socket.h>
#include <sys/stat.h>
#include <sys/uio.h>
#include <unistd.h>

namespace qns {
namespace {

using Pieces = std::array<iovec, 2>;

template<class Call>
void retryInterrupted(Call call) {
    while (call() < 0 && errno == EINTR) {
    }
}

void writeNow(const Pieces& pieces) {
    retryInterrupted([&] { return ::writev(STDOUT_FILENO, pieces.data(), pieces.size()); });
}

void sendWithoutWaiting(Pieces& pieces) {
    msghdr message{};
    message.msg_iov = pieces.data();
    message.msg_iovlen = pieces.size();
    retryInterrupted(
        [&] { return ::sendmsg(STDOUT_FILENO, &message, MSG_DONTWAIT | MSG_NOSIGNAL); });
}

/** Keeps the newline, which is the second piece, and shortens the first. */
void cutTo(std::size_t size, Pieces& pieces) {
    pieces[0].iov_len = std::min(pieces[0].iov_len, size - pieces[1].iov_len);
}

/** The lock keeps the room that poll(2) saw from being taken by another thread. */
void writeToPipe(Pieces& pieces) {
    static std::mutex sRoom;
    cutTo(PIPE_BUF, pieces);
    const std::lock_guard lock(sRoom);
    pollfd output{STDOUT_FILENO, POLLOUT, 0};
    retryInterrupted([&] { return ::poll(&output, 1, 0); });
    if (output.revents == POLLOUT)
        writeNow(pieces);
}

// Descriptor 1 may be redirected while the process runs, so its kind is looked up each time.
void writeUnlessItBlocks(std::string_view text, std::string_view ending) {
    Pieces pieces{iovec{const_cast<char*>(text.data()), text.size()},
                  iovec{const_cast<char*>(ending.data()), ending.size()}};
    struct stat status {};
    if (::fstat(STDOUT_FILENO, &status) != 0)
        return;
    if (S_ISFIFO(status.st_mode))
        writeToPipe(pieces);
    else if (S_ISSOCK(status.st_mode))
        sendWithoutWaiting(pieces);
    else
        writeNow(pieces);
}

} // namespace

void printLine(std::string_view text) {
    writeUnlessItBlocks(text, "\n");
}

void printFormatted(const char* format, ...) {
    std::array<char, PIPE_BUF> line;
    std::va_list arguments;
    va_start(arguments, format);
    const int length = std::vsnprintf(line.data(), line.size(), format, arguments);
    va_end(arguments);
    if (length > 0)
        writeUnlessItBlocks({line.data(), std::min<std::size_t>(length, line.size() - 1)}, {});
}

} // namespace qns
