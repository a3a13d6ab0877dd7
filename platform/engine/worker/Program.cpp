// SPDX-License-Identifier: MIT
#include "worker/Program.h"

#include <clocale>
#include <cstdio>
#include <string_view>

#include "worker/Idleness.h"
#include "worker/Sandbox.h"

namespace worker {

int run(int argc, char** argv, const Answerer& answer) {
    if (!isStartedByEngine()) {
        std::fputs("media-worker: the media engine starts this program when it needs it\n", stderr);
        return 2;
    }
    if (argc > 1 && std::string_view(argv[1]) == kIdleOption)
        runWhenIdle();
    std::setlocale(LC_ALL, "");
    enterSandbox();
    serve(kServerSocket, answer);
    return 0;
}

} // namespace worker
