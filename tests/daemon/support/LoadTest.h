// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <optional>

#include "tests/daemon/support/DaemonTest.h"
#include "tests/daemon/support/Load.h"
#include "tests/engine/Mount.h"
#include "tests/support/TestFolder.h"

/**
 * A daemon with the engine that plays, and a load of eight clients. The environment variable
 * QNS_LOAD_SEED repeats a load; each test prints its own.
 */
class LoadTest : public DaemonTest {
protected:
    /** Starts daemon and load. */
    void SetUp() override;

    /** Options of the daemon that SetUp() starts. */
    [[nodiscard]] DaemonOptions options() const;

    /** Starts a daemon, and a load that is new to it. */
    void startLoad(const DaemonOptions& options);

    /** What the daemon holds while nothing is played. */
    struct Holdings {
        std::size_t bytes = 0;
        std::size_t threads = 0;
        std::size_t descriptors = 0;
    };
    [[nodiscard]] Holdings holdings() const;

    /** Waits until the daemon has let go of what it held more; of memory it says nothing. */
    void expectReturnTo(const Holdings& before) const;

    /** Runs the load, and prints what it was and what the daemon holds afterwards. */
    void run(std::chrono::milliseconds time);

    /** SIGTERM in the middle of the load. */
    void endDuringLoad(std::chrono::milliseconds after);

    TestFolder mFolder;
    /** In memory: a process that is ended waits until the disk has what it was writing. */
    Mount mLibrary = Mount::memory(mFolder.path("data"), 256'000'000);
    std::optional<load::Load> mLoad;
};
