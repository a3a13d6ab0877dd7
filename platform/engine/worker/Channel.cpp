// SPDX-License-Identifier: MIT
#include "worker/Channel.h"

#include <algorithm>
#include <cerrno>
#include <cstring>
#include <poll.h>
#include <sys/socket.h>
#include <utility>

namespace worker {

namespace {

/** Room for descriptors beside a message, aligned as the system wants it. */
struct Ancillary {
    alignas(cmsghdr) std::array<char, CMSG_SPACE(kMostFiles * sizeof(int))> bytes{};
};

template<typename Call>
ssize_t repeated(Call&& call) {
    ssize_t result = 0;
    do {
        result = call();
    } while (result < 0 && errno == EINTR);
    return result;
}

void attach(msghdr& message, Ancillary& ancillary, const std::vector<int>& files) {
    const std::size_t size = std::min(files.size(), kMostFiles) * sizeof(int);
    message.msg_control = ancillary.bytes.data();
    message.msg_controllen = CMSG_SPACE(size);
    cmsghdr* const header = CMSG_FIRSTHDR(&message);
    header->cmsg_level = SOL_SOCKET;
    header->cmsg_type = SCM_RIGHTS;
    header->cmsg_len = CMSG_LEN(size);
    std::memcpy(CMSG_DATA(header), files.data(), size);
}

std::vector<qns::UniqueFd> detach(msghdr& message) {
    std::vector<qns::UniqueFd> files;
    for (cmsghdr* header = CMSG_FIRSTHDR(&message); header;
         header = CMSG_NXTHDR(&message, header)) {
        if (header->cmsg_level != SOL_SOCKET || header->cmsg_type != SCM_RIGHTS)
            continue;
        std::vector<int> numbers((header->cmsg_len - CMSG_LEN(0)) / sizeof(int));
        std::memcpy(numbers.data(), CMSG_DATA(header), numbers.size() * sizeof(int));
        for (const int number : numbers)
            files.emplace_back(number);
    }
    return files;
}

/** How long the next message is; 0 or less when there will be none. */
ssize_t sizeOfNext(int socket) {
    return repeated([&] { return ::recv(socket, nullptr, 0, MSG_PEEK | MSG_TRUNC); });
}

} // namespace

bool send(int socket, std::string_view bytes, const std::vector<int>& files) {
    iovec part{const_cast<char*>(bytes.data()), bytes.size()};
    msghdr message{};
    message.msg_iov = &part;
    message.msg_iovlen = 1;
    Ancillary ancillary;
    if (!files.empty())
        attach(message, ancillary, files);
    const ssize_t sent = repeated([&] { return ::sendmsg(socket, &message, MSG_NOSIGNAL); });
    return sent == static_cast<ssize_t>(bytes.size());
}

std::optional<Parcel> receive(int socket) {
    const ssize_t size = sizeOfNext(socket);
    if (size <= 0 || size > static_cast<ssize_t>(kLargestMessage))
        return std::nullopt;
    Parcel parcel;
    parcel.bytes.resize(static_cast<std::size_t>(size));
    iovec part{parcel.bytes.data(), parcel.bytes.size()};
    Ancillary ancillary;
    msghdr message{};
    message.msg_iov = &part;
    message.msg_iovlen = 1;
    message.msg_control = ancillary.bytes.data();
    message.msg_controllen = ancillary.bytes.size();
    if (repeated([&] { return ::recvmsg(socket, &message, MSG_CMSG_CLOEXEC); }) != size)
        return std::nullopt;
    parcel.files = detach(message);
    return parcel;
}

bool awaitParcel(int socket, std::chrono::steady_clock::time_point deadline) {
    using std::chrono::milliseconds;
    pollfd event{socket, POLLIN, 0};
    for (;;) {
        const auto left =
            std::chrono::ceil<milliseconds>(deadline - std::chrono::steady_clock::now());
        const int count =
            ::poll(&event, 1, static_cast<int>(std::max(left, milliseconds(0)).count()));
        if (count >= 0 || errno != EINTR)
            return count > 0;
    }
}

} // namespace worker
