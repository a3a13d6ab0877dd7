// SPDX-License-Identifier: MIT
#include "discoverer/DiscovererIds.h"

#include <gmock/gmock.h>

namespace {

class TenClients : public testing::Test {
protected:
    TenClients() {
        for (int client = 1; client <= kDiscovererCount; ++client)
            mIds.setMediaDiscovererIdList(client);
    }

    DiscovererIds mIds;
};

} // namespace

TEST(DiscovererIds, AreNobodysAtFirst) {
    const DiscovererIds ids;
    for (int id = 0; id < kDiscovererCount; ++id)
        EXPECT_EQ(ids.clientOf(id), DiscovererIds::kNoClient);
    EXPECT_EQ(ids.getMediaDiscovererId(1), DiscovererIds::kNone);
    EXPECT_EQ(ids.getMediaDiscovererId(0), DiscovererIds::kNone);
}

TEST_F(TenClients, GetThemInTheOrderOfTheirRegistration) {
    for (int client = 1; client <= kDiscovererCount; ++client) {
        EXPECT_EQ(mIds.getMediaDiscovererId(client), client - 1);
        EXPECT_EQ(mIds.clientOf(client - 1), client);
    }
}

TEST_F(TenClients, LeaveNoneToAnEleventh) {
    mIds.setMediaDiscovererIdList(11);
    EXPECT_EQ(mIds.getMediaDiscovererId(11), DiscovererIds::kNone);
    EXPECT_EQ(mIds.clientOf(9), 10);
}

TEST_F(TenClients, FreeTheirsForTheNextThatRegisters) {
    mIds.setMediaDiscovererIdList(11);
    mIds.resetMediaDiscovererIdList(4);
    EXPECT_EQ(mIds.clientOf(3), DiscovererIds::kNoClient);
    EXPECT_EQ(mIds.getMediaDiscovererId(4), DiscovererIds::kNone);
    EXPECT_EQ(mIds.getMediaDiscovererId(11), DiscovererIds::kNone) << "it came too early";
    mIds.setMediaDiscovererIdList(12);
    EXPECT_EQ(mIds.getMediaDiscovererId(12), 3);
    EXPECT_EQ(mIds.clientOf(3), 12);
}

TEST_F(TenClients, FreeTheLowestFirst) {
    mIds.resetMediaDiscovererIdList(8);
    mIds.resetMediaDiscovererIdList(2);
    mIds.setMediaDiscovererIdList(11);
    mIds.setMediaDiscovererIdList(12);
    EXPECT_EQ(mIds.getMediaDiscovererId(11), 1);
    EXPECT_EQ(mIds.getMediaDiscovererId(12), 7);
}

TEST_F(TenClients, AreLeftAloneByTheEndOfOneThatHasNone) {
    for (const int client : {0, -1, 11, 77})
        mIds.resetMediaDiscovererIdList(client);
    for (int client = 1; client <= kDiscovererCount; ++client)
        EXPECT_EQ(mIds.clientOf(client - 1), client);
}
