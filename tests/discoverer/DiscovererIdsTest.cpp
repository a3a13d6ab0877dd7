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

TEST_F(TenClients, AreGivenWhatIsSetAsideOnlyWhenNothingElseIsFree) {
    EXPECT_EQ(mIds.setAside(3), 2);
    EXPECT_EQ(mIds.clientOf(2), DiscovererIds::kNoClient);
    EXPECT_EQ(mIds.getMediaDiscovererId(3), DiscovererIds::kNone);
    mIds.resetMediaDiscovererIdList(8);
    mIds.setMediaDiscovererIdList(11);
    mIds.setMediaDiscovererIdList(12);
    EXPECT_EQ(mIds.getMediaDiscovererId(11), 7);
    EXPECT_EQ(mIds.getMediaDiscovererId(12), 2);
}

TEST_F(TenClients, AreGivenWhatWasTakenBackInItsOrder) {
    mIds.setAside(3);
    mIds.resetMediaDiscovererIdList(8);
    mIds.takeBack(2);
    mIds.setMediaDiscovererIdList(11);
    EXPECT_EQ(mIds.getMediaDiscovererId(11), 2);
}

TEST_F(TenClients, MaySetOneAsideAgainBeforeItIsTakenBack) {
    mIds.setAside(3);
    mIds.setMediaDiscovererIdList(11);
    mIds.setAside(11);
    mIds.takeBack(2);
    mIds.resetMediaDiscovererIdList(8);
    mIds.setMediaDiscovererIdList(12);
    EXPECT_EQ(mIds.getMediaDiscovererId(12), 7) << "the other one is still set aside once";
}

TEST_F(TenClients, SetNothingAsideForOneThatHasNone) {
    for (const int client : {0, -1, 11})
        EXPECT_EQ(mIds.setAside(client), DiscovererIds::kNone);
    EXPECT_EQ(mIds.clientOf(0), 1);
}

TEST_F(TenClients, AreLeftAloneByTheEndOfOneThatHasNone) {
    for (const int client : {0, -1, 11, 77})
        mIds.resetMediaDiscovererIdList(client);
    for (int client = 1; client <= kDiscovererCount; ++client)
        EXPECT_EQ(mIds.clientOf(client - 1), client);
}
