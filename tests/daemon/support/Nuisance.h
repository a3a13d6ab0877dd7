// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <string>
#include <thread>
#include <vector>

/** What a client may do to a daemon, again and again, once a millisecond. */
struct Nuisance {
    std::string name; ///< in words that a test's name may have
    void (*act)(const std::atomic<bool>& stop);
};

/**
 * All of them, for a daemon that serves clients that restart. They use the identities 1004 to
 * 1006 and connections of their own.
 */
const std::vector<Nuisance>& allNuisances();

/** Does it on a thread of its own, as long as it lives. */
class Ongoing {
public:
    explicit Ongoing(const Nuisance& nuisance) : mThread(nuisance.act, std::cref(mStop)) {}
    ~Ongoing() {
        mStop = true;
        mThread.join();
    }
    Ongoing(const Ongoing&) = delete;
    Ongoing& operator=(const Ongoing&) = delete;

private:
    std::atomic<bool> mStop{false};
    std::thread mThread;
};
