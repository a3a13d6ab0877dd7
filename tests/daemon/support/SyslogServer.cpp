// SPDX-License-Identifier: MIT
#include "tests/daemon/support/SyslogServer.h"

#include <array>
#include <cerrno>
#include <cstring>
#include <fstream>
#include <poll.h>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>
#include <utility>

#include <gtest/gtest.h>

namespace {

constexpr const char* kPath = "/dev/log";

/** So that a slow reader here is no reason for lines to be dropped there. */
void allowLongQueue() {
    std::ofstream("/proc/sys/net/unix/max_dgram_qlen") << "1000";
}

qns::UniqueFd bindSocket() {
    allowLongQueue();
    ::unlink(kPath);
    qns::UniqueFd socket(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0));
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    std::strcpy(address.sun_path, kPath);
    if (::bind(socket.get(), reinterpret_cast<sockaddr*>(&address), sizeof(address)) != 0)
        ADD_FAILURE() << kPath << ": " << std::strerror(errno);
    return socket;
}

} // namespace

SyslogServer::SyslogServer() : mSocket(bindSocket()), mThread(&SyslogServer::readLoop, this) {}

SyslogServer::~SyslogServer() {
    stopReading();
    ::unlink(kPath);
}

void SyslogServer::stopReading() {
    if (!mThread.joinable())
        return;
    mStopped = true;
    // An empty datagram wakes the reader.
    const qns::UniqueFd waker(::socket(AF_UNIX, SOCK_DGRAM | SOCK_CLOEXEC, 0));
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    std::strcpy(address.sun_path, kPath);
    ::sendto(waker.get(), "", 0, 0, reinterpret_cast<sockaddr*>(&address), sizeof(address));
    mThread.join();
}

void SyslogServer::keepOnly(std::string text) {
    const std::lock_guard lock(mReadMutex);
    mKept = std::move(text);
}

std::vector<std::string> SyslogServer::lines(std::string_view text) {
    if (!mStopped)
        readAvailable();
    return mLines.with(text);
}

std::vector<std::string> SyslogServer::messages(std::string_view text) {
    auto found = lines(text);
    for (auto& line : found)
        line.erase(0, line.find("]: ") == std::string::npos ? 0 : line.find("]: ") + 3);
    return found;
}

void SyslogServer::readLoop() {
    pollfd poll{mSocket.get(), POLLIN, 0};
    // Reading may have taken the datagram that was to wake us: look before every wait.
    while (!mStopped && ::poll(&poll, 1, -1) == 1)
        if (!mStopped)
            readAvailable();
}

void SyslogServer::readAvailable() {
    const std::lock_guard lock(mReadMutex);
    std::array<char, 8192> buffer{};
    ssize_t length = 0;
    while ((length = ::recv(mSocket.get(), buffer.data(), buffer.size(), MSG_DONTWAIT)) >= 0) {
        std::string line(buffer.data(), static_cast<std::size_t>(length));
        while (!line.empty() && (line.back() == '\0' || line.back() == '\n'))
            line.pop_back();
        if (line.find(mKept) != std::string::npos)
            mLines.add(std::move(line));
    }
}
