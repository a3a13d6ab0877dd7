// SPDX-License-Identifier: MIT
#pragma once

#include <optional>
#include <poll.h>
#include <stdexcept>
#include <string>
#include <sys/socket.h>
#include <sys/un.h>
#include <unistd.h>

#include "base/UniqueFd.h"

/** Serves /dev/log; for test programs that run with a /dev of their own. Reads when asked to. */
class LogSocket {
public:
    /** SOCK_DGRAM, as log daemons do, or SOCK_STREAM, as some did: see socket(). */
    explicit LogSocket(int type = SOCK_DGRAM) : mSocket(::socket(AF_UNIX, type | SOCK_CLOEXEC, 0)) {
        ::unlink(kPath);
        sockaddr_un address{};
        address.sun_family = AF_UNIX;
        std::char_traits<char>::copy(address.sun_path, kPath, sizeof kPath);
        if (::bind(mSocket.get(), reinterpret_cast<const sockaddr*>(&address), sizeof address) != 0)
            throw std::runtime_error("cannot serve /dev/log");
        if (type == SOCK_STREAM)
            ::listen(mSocket.get(), 1);
    }
    ~LogSocket() { ::unlink(kPath); }
    LogSocket(const LogSocket&) = delete;
    LogSocket& operator=(const LogSocket&) = delete;

    [[nodiscard]] int socket() const { return mSocket.get(); }

    /** The next line as it came; nothing after ten seconds without one. */
    std::optional<std::string> next() { return receive(10'000); }

    /** The next line if it has come already. */
    std::optional<std::string> waiting() { return receive(0); }

    /** The text behind "ident[pid]: " of the next line. */
    std::string nextMessage() {
        const std::string line = next().value_or("");
        const std::size_t colon = line.find("]: ");
        return colon == std::string::npos ? line : line.substr(colon + 3);
    }

private:
    static constexpr char kPath[] = "/dev/log";

    std::optional<std::string> receive(int milliseconds) {
        pollfd watched{mSocket.get(), POLLIN, 0};
        if (::poll(&watched, 1, milliseconds) != 1)
            return std::nullopt;
        std::string line(1 << 20, '\0');
        const ssize_t length = ::recv(mSocket.get(), line.data(), line.size(), 0);
        line.resize(length > 0 ? static_cast<std::size_t>(length) : 0);
        return line;
    }

    qns::UniqueFd mSocket;
};
