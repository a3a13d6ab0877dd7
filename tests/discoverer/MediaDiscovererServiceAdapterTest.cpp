// SPDX-License-Identifier: MIT
#include "discoverer/MediaDiscovererServiceAdapter.h"

#include <cstring>
#include <limits>
#include <memory>
#include <random>

#include <gmock/gmock.h>

#include "define/RegistrationInfo.h"
#include "discoverer/MediaDiscovererServiceCallBackRemoteProxy.h"
#include "ptc/Event.h"
#include "ptc/IFactory.h"
#include "tests/support/Bytes.h"

using namespace MediaServiceDefine;
using testing::_;
using testing::AllOf;
using testing::Field;
using testing::NiceMock;
using testing::Return;
using testing::StrictMock;

namespace {

class ServiceMock : public IMediaDiscovererService {
public:
    ~ServiceMock() override { died(); }

    MOCK_METHOD(void, died, ());
    MOCK_METHOD(void, initializeDiscoverer, (int), (override));
    MOCK_METHOD(void, openDiscoverer, (_tagFileName), (override));
    MOCK_METHOD(void, closeDiscoverer, (int), (override));
    MOCK_METHOD(void, getMetadata, (int), (override));
    MOCK_METHOD(void, getImage, (_tagImageParam), (override));
    MOCK_METHOD(void, getSupportedExtensions, (int), (override));
    MOCK_METHOD(void, registerCallBack, (IMediaDiscovererServiceCallBack*), (override));
    MOCK_METHOD(void, unregisterCallBack, (int), (override));
};

class ProxyFactoryMock : public PTC::IProxyFactory {
public:
    MOCK_METHOD(PTC::IProxyBase*, createProxy, (long, long, long), (override));
};

auto fileName(int id, const std::wstring& name) {
    return AllOf(Field(&_tagFileName::iClientID, id), Field(&_tagFileName::strFileName, name));
}

auto imageParam(int id, int width, int height, int64_t position, const std::wstring& image,
                const std::wstring& notice) {
    return AllOf(
        Field(&_tagImageParam::iClientID, id), Field(&_tagImageParam::iWidth, width),
        Field(&_tagImageParam::iHeight, height), Field(&_tagImageParam::lPosition, position),
        Field(&_tagImageParam::strImagePath, image), Field(&_tagImageParam::strNoticePath, notice));
}

class DiscovererAdapter : public testing::Test {
protected:
    DiscovererAdapter() {
        mAdapter->setProxyFactory(&mFactory);
        mAdapter->setTarget(static_cast<IMediaDiscovererService*>(mpService));
    }
    ~DiscovererAdapter() override {
        if (mAdapter)
            EXPECT_CALL(*mpService, died());
    }

    /** The block has exactly the size of the bytes, so that a sanitizer sees every overrun. */
    bool receive(long method, const Bytes& bytes, bool isRemote = true) {
        auto* const data = new char[bytes.size()];
        std::copy(bytes.begin(), bytes.end(), data);
        PTC::Event event(51, method, data, static_cast<long>(bytes.size()), isRemote, false);
        mAdapter->receive(&event);
        const bool isLeft = event.data != nullptr;
        delete[] event.data;
        return isLeft;
    }

    StrictMock<ServiceMock>* mpService = new StrictMock<ServiceMock>; ///< owned by the adapter
    StrictMock<ProxyFactoryMock> mFactory;
    std::unique_ptr<MediaDiscovererServiceAdapter> mAdapter =
        std::make_unique<MediaDiscovererServiceAdapter>(51);
};

} // namespace

TEST_F(DiscovererAdapter, HasTheIdThatItWasGiven) {
    EXPECT_EQ(mAdapter->getId(), 51);
}

TEST_F(DiscovererAdapter, CallsTheOperationOfEachMethodId) {
    const testing::InSequence inThisOrder;
    EXPECT_CALL(*mpService, initializeDiscoverer(1));
    EXPECT_CALL(*mpService, openDiscoverer(fileName(2, L"/a b.mp4")));
    EXPECT_CALL(*mpService, closeDiscoverer(3));
    EXPECT_CALL(*mpService, getMetadata(4));
    EXPECT_CALL(*mpService, getImage(imageParam(5, 320, -2, 7000000000, L"/i.jpg", L"/n")));
    EXPECT_CALL(*mpService, getSupportedExtensions(6));
    EXPECT_CALL(*mpService, unregisterCallBack(7));

    receive(1, int32(1));
    receive(2, int32(2) + text("/a b.mp4"));
    receive(3, int32(3));
    receive(4, int32(4));
    receive(5, int32(5) + int32(320) + int32(-2) + int64(7000000000) + text("/i.jpg") + text("/n"));
    receive(6, int32(6));
    receive(7, int32(7));
}

TEST_F(DiscovererAdapter, IgnoresMethodIdsThatAreNotTheDiscoverers) {
    for (const long method : {0L, 9L, -1L, -8L, (1L << 32) + 1, std::numeric_limits<long>::min(),
                              std::numeric_limits<long>::max()}) {
        EXPECT_TRUE(receive(method, int32(1) + int32(1)));
        EXPECT_TRUE(receive(method, int32(1) + int32(1), false));
    }
}

TEST_F(DiscovererAdapter, LeavesFieldsThatDoNotComeAsTheyAreInANewRecord) {
    EXPECT_CALL(*mpService, openDiscoverer(fileName(-1, L"")));
    receive(2, {});
    EXPECT_CALL(*mpService, openDiscoverer(fileName(3, L"")));
    receive(2, int32(3));
    EXPECT_CALL(*mpService, getImage(imageParam(-1, 0, 0, 0, L"", L"")));
    receive(5, {});
    EXPECT_CALL(*mpService, getImage(imageParam(3, 4, 0, 0, L"", L"")));
    receive(5, int32(3) + int32(4));
    EXPECT_CALL(*mpService, getImage(imageParam(3, 4, 5, 6, L"/i", L"")));
    receive(5, int32(3) + int32(4) + int32(5) + int64(6) + text("/i"));
}

TEST_F(DiscovererAdapter, DecodesEmptyPaths) {
    EXPECT_CALL(*mpService, getImage(imageParam(1, 2, 3, 4, L"", L"")));
    receive(5, int32(1) + int32(2) + int32(3) + int32(4) + text("") + text(""));
}

TEST_F(DiscovererAdapter, CutsAClientIdOf64BitsToItsLowerHalf) {
    const Bytes two = int64(4294967298);
    EXPECT_CALL(*mpService, initializeDiscoverer(2));
    EXPECT_CALL(*mpService, openDiscoverer(fileName(2, L"")));
    EXPECT_CALL(*mpService, closeDiscoverer(2));
    EXPECT_CALL(*mpService, getMetadata(2));
    EXPECT_CALL(*mpService, getImage(imageParam(2, 0, 0, 0, L"", L"")));
    EXPECT_CALL(*mpService, getSupportedExtensions(2));
    EXPECT_CALL(*mpService, unregisterCallBack(2));
    for (long method = 1; method <= 7; ++method)
        receive(method, two);
}

TEST_F(DiscovererAdapter, RegistersAProxyForARemoteCallbackObject) {
    MediaDiscovererServiceCallBackRemoteProxy proxy(9);
    EXPECT_CALL(mFactory, createProxy(52, 1234567890123, 1003)).WillOnce(Return(&proxy));
    EXPECT_CALL(*mpService, registerCallBack(&proxy));
    EXPECT_TRUE(receive(8, int64(1234567890123) + int64(1003)));
}

TEST_F(DiscovererAdapter, RegistersAProxyForALocalCallbackObjectAndFreesTheBlock) {
    MediaDiscovererServiceCallBackRemoteProxy proxy(9);
    EXPECT_CALL(mFactory, createProxy(52, -2, 0)).WillOnce(Return(&proxy));
    EXPECT_CALL(*mpService, registerCallBack(&proxy));
    EXPECT_FALSE(receive(8, {0xFE, 0xFF, 0xFF, 0xFF}, false));
}

TEST_F(DiscovererAdapter, RegistersNothingWhenThereIsNoProxyOfItsKind) {
    EXPECT_CALL(mFactory, createProxy(52, 1, 1000)).WillOnce(Return(nullptr));
    EXPECT_CALL(*mpService, registerCallBack(nullptr));
    receive(8, int32(1) + int32(1000));
}

TEST_F(DiscovererAdapter, WithoutATargetIgnoresEverything) {
    MediaDiscovererServiceAdapter adapter(51);
    for (long method = 0; method <= 9; ++method) {
        char block[] = {1};
        PTC::Event event(51, method, block, 1, true, false);
        adapter.receive(&event);
    }
}

TEST_F(DiscovererAdapter, DeletesItsTarget) {
    EXPECT_CALL(*mpService, died());
    mAdapter.reset();
}

TEST_F(DiscovererAdapter, ReadsNoByteOutsideABlockOfAnyContent) {
    NiceMock<ServiceMock>* const service = new NiceMock<ServiceMock>;
    EXPECT_CALL(*mpService, died());
    mAdapter->setTarget(static_cast<IMediaDiscovererService*>(service));
    EXPECT_CALL(mFactory, createProxy(52, _, _)).WillRepeatedly(Return(nullptr));
    std::mt19937 random(1);
    for (int round = 0; round < 20000; ++round) {
        Bytes bytes(random() % 40);
        for (auto& byte : bytes)
            byte = static_cast<uint8_t>(random());
        receive(static_cast<long>(random() % 10), bytes, random() % 2 == 0);
    }
    mAdapter.reset();
}
