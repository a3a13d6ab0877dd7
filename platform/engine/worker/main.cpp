// SPDX-License-Identifier: MIT
// Reads media files for the engine, which starts it; see worker/Pool.h.
#include <clocale>
#include <cstdio>

#include "worker/Answers.h"
#include "worker/Sandbox.h"
#include "worker/Server.h"

int main() {
    if (!worker::isStartedByEngine()) {
        std::fputs("media-worker: the media engine starts this program when it needs it\n", stderr);
        return 2;
    }
    std::setlocale(LC_ALL, "");
    worker::enterSandbox();
    worker::serve(worker::kServerSocket, worker::answerWithLibav);
    return 0;
}
