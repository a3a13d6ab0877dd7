// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <map>
#include <mutex>

/** How many clients at a time can have a file open. */
constexpr int kDiscovererCount = 10;

/** Which client holds which of the discoverers. Any thread may call it. */
class DiscovererIds {
public:
    static constexpr int kNone = -1;    ///< no discoverer
    static constexpr int kNoClient = 0; ///< nobody's

    /**
     * Gives the client the first free discoverer, one that is set aside only when there is no
     * other. When there is none it gets none.
     */
    void setMediaDiscovererIdList(int iClientID);

    /** The client's discoverer, from 0 to 9, or kNone. */
    [[nodiscard]] int getMediaDiscovererId(int iClientID) const;

    /** Frees the client's discoverer, if it has one. */
    void resetMediaDiscovererIdList(int iClientID);

    /**
     * Frees the client's discoverer and sets it aside: it may still be working for the client.
     * Returns it, or kNone.
     */
    int setAside(int iClientID);

    /** Undoes one setAside() of the discoverer. */
    void takeBack(int iDiscovererID);

    /** The discoverer's client or kNoClient. */
    [[nodiscard]] int clientOf(int iDiscovererID) const;

private:
    // The lock must be held.
    [[nodiscard]] int firstFree() const;
    int freeDiscovererOf(int iClientID);

    mutable std::mutex mMutex; ///< guards all below
    std::map<int, int> mDiscovererOf;
    std::array<int, kDiscovererCount> mClientOf{};
    std::array<int, kDiscovererCount> mSetAside{}; ///< how often
};
