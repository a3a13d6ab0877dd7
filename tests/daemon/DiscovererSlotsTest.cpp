// SPDX-License-Identifier: MIT
#include <string>
#include <vector>

#include "tests/daemon/support/DiscovererDaemonTest.h"

using namespace discoverer;

namespace {

constexpr int kSlots = 10;

/** Clients beside that of SetUp(), which has the first slot. */
class DiscovererSlots : public DiscovererClientTest {
protected:
    struct Client {
        std::int32_t id;
        long object;
    };

    Client addClient() {
        const long object = mNextObject++;
        return {mClient.registerCallBack(object), object};
    }

    /** Clients for all slots. */
    std::vector<Client> fillSlots() {
        std::vector<Client> clients{{mId, kObject}};
        while (clients.size() < kSlots)
            clients.push_back(addClient());
        return clients;
    }

    /** Unregisters the client of SetUp(), and returns when that has been done. */
    void leave(const Client& witness) {
        mClient.request(kUnregister, mId);
        mClient.request(kInitialize, witness.id);
        mClient.expectResult(witness.object, kInitializeCallBack, 0);
    }

    /** The client's request reaches the discoverer with this number, and its answer the client. */
    void expectSlot(const Client& client, int number) {
        mClient.request(kGetExtensions, client.id);
        mDiscoverers.expectCall("discoverer " + std::to_string(number) + " extensions",
                                "return 0 \"x" + std::to_string(number) + "\" 7");
        mClient.expectCallBack(client.object, kExtensionsCallBack,
                               extensions("x" + std::to_string(number), 7));
    }

    void expectRefusals(const Client& client) {
        for (const long method : {kInitialize, kClose, kGetMetadata, kGetExtensions})
            mClient.request(method, client.id);
        mClient.open(client.id, "/a");
        mClient.getImage(client.id, "/nowhere/i");
        mClient.expectResult(client.object, kInitializeCallBack, 1);
        mClient.expectResult(client.object, kCloseCallBack, 1);
        mClient.expectCallBack(client.object, kMetadataCallBack, newMetadata(-1, 0));
        mClient.expectCallBack(client.object, kExtensionsCallBack, extensions("", 0));
        mClient.expectResult(client.object, kOpenCallBack, 5);
        mClient.expectCallBack(client.object, kImageCallBack, image(1, 1, "", ""));
    }

    static std::vector<std::string> refusalLog() {
        std::vector<std::string> lines;
        for (const std::string name : {"initializeDiscoverer", "closeDiscoverer", "getMetadata",
                                       "getSupportedExtensions", "openDiscoverer", "getImage"}) {
            lines.push_back(name + " Enter.");
            lines.push_back(name + " Leave, Failed.(getDiscovererId(iClientID) == false)");
        }
        return lines;
    }

    long mNextObject = kObject + 1;
};

TEST_F(DiscovererSlots, TheFirstTenClientsGetADiscovererEachInTheOrderOfRegistration) {
    const auto clients = fillSlots();
    for (int number = kSlots; number-- > 0;) {
        const auto& client = clients[static_cast<std::size_t>(number)];
        EXPECT_EQ(client.id, number + 1);
        expectSlot(client, number);
    }
}

TEST_F(DiscovererSlots, TheClientsMayBeInDifferentProcesses) {
    DiscovererClient other(1001);
    const auto id = other.registerCallBack(5);
    EXPECT_EQ(id, 2);
    other.request(kGetExtensions, id);
    mDiscoverers.expectCall("discoverer 1 extensions");
    other.expectCallBack(5, kExtensionsCallBack, extensions("", 0));
}

TEST_F(DiscovererSlots, TheEleventhClientIsRegisteredAndThenRefusedEverything) {
    fillSlots();
    const auto eleventh = addClient();
    EXPECT_EQ(eleventh.id, 11);
    expectRefusals(eleventh);
    expectServiceLog(refusalLog());
    mClient.expectNothingElse();
}

TEST_F(DiscovererSlots, AFreedSlotGoesToTheNextThatRegistersAndNotToOneThatWaits) {
    const auto clients = fillSlots();
    const auto eleventh = addClient();
    mClient.request(kUnregister, clients[3].id);
    expectRefusals(eleventh);
    const auto next = addClient();
    EXPECT_EQ(next.id, 12);
    expectSlot(next, 3);
    expectRefusals(addClient());
}

TEST_F(DiscovererSlots, TheLowestOfSeveralFreeSlotsIsTaken) {
    const auto clients = fillSlots();
    mClient.request(kUnregister, clients[7].id);
    mClient.request(kUnregister, clients[2].id);
    expectSlot(addClient(), 2);
    expectSlot(addClient(), 7);
}

TEST_F(DiscovererSlots, UnregisteringWhoIsNotRegisteredFreesNothing) {
    const auto clients = fillSlots();
    for (const std::int32_t id : {0, -1, 11, 77})
        mClient.request(kUnregister, id);
    expectSlot(clients[0], 0);
    expectRefusals(addClient());
}

TEST_F(DiscovererSlots, UnregisteringTwiceFreesOneSlot) {
    const auto clients = fillSlots();
    mClient.request(kUnregister, clients[0].id);
    expectSlot(addClient(), 0);
    mClient.request(kUnregister, clients[0].id);
    expectRefusals(addClient());
}

TEST_F(DiscovererSlots, AClientThatCannotBeReachedTakesNoSlot) {
    DiscovererClient other(1001);
    other.stopListening();
    mClient.sendRegistration(5, 1001);
    const auto next = addClient();
    EXPECT_EQ(next.id, 2);
    expectSlot(next, 1);
}

TEST_F(DiscovererSlots, AnOpenFileIsLeftToTheNextClientOfTheSlot) {
    open("/a");
    mClient.request(kUnregister, mId);
    const auto next = addClient();
    mClient.open(next.id, "/b");
    mClient.expectResult(next.object, kOpenCallBack, 5);
    mClient.request(kInitialize, next.id);
    mClient.expectResult(next.object, kInitializeCallBack, 0);
    mClient.open(next.id, "/b");
    mDiscoverers.expectCall("discoverer 0 open \"/b\"");
    mClient.expectResult(next.object, kOpenCallBack, 0);
}

TEST_F(DiscovererSlots, AnOpenThatEndsAfterItsClientHasLeftMakesTheSlotReadyForTheNext) {
    const auto witness = addClient();
    mClient.open(mId, "/a");
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 0 open \"/a\"");
    leave(witness);
    mDiscoverers.answer("return 0");
    expectSlot(witness, 1);
    const auto next = addClient();
    mClient.open(next.id, "/b");
    mDiscoverers.expectCall("discoverer 0 open \"/b\"");
    mClient.expectResult(next.object, kOpenCallBack, 0);
}

TEST_F(DiscovererSlots, ResultsForAClientThatHasLeftAreToldToNobody) {
    const auto witness = addClient();
    open("/a");
    mClient.request(kGetMetadata, mId);
    mClient.request(kGetExtensions, mId);
    mClient.getImage(mId, "/nowhere/i");
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 0 metadata");
    leave(witness);
    mDiscoverers.answer("return 0");
    mDiscoverers.expectCall("discoverer 0 extensions");
    mDiscoverers.expectCall("discoverer 0 metadata", "return 3");
    expectSlot(witness, 1);
    mClient.expectNothingElse();
}

TEST_F(DiscovererSlots, AResultGoesToTheClientThatHasTheSlotByThen) {
    mClient.request(kGetExtensions, mId);
    EXPECT_EQ(mDiscoverers.nextCall(), "discoverer 0 extensions");
    mClient.request(kUnregister, mId);
    const auto next = addClient();
    mClient.request(kInitialize, next.id);
    mClient.expectResult(next.object, kInitializeCallBack, 0);
    mDiscoverers.answer("return 0 \"mp3\" 1");
    mClient.expectCallBack(next.object, kExtensionsCallBack, extensions("mp3", 1));
}

} // namespace
