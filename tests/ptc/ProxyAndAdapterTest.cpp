// SPDX-License-Identifier: MIT
#include "ptc/Adapter.h"
#include "ptc/CallbackProxy.h"
#include "ptc/Event.h"
#include "ptc/IFactory.h"
#include "ptc/ISender.h"

#include <gmock/gmock.h>

#include <memory>

using testing::Return;
using testing::StrictMock;

namespace {

class KeepingSender : public PTC::ISender {
public:
    long getId() override { return 1; }
    void send(PTC::Event* event) override { last.reset(event); }

    std::unique_ptr<PTC::Event> last;
};

class ProxyFactoryMock : public PTC::IProxyFactory {
public:
    MOCK_METHOD(PTC::IProxyBase*, createProxy, (long, long, long), (override));
};

class PlainAdapter : public PTC::Adapter {
public:
    using Adapter::Adapter;
    void receive(PTC::Event*) override {}
    void setTarget(void*) override {}
};

} // namespace

TEST(CallbackProxy, CutsItsIdToASigned32BitNumber) {
    EXPECT_EQ(PTC::CallbackProxy((1L << 32) + 5, true).getId(), 5);
    EXPECT_EQ(PTC::CallbackProxy(0xFFFFFFFFL, true).getId(), -1);
    EXPECT_EQ(PTC::CallbackProxy(-7, true).getId(), -7);
}

TEST(CallbackProxy, SendsItsObjectsEventsAsCallbacks) {
    for (const bool isRemote : {true, false}) {
        KeepingSender sender;
        PTC::CallbackProxy proxy((1L << 32) + 5, isRemote);
        proxy.setSender(&sender);
        char block[4] = {};
        proxy.invokeMethod(10, block, sizeof(block));
        ASSERT_TRUE(sender.last);
        EXPECT_EQ(sender.last->objectId, 5);
        EXPECT_EQ(sender.last->methodId, 10);
        EXPECT_EQ(sender.last->data, block);
        EXPECT_EQ(sender.last->size, 4);
        EXPECT_EQ(sender.last->isRemote, isRemote);
        EXPECT_TRUE(sender.last->isCallback);
    }
}

TEST(Adapter, PassesOnWhatItsFactoryMakes) {
    StrictMock<ProxyFactoryMock> factory;
    PTC::CallbackProxy proxy(5, true);
    PlainAdapter adapter(62);
    EXPECT_EQ(adapter.getId(), 62);
    adapter.setProxyFactory(&factory);
    EXPECT_CALL(factory, createProxy(63, 5, 1002)).WillOnce(Return(&proxy));
    EXPECT_EQ(adapter.createProxy(63, 5, 1002), &proxy);
    EXPECT_CALL(factory, createProxy(53, -1, 0)).WillOnce(Return(nullptr));
    EXPECT_EQ(adapter.createProxy(53, -1, 0), nullptr);
}
