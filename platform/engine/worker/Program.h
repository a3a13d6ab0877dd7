// SPDX-License-Identifier: MIT
#pragma once

#include "worker/Server.h"

namespace worker {

/** What a worker's main() does: gives up all rights, then answers for as long as it is asked. */
int run(int argc, char** argv, const Answerer& answer);

} // namespace worker
