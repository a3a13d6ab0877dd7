// SPDX-License-Identifier: MIT
#include "ptc/EndedClients.h"

#include "ptc/CallbackProxy.h"
#include "ptc/IProxyHolder.h"
#include "ptc/SocketRemoteSender.h"
#include "tests/ptc/Eventually.h"
#include "tests/ptc/Peer.h"
#include "tests/ptc/ProcessState.h"

#include <gmock/gmock.h>

#include <memory>
#include <utility>

using testing::_;
using testing::Ref;
using testing::Return;
using testing::StrictMock;

namespace {

class Holder : public PTC::IProxyHolder {
public:
    MOCK_METHOD(bool, letGo, (PTC::IProxyBase & proxy), (override));
};

/** Tells its end. */
class Proxy : public PTC::CallbackProxy {
public:
    explicit Proxy(int& ends) : CallbackProxy(1, true), mEnds(ends) {}
    ~Proxy() override { ++mEnds; }

private:
    int& mEnds;
};

/** Nobody can see its end. */
class ForeignSender : public PTC::ISender {
public:
    long getId() override { return 9; }
    void send(PTC::Event*) override {}
};

/** The other end of a connection, and what stands for it in the table. */
class Client {
public:
    Client(PTC::ClientConnections& table, long module, int port) : mServer(port) {
        auto sender = std::make_unique<SocketRemoteSender>(module);
        EXPECT_TRUE(sender->initialize(port));
        mPeer = mServer.accept();
        mpSender = sender.get();
        table[module].pSender = std::move(sender);
    }

    void end() {
        mPeer = Peer(-1);
        EXPECT_TRUE(eventually([this] { return mpSender->hasEnded(); }));
    }

    Peer& peer() { return mPeer; }

private:
    BareServer mServer;
    Peer mPeer{-1};
    SocketRemoteSender* mpSender = nullptr;
};

class EndedClients : public testing::Test {
protected:
    EndedClients() {
        mEnded.addHolder(mFirst);
        mEnded.addHolder(mSecond);
    }

    PTC::IProxyBase& addProxy(long module) {
        auto& proxies = mConnections[module].proxies;
        proxies.push_back(std::make_unique<Proxy>(mProxyEnds));
        return *proxies.back();
    }

    void release() { mEnded.release(mConnections); }

    int mProxyEnds = 0;
    StrictMock<Holder> mFirst;
    StrictMock<Holder> mSecond;
    PTC::ClientConnections mConnections;
    PTC::EndedClients mEnded;
};

} // namespace

TEST_F(EndedClients, LeavesTheLivingAlone) {
    Client client(mConnections, 1, 1000);
    addProxy(1);
    release();
    EXPECT_EQ(mConnections.size(), 1u);
    EXPECT_EQ(mConnections.at(1).proxies.size(), 1u);
}

TEST_F(EndedClients, LeavesSendersAloneWhoseEndCannotBeSeen) {
    mConnections[9].pSender = std::make_unique<ForeignSender>();
    mConnections[8].proxies.clear();
    release();
    EXPECT_EQ(mConnections.size(), 2u);
}

TEST_F(EndedClients, AreFreedWhenAllHoldersHaveLetGo) {
    Client ended(mConnections, 1, 1000);
    Client living(mConnections, 2, 1001);
    auto& first = addProxy(1);
    auto& second = addProxy(1);
    addProxy(2);
    const auto descriptors = descriptorCount();
    ended.end();
    for (PTC::IProxyBase* proxy : {&first, &second}) {
        EXPECT_CALL(mFirst, letGo(Ref(*proxy))).WillOnce(Return(true));
        EXPECT_CALL(mSecond, letGo(Ref(*proxy))).WillOnce(Return(true));
    }
    release();
    EXPECT_EQ(mConnections.count(1), 0u);
    EXPECT_EQ(mConnections.count(2), 1u);
    EXPECT_EQ(mProxyEnds, 2);
    EXPECT_EQ(descriptorCount(), descriptors - 2) << "both ends of one connection";
    release();
}

TEST_F(EndedClients, StayUntilNobodyCanUseThemAndAllHoldersAreToldEveryTime) {
    Client ended(mConnections, 1, 1000);
    addProxy(1);
    ended.end();
    EXPECT_CALL(mFirst, letGo(_)).WillOnce(Return(false)).WillRepeatedly(Return(true));
    EXPECT_CALL(mSecond, letGo(_))
        .Times(3)
        .WillOnce(Return(true))
        .WillOnce(Return(false))
        .WillOnce(Return(true));
    release();
    EXPECT_TRUE(mConnections.empty());
    release();
    EXPECT_EQ(mProxyEnds, 0);
    release();
    EXPECT_EQ(mProxyEnds, 1);
}

TEST_F(EndedClients, GetNothingMoreFromAProxyThatIsStillInUse) {
    Client client(mConnections, 1, 1000);
    auto& proxy = dynamic_cast<PTC::CallbackProxy&>(addProxy(1));
    proxy.setSender(mConnections.at(1).pSender.get());
    client.peer().endWriting();
    EXPECT_CALL(mFirst, letGo(_)).WillOnce(Return(false));
    EXPECT_CALL(mSecond, letGo(_)).WillOnce(Return(true));
    release();
    proxy.invokeMethod(1, nullptr, 0);
    EXPECT_EQ(client.peer().readAll(), "");
}

TEST_F(EndedClients, LeaveTheirModuleToTheNext) {
    Client client(mConnections, 1, 1000);
    client.end();
    release();
    Client next(mConnections, 1, 1001);
    addProxy(1);
    release();
    EXPECT_EQ(mConnections.at(1).proxies.size(), 1u);
}
