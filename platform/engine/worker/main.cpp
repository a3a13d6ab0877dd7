// SPDX-License-Identifier: MIT
// Reads media files for the engine, which starts it; see worker/Pool.h.
#include "worker/Answers.h"
#include "worker/Program.h"

int main(int argc, char** argv) {
    return worker::run(argc, argv, worker::answerWithLibav);
}
