// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <chrono>
#include <cstddef>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "base/UniqueFd.h"

namespace worker {

/** More than any answer needs; less than what a socket takes at once. */
inline constexpr std::size_t kLargestMessage = 128 * 1024;
inline constexpr std::size_t kMostFiles = 2;

/** What came at once through a socket of the kind SOCK_SEQPACKET. */
struct Parcel {
    std::string bytes;
    std::vector<qns::UniqueFd> files;
};

/** Sends bytes together with descriptors, which stay the caller's. False: nobody takes it. */
bool send(int socket, std::string_view bytes, const std::vector<int>& files = {});

/** Waits for a parcel; nothing when the other end is gone or what came is none. */
std::optional<Parcel> receive(int socket);

/** True once there is something to receive, or the other end is gone. */
bool awaitParcel(int socket, std::chrono::steady_clock::time_point deadline);

} // namespace worker
