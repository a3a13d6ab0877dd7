// SPDX-License-Identifier: MIT
#include "tests/engine_double/LineChannel.h"

#include <algorithm>
#include <array>
#include <cerrno>
#include <climits>
#include <cstdlib>
#include <cstring>

#include <poll.h>
#include <sys/socket.h>
#include <sys/un.h>

namespace script {

namespace {

int millisecondsUntil(Clock::time_point deadline) {
    using std::chrono::milliseconds;
    if (deadline == Clock::time_point::max())
        return -1;
    const auto left = std::chrono::ceil<milliseconds>(deadline - Clock::now()).count();
    return static_cast<int>(std::clamp<long>(left, 0, INT_MAX));
}

} // namespace

bool waitReadable(int fd, Clock::time_point deadline) {
    pollfd waiting{fd, POLLIN, 0};
    int ready = 0;
    do
        ready = ::poll(&waiting, 1, millisecondsUntil(deadline));
    while (ready < 0 && errno == EINTR);
    return ready > 0;
}

LineChannel LineChannel::connectTo(const std::string& path) {
    sockaddr_un address{};
    address.sun_family = AF_UNIX;
    path.copy(address.sun_path, sizeof(address.sun_path) - 1);
    qns::UniqueFd socket(::socket(AF_UNIX, SOCK_STREAM | SOCK_CLOEXEC, 0));
    if (::connect(socket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof(address)) != 0)
        return {};
    return LineChannel(std::move(socket));
}

LineChannel LineChannel::connectToNamedBy(const char* variable) {
    const char* const path = std::getenv(variable);
    return path ? connectTo(path) : LineChannel();
}

void LineChannel::send(std::string_view line) {
    std::string rest(line);
    rest += '\n';
    while (!rest.empty()) {
        const auto sent = ::send(mSocket.get(), rest.data(), rest.size(), MSG_NOSIGNAL);
        if (sent < 0 && errno != EINTR)
            return;
        rest.erase(0, static_cast<std::size_t>(std::max<ssize_t>(sent, 0)));
    }
}

std::optional<std::string> LineChannel::receive(Clock::time_point deadline) {
    for (;;) {
        if (const auto end = mReceived.find('\n'); end != std::string::npos) {
            std::string line = mReceived.substr(0, end);
            mReceived.erase(0, end + 1);
            return line;
        }
        if (!fill(deadline))
            return std::nullopt;
    }
}

std::string LineChannel::ask(std::string_view line) {
    if (!isOpen())
        return {};
    send(line);
    return receive().value_or("");
}

bool LineChannel::fill(Clock::time_point deadline) {
    if (!waitReadable(mSocket.get(), deadline))
        return false;
    std::array<char, 4096> chunk{};
    const auto received = ::recv(mSocket.get(), chunk.data(), chunk.size(), 0);
    if (received > 0)
        mReceived.append(chunk.data(), static_cast<std::size_t>(received));
    return received > 0 || (received < 0 && errno == EINTR);
}

void LineChannel::shutDown() {
    ::shutdown(mSocket.get(), SHUT_RDWR);
}

} // namespace script
