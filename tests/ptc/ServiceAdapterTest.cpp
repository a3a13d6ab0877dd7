// SPDX-License-Identifier: MIT
#include "ptc/ServiceAdapter.h"

#include "define/RegistrationInfo.h"
#include "pack/PackedArguments.h"
#include "ptc/CallbackProxy.h"
#include "ptc/CallbackReply.h"
#include "ptc/IFactory.h"
#include "ptc/ISender.h"

#include <gmock/gmock.h>

#include <cstring>
#include <memory>
#include <string>
#include <thread>
#include <vector>

using testing::Mock;
using testing::Return;
using testing::StrictMock;

namespace {

class ICallBack {
public:
    virtual ~ICallBack() = default;
};

class INotify {
public:
    virtual ~INotify() = default;
};

struct Listener {
    INotify* pNotify;
    int iClientID;
};

struct Name {
    int id = -1;
    std::wstring text = L"preset";
};

enum class Format : int {};

class IService {
public:
    virtual ~IService() = default;
    virtual void play(int id) = 0;
    virtual void open(Name name) = 0;
    virtual void setFormat(Format format) = 0;
    virtual void registerCallBack(ICallBack* callback) = 0;
    virtual void registerNotify(Listener listener) = 0;
};

class ServiceMock : public IService {
public:
    ~ServiceMock() override { died(); }
    MOCK_METHOD(void, died, ());
    MOCK_METHOD(void, play, (int), (override));
    MOCK_METHOD(void, open, (Name), (override));
    MOCK_METHOD(void, setFormat, (Format), (override));
    MOCK_METHOD(void, registerCallBack, (ICallBack*), (override));
    MOCK_METHOD(void, registerNotify, (Listener), (override));
};

class CallBackProxy : public ICallBack, public PTC::CallbackProxy {
public:
    CallBackProxy() : CallbackProxy(7, true) {}
};

class NotifyProxy : public INotify, public PTC::CallbackProxy {
public:
    NotifyProxy() : CallbackProxy(8, true) {}
};

class ProxyFactoryMock : public PTC::IProxyFactory {
public:
    MOCK_METHOD(PTC::IProxyBase*, createProxy, (long, long, long), (override));
};

enum class MethodId : long { play = 1, open = 2 };

class ExampleAdapter : public PTC::ServiceAdapter<IService, ICallBack, INotify> {
public:
    using ServiceAdapter::ServiceAdapter;
    void receive(PTC::Event* event) override {
        static constexpr Method kMethods[] = {
            {MethodId::play, call<&IService::play>},
            {MethodId::open, call<&IService::open, deserializeName>},
            {3, call<&IService::setFormat>},
            {13, registerCallBack<&IService::registerCallBack, 63>},
            {14, registerNotify<&IService::registerNotify, 64>},
            {15, registerNotify<&IService::registerNotify, 58, PTC::RecordObjectId::bits32>},
        };
        dispatch(kMethods, *event);
    }

private:
    static void deserializeName(Name& name, ArgumentReader& reader) {
        reader.read(name.id);
        reader.read(name.text);
    }
};

template<typename Record>
std::string memoryOf(const Record& record) {
    return {reinterpret_cast<const char*>(&record), sizeof(record)};
}

std::string bytesOf(const PackedArguments& arguments) {
    return {reinterpret_cast<const char*>(arguments.data()), arguments.size()};
}

MATCHER_P2(IsName, id, text, "") {
    return arg.id == id && arg.text == text;
}

MATCHER_P2(IsListener, notify, id, "") {
    return arg.pNotify == notify && arg.iClientID == id;
}

class ServiceAdapter : public testing::Test {
protected:
    ServiceAdapter() {
        mAdapter->setProxyFactory(&mFactory);
        mAdapter->setTarget(static_cast<IService*>(mpService));
    }
    ~ServiceAdapter() override {
        if (mAdapter)
            EXPECT_CALL(*mpService, died());
    }

    /** The block is as large as its bytes, so that a sanitizer sees every overrun. */
    void receive(long method, const std::string& bytes, bool isRemote = true) {
        auto block = std::make_unique<char[]>(bytes.size());
        bytes.copy(block.get(), bytes.size());
        PTC::Event event(62, method, block.release(), static_cast<long>(bytes.size()), isRemote,
                         false);
        mAdapter->receive(&event);
        recordTaken = !event.data && event.size == 0;
        delete[] event.data;
    }

    bool recordTaken = false;
    StrictMock<ServiceMock>* mpService = new StrictMock<ServiceMock>; ///< owned by the adapter
    StrictMock<ProxyFactoryMock> mFactory;
    CallBackProxy mCallBack;
    NotifyProxy mNotify;
    std::unique_ptr<ExampleAdapter> mAdapter = std::make_unique<ExampleAdapter>(62);
};

} // namespace

TEST_F(ServiceAdapter, DeletesItsTarget) {
    EXPECT_CALL(*mpService, died());
    mAdapter.reset();
    Mock::VerifyAndClearExpectations(mpService);
}

TEST_F(ServiceAdapter, CallsTheOperationOfAMethodId) {
    PackedArguments name;
    name.int32(5).text(L"/a");
    EXPECT_CALL(*mpService, play(3));
    EXPECT_CALL(*mpService, open(IsName(5, L"/a")));
    EXPECT_CALL(*mpService, setFormat(Format(2)));
    receive(1, bytesOf(PackedArguments().int64(4294967299)));
    receive(2, bytesOf(name));
    receive(3, bytesOf(PackedArguments().int32(2)));
    EXPECT_FALSE(recordTaken);
}

TEST_F(ServiceAdapter, IgnoresMethodIdsThatAreNotInItsTable) {
    for (const long method : {0L, 4L, 16L, -1L, (1L << 32) + 1})
        receive(method, bytesOf(PackedArguments().int32(1)));
}

TEST_F(ServiceAdapter, DoesNothingWithoutATarget) {
    ExampleAdapter adapter(62);
    PTC::Event event(62, 13, nullptr, 0, true, false);
    adapter.receive(&event);
}

TEST_F(ServiceAdapter, LeavesTheFieldsThatABlockLacksAsANewRecordHasThem) {
    EXPECT_CALL(*mpService, play(0));
    EXPECT_CALL(*mpService, open(IsName(-1, L"preset")));
    EXPECT_CALL(*mpService, open(IsName(5, L"preset")));
    receive(1, "");
    receive(2, "");
    receive(2, bytesOf(PackedArguments().int32(5)));
}

TEST_F(ServiceAdapter, RegistersAProxyForARemoteCallbackObject) {
    EXPECT_CALL(mFactory, createProxy(63, 1L << 33, 1002)).WillOnce(Return(&mCallBack));
    EXPECT_CALL(*mpService, registerCallBack(&mCallBack));
    receive(13, bytesOf(PackedArguments().int64(1L << 33).int64(1002)));
    EXPECT_FALSE(recordTaken);
}

TEST_F(ServiceAdapter, RegistersAProxyForARemoteNotifyObject) {
    EXPECT_CALL(mFactory, createProxy(64, 8, 1002)).WillOnce(Return(&mNotify));
    EXPECT_CALL(*mpService, registerNotify(IsListener(&mNotify, 3)));
    receive(14, bytesOf(PackedArguments().int64(8).int32(1002).int64(4294967299)));
    EXPECT_FALSE(recordTaken);
}

TEST_F(ServiceAdapter, RegistersNullWhenThereIsNoProxyOrOneOfAnotherKind) {
    EXPECT_CALL(mFactory, createProxy(63, 7, 1002))
        .WillOnce(Return(nullptr))
        .WillOnce(Return(&mNotify));
    EXPECT_CALL(*mpService, registerCallBack(nullptr)).Times(2);
    for (int round = 0; round < 2; ++round)
        receive(13, bytesOf(PackedArguments().int32(7).int32(1002)));
    EXPECT_CALL(mFactory, createProxy(64, 7, 1002)).WillOnce(Return(&mCallBack));
    EXPECT_CALL(*mpService, registerNotify(IsListener(nullptr, 3)));
    receive(14, bytesOf(PackedArguments().int32(7).int32(1002).int32(3)));
}

TEST_F(ServiceAdapter, TakesTheRecordOfACallerInsideTheProcess) {
    EXPECT_CALL(mFactory, createProxy(63, -2, 0)).WillOnce(Return(&mCallBack));
    EXPECT_CALL(*mpService, registerCallBack(&mCallBack));
    receive(13, memoryOf(_tagCallBackInfo{(1L << 40) + 0xFFFFFFFEL, 1002}), false);
    EXPECT_TRUE(recordTaken);

    EXPECT_CALL(mFactory, createProxy(64, (1L << 40) + 8, 0)).WillOnce(Return(&mNotify));
    EXPECT_CALL(*mpService, registerNotify(IsListener(&mNotify, 3)));
    receive(14, memoryOf(_tagNotifyInfo{(1L << 40) + 8, 1002, 3}), false);
    EXPECT_TRUE(recordTaken);

    EXPECT_CALL(mFactory, createProxy(58, 8, 0)).WillOnce(Return(&mNotify));
    EXPECT_CALL(*mpService, registerNotify(IsListener(&mNotify, 3)));
    receive(15, memoryOf(_tagNotifyInfo{(1L << 40) + 8, 1002, 3}), false);
    EXPECT_TRUE(recordTaken);
}

TEST_F(ServiceAdapter, ReadsTheFieldsThatARecordIsTooShortForAsZero) {
    const std::string callBack = memoryOf(_tagCallBackInfo{7, 1002});
    const std::string notify = memoryOf(_tagNotifyInfo{8, 1002, 3});
    for (std::size_t length = 0; length <= notify.size(); ++length) {
        EXPECT_CALL(mFactory, createProxy(63, length >= 4 ? 7 : 0, 0)).WillOnce(Return(&mCallBack));
        EXPECT_CALL(*mpService, registerCallBack(&mCallBack));
        receive(13, callBack.substr(0, length), false);
        EXPECT_TRUE(recordTaken);

        EXPECT_CALL(mFactory, createProxy(64, length >= 8 ? 8 : 0, 0)).WillOnce(Return(&mNotify));
        EXPECT_CALL(*mpService, registerNotify(IsListener(&mNotify, length >= 20 ? 3 : 0)));
        receive(14, notify.substr(0, length), false);
        EXPECT_TRUE(recordTaken);
        Mock::VerifyAndClearExpectations(mpService);
        Mock::VerifyAndClearExpectations(&mFactory);
    }
}

TEST_F(ServiceAdapter, TakesARegistrationWithoutABlock) {
    for (const bool isRemote : {true, false}) {
        EXPECT_CALL(mFactory, createProxy(63, 0, 0)).WillOnce(Return(nullptr));
        EXPECT_CALL(*mpService, registerCallBack(nullptr));
        PTC::Event event(62, 13, nullptr, 16, isRemote, false);
        mAdapter->receive(&event);
        Mock::VerifyAndClearExpectations(&mFactory);
    }
}

TEST_F(ServiceAdapter, LetsGoOfWhatIsNotItsServicesAndOfNothingElse) {
    PTC::CallbackProxy foreign(9, true);
    EXPECT_TRUE(mAdapter->letGo(foreign));
    EXPECT_FALSE(mAdapter->letGo(mCallBack)) << "the service tells nobody whether it uses it";
    EXPECT_FALSE(mAdapter->letGo(mNotify));
}

namespace {

/** A service with a registry of its clients. */
class RegisteringService : public IService, public ClientNotify {
public:
    void play(int) override {}
    void open(Name) override {}
    void setFormat(Format) override {}
    void registerCallBack(ICallBack* callback) override { registerClient(callback); }
    void registerNotify(Listener listener) override {
        registerNotifyClient(listener.iClientID, listener.pNotify);
    }
    using ClientNotify::notifyClients;
    using ClientNotify::use;
};

class RegisteringAdapter : public testing::Test {
protected:
    RegisteringAdapter() {
        mAdapter.setTarget(static_cast<IService*>(mpService));
        mpService->registerCallBack(&mCallBack);
        mpService->registerNotify({&mNotify, 1});
    }

    CallBackProxy mCallBack;
    NotifyProxy mNotify;
    RegisteringService* mpService = new RegisteringService; ///< owned by the adapter
    ExampleAdapter mAdapter{62};
};

} // namespace

TEST_F(RegisteringAdapter, LetsGoOfEachProxyAlone) {
    EXPECT_TRUE(mAdapter.letGo(mNotify));
    EXPECT_TRUE(mpService->notifyClients().empty());
    EXPECT_TRUE(mpService->isEnableID(1));
    EXPECT_TRUE(mAdapter.letGo(mCallBack));
    EXPECT_FALSE(mpService->isEnableID(1));
    EXPECT_TRUE(mAdapter.letGo(mCallBack)) << "for the second time";
}

TEST_F(RegisteringAdapter, AsksForPatienceWhileAThreadMayUseTheProxy) {
    std::thread([this] {
        const auto held = mpService->use();
        std::thread([this] { EXPECT_FALSE(mAdapter.letGo(mCallBack)); }).join();
    }).join();
    EXPECT_FALSE(mpService->isEnableID(1)) << "unregistered at once";
    EXPECT_TRUE(mAdapter.letGo(mCallBack));
}

TEST(CallbackReply, SendsANumberInIts32BitForm) {
    struct Sender : PTC::ISender {
        long getId() override { return 1; }
        void send(PTC::Event* event) override {
            const std::unique_ptr<PTC::Event> owned(event);
            method = event->methodId;
            bytes.assign(event->data, static_cast<std::size_t>(event->size));
        }
        long method = 0;
        std::string bytes;
    } sender;
    PTC::CallbackProxy proxy(7, true);
    proxy.setSender(&sender);
    PTC::sendInteger(proxy, 5, 1);
    EXPECT_EQ(sender.method, 5);
    EXPECT_EQ(sender.bytes, bytesOf(PackedArguments().int32(1)));
    PackedArguments flag;
    flag.boolean(true);
    const std::string expected = bytesOf(flag);
    PTC::sendArguments(proxy, 6, std::move(flag));
    EXPECT_EQ(sender.method, 6);
    EXPECT_EQ(sender.bytes, expected);
}
