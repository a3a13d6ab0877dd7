// SPDX-License-Identifier: MIT
#include "ptc/InstanceFactory.h"

#include "ptc/CallbackProxy.h"
#include "ptc/IRemoteReceiver.h"
#include "ptc/ISender.h"

#include <gtest/gtest.h>

#include <functional>
#include <string>
#include <vector>

namespace {

using Journal = std::vector<std::string>;

class Factory : public PTC::InstanceFactory {
public:
    using InstanceFactory::addProxy;
    using InstanceFactory::mpRemoteReceiver;

    void createInstance(long, void**) override {}
    void* createAdapter(long, PTC::IReceiver*, void*) override { return nullptr; }
    PTC::IProxyBase* createProxy(long, long, long) override { return nullptr; }
};

class Sender : public PTC::ISender {
public:
    explicit Sender(long id, Journal* journal = nullptr) : mId(id), mpJournal(journal) {}
    ~Sender() override {
        if (mpJournal)
            mpJournal->push_back("sender");
    }
    long getId() override { return mId; }
    void send(PTC::Event*) override {}

private:
    long mId;
    Journal* mpJournal;
};

class Proxy : public PTC::CallbackProxy {
public:
    explicit Proxy(Journal& journal) : CallbackProxy(1, true), mJournal(journal) {}
    ~Proxy() override { mJournal.push_back("proxy"); }

private:
    Journal& mJournal;
};

class Remote : public PTC::IRemoteReceiver {
public:
    explicit Remote(Journal& journal) : mJournal(journal) {}
    ~Remote() override { mJournal.push_back("receiver"); }
    long getId() override { return 0; }
    bool initialize(long) override { return true; }
    long getIdentity() override { return 1008; }
    void addReceiver(PTC::IReceiver*) override {}

private:
    Journal& mJournal;
};

} // namespace

TEST(InstanceFactory, HasNoIdentityBeforeThereIsARemoteReceiver) {
    Journal journal;
    Factory factory;
    EXPECT_TRUE(factory.initialize());
    EXPECT_EQ(factory.getRRIdentity(), -1);
    factory.mpRemoteReceiver = std::make_unique<Remote>(journal);
    EXPECT_EQ(factory.getRRIdentity(), 1008);
}

TEST(InstanceFactory, FindsASenderByItsModule) {
    Factory factory;
    EXPECT_EQ(factory.findSender(3), nullptr);
    auto* const sender = new Sender(3);
    factory.addSender(sender);
    EXPECT_EQ(factory.findSender(3), sender);
    EXPECT_EQ(factory.findSender(4), nullptr);
}

TEST(InstanceFactory, KeepsTheFirstSenderOfAModule) {
    Factory factory;
    auto* const kept = new Sender(3);
    Sender late(3);
    factory.addSender(kept);
    factory.addSender(&late);
    EXPECT_EQ(factory.findSender(3), kept);
}

TEST(InstanceFactory, DestroysWhatSendsBeforeWhatItSendsThrough) {
    Journal journal;
    {
        Factory factory;
        factory.addSender(new Sender(1, &journal));
        factory.addProxy(1, std::make_unique<Proxy>(journal));
        factory.mpRemoteReceiver = std::make_unique<Remote>(journal);
    }
    EXPECT_EQ(journal, (Journal{"receiver", "proxy", "sender"}));
}
