// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <thread>
#include <vector>

#include "base/UniqueFd.h"

/**
 * Connections that ask and never registered: they listen nowhere and are answered nothing. One
 * thread sends over all of them in turn, as fast as it can.
 */
class Strangers {
public:
    /**
     * Connects, which takes half a second each, and begins to send that many requests over each.
     * Nothing tells a stranger that its requests are done: without an end they would only pile up.
     */
    Strangers(std::size_t count, std::size_t requests);
    ~Strangers();
    Strangers(const Strangers&) = delete;
    Strangers& operator=(const Strangers&) = delete;

private:
    void connect();
    void work(std::size_t requests);

    std::vector<qns::UniqueFd> mSockets;
    std::thread mThread;
};
