// SPDX-License-Identifier: MIT
// Reads media files for the engine, which starts it; see worker/Pool.h.
#include <clocale>
#include <cstdio>
#include <string_view>

#include "worker/Answers.h"
#include "worker/Idleness.h"
#include "worker/Sandbox.h"
#include "worker/Server.h"

int main(int argc, char** argv) {
    if (!worker::isStartedByEngine()) {
        std::fputs("media-worker: the media engine starts this program when it needs it\n", stderr);
        return 2;
    }
    if (argc > 1 && std::string_view(argv[1]) == worker::kIdleOption)
        worker::runWhenIdle();
    std::setlocale(LC_ALL, "");
    worker::enterSandbox();
    worker::serve(worker::kServerSocket, worker::answerWithLibav);
    return 0;
}
