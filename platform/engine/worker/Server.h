// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>

#include "worker/Channel.h"
#include "worker/Request.h"

namespace worker {

/** Where a worker finds its end of the socket. */
inline constexpr int kServerSocket = 3;

/** The argument of a worker that is to run only while the machine has nothing else to do. */
inline constexpr char kIdleOption[] = "--when-idle";

/** False in a process that somebody started by hand. */
bool isStartedByEngine();

/** Answers a request about files; what is thrown becomes the result kInternal. */
using Answerer = std::function<std::string(Request& request, std::vector<qns::UniqueFd> files)>;

/**
 * Says that it is ready and answers one request after another until the other end is gone. A
 * request that takes longer than anyone waits ends the process.
 */
void serve(int socket, const Answerer& answer);

} // namespace worker
