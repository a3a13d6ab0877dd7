// SPDX-License-Identifier: MIT
#include "main/SystemManager.h"

#include "main/PowerOff.h"

int SystemManager::systemInitialize() {
    return 0;
}

int SystemManager::systemUnInitialize() {
    return 0;
}

int SystemManager::waitPowerOff() {
    if (PowerOff* powerOff = PowerOff::getInstance())
        powerOff->waitPowerOff();
    return 0;
}
