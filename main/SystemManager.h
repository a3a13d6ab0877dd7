// SPDX-License-Identifier: MIT
#pragma once

/** What the device's system wants of the process. */
class SystemManager {
public:
    virtual ~SystemManager() = default;

    int systemInitialize();
    int systemUnInitialize();

    /** Blocks until power-off is announced; see PowerOff. */
    int waitPowerOff();
};
