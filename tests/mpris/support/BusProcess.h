// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "tests/cli/support/Tool.h"
#include "tests/support/TestFolder.h"

/**
 * A session bus of the test's own, which all processes that the test starts from now on find in
 * their environment, together with a folder for what lives at run time.
 */
class BusProcess {
public:
    BusProcess();
    ~BusProcess();
    BusProcess(const BusProcess&) = delete;
    BusProcess& operator=(const BusProcess&) = delete;

    [[nodiscard]] const TestFolder& runtimeFolder() const { return mFolder; }

    void kill();

private:
    TestFolder mFolder;
    Tool mProcess;
};
