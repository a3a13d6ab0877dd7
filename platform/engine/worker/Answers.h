// SPDX-License-Identifier: MIT
#pragma once

#include "worker/Server.h"

namespace worker {

/** Reads and draws with the FFmpeg libraries, in this process. An Answerer. */
std::string answerWithLibav(Request& request, std::vector<qns::UniqueFd> files);

} // namespace worker
