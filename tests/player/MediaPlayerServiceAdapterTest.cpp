// SPDX-License-Identifier: MIT
#include "player/MediaPlayerServiceAdapter.h"

#include <cstring>
#include <limits>
#include <memory>
#include <random>

#include <gmock/gmock.h>

#include "define/RegistrationInfo.h"
#include "player/IMediaPlayerServiceCallBack.h"
#include "player/IMediaPlayerServiceNotify.h"
#include "player/MediaPlayerServiceCallBackRemoteProxy.h"
#include "player/MediaPlayerServiceNotifyRemoteProxy.h"
#include "ptc/IFactory.h"
#include "tests/support/Bytes.h"

using namespace MediaServiceDefine;
using testing::_;
using testing::AllOf;
using testing::Field;
using testing::Mock;
using testing::NiceMock;
using testing::Return;
using testing::StrictMock;

namespace {

class ServiceMock : public IMediaPlayerService {
public:
    ~ServiceMock() override { died(); }

    MOCK_METHOD(void, died, ());
    MOCK_METHOD(void, initializePlayer, (int), (override));
    MOCK_METHOD(void, openPlayer, (_tagFileName), (override));
    MOCK_METHOD(void, closePlayer, (int), (override));
    MOCK_METHOD(void, play, (int), (override));
    MOCK_METHOD(void, pause, (int), (override));
    MOCK_METHOD(void, seek, (_tagSeekParam), (override));
    MOCK_METHOD(void, getPlayerStatus, (int), (override));
    MOCK_METHOD(void, setRepeat, (_tagRepeatParam), (override));
    MOCK_METHOD(void, powerOffMediaPlayer, (int), (override));
    MOCK_METHOD(void, registerCallBack, (IMediaPlayerServiceCallBack*), (override));
    MOCK_METHOD(void, registerNotify, (_tagIMediaPlayerServiceNotify), (override));
    MOCK_METHOD(void, unregisterCallBack, (int), (override));
    MOCK_METHOD(void, unregisterNotify, (int), (override));
    MOCK_METHOD(void, setSystemFormat, (_emMediaServiceSystemFormat), (override));
};

class ProxyFactoryMock : public PTC::IProxyFactory {
public:
    MOCK_METHOD(PTC::IProxyBase*, createProxy, (long, long, long), (override));
};

auto fileName(int id, const std::wstring& name) {
    return AllOf(Field(&_tagFileName::iClientID, id), Field(&_tagFileName::strFileName, name));
}

auto seekParam(int id, int mode, long position, bool option) {
    return AllOf(Field(&_tagSeekParam::iClientID, id), Field(&_tagSeekParam::iSeekMode, mode),
                 Field(&_tagSeekParam::lPosition, position),
                 Field(&_tagSeekParam::bSeekOption, option));
}

auto repeatParam(int id, bool repeat, long start, long end) {
    return AllOf(Field(&_tagRepeatParam::iClientID, id), Field(&_tagRepeatParam::bRepeat, repeat),
                 Field(&_tagRepeatParam::lRepeatStart, start),
                 Field(&_tagRepeatParam::lRepeatEnd, end));
}

auto notifyOf(IMediaPlayerServiceNotify* notify, int id) {
    return AllOf(Field(&_tagIMediaPlayerServiceNotify::pNotify, notify),
                 Field(&_tagIMediaPlayerServiceNotify::iClientID, id));
}

template<typename Record>
Bytes memoryOf(const Record& record) {
    Bytes bytes(sizeof(record));
    std::memcpy(bytes.data(), &record, sizeof(record));
    return bytes;
}

class PlayerAdapter : public testing::Test {
protected:
    PlayerAdapter() {
        mAdapter->setProxyFactory(&mFactory);
        mAdapter->setTarget(static_cast<IMediaPlayerService*>(mpService));
    }
    ~PlayerAdapter() override {
        if (mAdapter)
            EXPECT_CALL(*mpService, died());
    }

    /** The block has exactly the size of the bytes, so that a sanitizer sees every overrun. */
    void receive(long method, const Bytes& bytes, bool isRemote = true) {
        auto* const data = new char[bytes.size()];
        std::copy(bytes.begin(), bytes.end(), data);
        PTC::Event event(62, method, data, static_cast<long>(bytes.size()), isRemote, false);
        mAdapter->receive(&event);
        delete[] event.data;
    }

    StrictMock<ServiceMock>* mpService = new StrictMock<ServiceMock>; ///< owned by the adapter
    StrictMock<ProxyFactoryMock> mFactory;
    std::unique_ptr<MediaPlayerServiceAdapter> mAdapter =
        std::make_unique<MediaPlayerServiceAdapter>(62);
};

} // namespace

TEST_F(PlayerAdapter, HasTheIdThatItWasGiven) {
    EXPECT_EQ(mAdapter->getId(), 62);
}

TEST_F(PlayerAdapter, CallsTheOperationOfEachMethodId) {
    const testing::InSequence inThisOrder;
    EXPECT_CALL(*mpService, initializePlayer(1));
    EXPECT_CALL(*mpService, openPlayer(fileName(2, L"/a b.mp4")));
    EXPECT_CALL(*mpService, closePlayer(3));
    EXPECT_CALL(*mpService, play(4));
    EXPECT_CALL(*mpService, pause(5));
    EXPECT_CALL(*mpService, seek(seekParam(6, 2, -7000000000, true)));
    EXPECT_CALL(*mpService, getPlayerStatus(7));
    EXPECT_CALL(*mpService, setRepeat(repeatParam(8, true, 5000000000, 6000000000)));
    EXPECT_CALL(*mpService, powerOffMediaPlayer(9));
    EXPECT_CALL(*mpService, unregisterCallBack(10));
    EXPECT_CALL(*mpService, unregisterNotify(11));
    EXPECT_CALL(*mpService, setSystemFormat(_emMediaServiceSystemFormat(12)));

    receive(1, int32(1));
    receive(2, int32(2) + text("/a b.mp4"));
    receive(3, int32(3));
    receive(4, int32(4));
    receive(5, int32(5));
    receive(6, int32(6) + int32(2) + int64(-7000000000) + boolean(true));
    receive(7, int32(7));
    receive(8, int32(8) + boolean(true) + int64(5000000000) + int64(6000000000));
    receive(9, int32(9));
    receive(10, int32(10));
    receive(11, int32(11));
    receive(12, int32(12));
}

TEST_F(PlayerAdapter, IgnoresMethodIdsThatAreNotThePlayers) {
    for (const long method : {0L, 15L, 16L, -1L, -2L, -14L, (1L << 32) + 1,
                              std::numeric_limits<long>::min(), std::numeric_limits<long>::max()}) {
        receive(method, int32(1) + int32(1) + int32(1));
        receive(method, memoryOf(_tagNotifyInfo{1, 1000, 1}), false);
    }
}

TEST_F(PlayerAdapter, CutsAClientIdOf64BitsToItsLowerHalf) {
    const Bytes two = int64(4294967298);
    EXPECT_CALL(*mpService, initializePlayer(2));
    EXPECT_CALL(*mpService, openPlayer(fileName(2, L"")));
    EXPECT_CALL(*mpService, closePlayer(2));
    EXPECT_CALL(*mpService, play(2));
    EXPECT_CALL(*mpService, pause(2));
    EXPECT_CALL(*mpService, seek(seekParam(2, 0, 0, false)));
    EXPECT_CALL(*mpService, getPlayerStatus(2));
    EXPECT_CALL(*mpService, setRepeat(repeatParam(2, false, 0, -1)));
    EXPECT_CALL(*mpService, powerOffMediaPlayer(2));
    EXPECT_CALL(*mpService, unregisterCallBack(2));
    EXPECT_CALL(*mpService, unregisterNotify(2));
    EXPECT_CALL(*mpService, setSystemFormat(_emMediaServiceSystemFormat(2)));
    for (long method = 1; method <= 12; ++method)
        receive(method, two);
}

TEST_F(PlayerAdapter, TakesAnyFormOfAnInteger) {
    EXPECT_CALL(*mpService, play(5)).Times(4);
    receive(4, {5});
    receive(4, {0xCC, 5});
    receive(4, {0xCD, 0, 5});
    receive(4, uint64(5));
    EXPECT_CALL(*mpService, play(-1)).Times(2);
    receive(4, {0xFF});
    receive(4, {0xD0, 0xFF});
}

TEST_F(PlayerAdapter, TakesTheSingleIntegerOfABlockThatIsCutShortAsZero) {
    const Bytes whole = int32(5);
    for (std::size_t length = 0; length < whole.size(); ++length) {
        const Bytes cut(whole.begin(), whole.begin() + static_cast<long>(length));
        EXPECT_CALL(*mpService, initializePlayer(0));
        EXPECT_CALL(*mpService, closePlayer(0));
        EXPECT_CALL(*mpService, play(0));
        EXPECT_CALL(*mpService, pause(0));
        EXPECT_CALL(*mpService, getPlayerStatus(0));
        EXPECT_CALL(*mpService, powerOffMediaPlayer(0));
        EXPECT_CALL(*mpService, unregisterCallBack(0));
        EXPECT_CALL(*mpService, unregisterNotify(0));
        EXPECT_CALL(*mpService, setSystemFormat(_emMediaServiceSystemFormat(0)));
        for (const long method : {1, 3, 4, 5, 7, 9, 10, 11, 12})
            receive(method, cut);
        Mock::VerifyAndClearExpectations(mpService);
    }
}

TEST_F(PlayerAdapter, LeavesTheFieldsThatAreCutOffAtTheirDefaults) {
    const Bytes open = int32(5) + text("/a");
    const Bytes seek = int32(5) + int32(1) + int64(7) + boolean(true);
    const Bytes repeat = int32(5) + boolean(true) + int64(7) + int64(8);
    const auto cut = [](const Bytes& bytes, std::size_t length) {
        return Bytes(bytes.begin(), bytes.begin() + static_cast<long>(length));
    };
    for (std::size_t length = 0; length <= open.size(); ++length) {
        EXPECT_CALL(*mpService, openPlayer(fileName(length >= 5 ? 5 : -1,
                                                    length >= open.size() ? L"/a" : L"")));
        receive(2, cut(open, length));
        Mock::VerifyAndClearExpectations(mpService);
    }
    for (std::size_t length = 0; length <= seek.size(); ++length) {
        EXPECT_CALL(*mpService, seek(seekParam(length >= 5 ? 5 : -1, length >= 10 ? 1 : 0,
                                               length >= 19 ? 7 : 0, length >= 20)));
        receive(6, cut(seek, length));
        Mock::VerifyAndClearExpectations(mpService);
    }
    for (std::size_t length = 0; length <= repeat.size(); ++length) {
        EXPECT_CALL(*mpService,
                    setRepeat(repeatParam(length >= 5 ? 5 : -1, length >= 6, length >= 15 ? 7 : 0,
                                          length >= 24 ? 8 : -1)));
        receive(8, cut(repeat, length));
        Mock::VerifyAndClearExpectations(mpService);
    }
}

TEST_F(PlayerAdapter, SurvivesRandomBytesInEveryMethod) {
    const auto service = static_cast<IMediaPlayerService*>(new NiceMock<ServiceMock>);
    EXPECT_CALL(*mpService, died());
    mAdapter->setTarget(service);
    NiceMock<ProxyFactoryMock> factory;
    mAdapter->setProxyFactory(&factory);
    std::mt19937 random(7);
    std::uniform_int_distribution<int> byte(0, 255);
    for (int round = 0; round < 20000; ++round) {
        Bytes bytes(random() % 40);
        for (auto& value : bytes)
            value = static_cast<uint8_t>(byte(random));
        receive(static_cast<long>(random() % 15), bytes, random() % 2 == 0);
    }
    mAdapter.reset();
}

TEST_F(PlayerAdapter, RegistersAProxyForTheClientsCallBackObject) {
    MediaPlayerServiceCallBackRemoteProxy proxy(7);
    EXPECT_CALL(mFactory, createProxy(63, 7, 1002)).WillOnce(Return(&proxy));
    EXPECT_CALL(*mpService, registerCallBack(&proxy));
    receive(13, int64(7) + int32(1002));
}

TEST_F(PlayerAdapter, RegistersAProxyForTheClientsNotifyObject) {
    MediaPlayerServiceNotifyRemoteProxy proxy(8);
    EXPECT_CALL(mFactory, createProxy(64, 8, 1002)).WillOnce(Return(&proxy));
    EXPECT_CALL(*mpService, registerNotify(notifyOf(&proxy, 3)));
    receive(14, int64(8) + int64(1002) + int64(4294967299));
}

TEST_F(PlayerAdapter, RegistersNothingForAClientThatCannotBeReached) {
    EXPECT_CALL(mFactory, createProxy(63, 7, 1002)).WillOnce(Return(nullptr));
    EXPECT_CALL(*mpService, registerCallBack(nullptr));
    receive(13, int64(7) + int64(1002));
    EXPECT_CALL(mFactory, createProxy(64, 8, 1002)).WillOnce(Return(nullptr));
    EXPECT_CALL(*mpService, registerNotify(notifyOf(nullptr, 3)));
    receive(14, int64(8) + int64(1002) + int32(3));
}

TEST_F(PlayerAdapter, RegistersNothingWhenTheProxyIsOfTheOtherKind) {
    MediaPlayerServiceCallBackRemoteProxy callback(7);
    MediaPlayerServiceNotifyRemoteProxy notify(8);
    EXPECT_CALL(mFactory, createProxy(63, _, _)).WillOnce(Return(&notify));
    EXPECT_CALL(*mpService, registerCallBack(nullptr));
    receive(13, int64(7) + int64(1002));
    EXPECT_CALL(mFactory, createProxy(64, _, _)).WillOnce(Return(&callback));
    EXPECT_CALL(*mpService, registerNotify(notifyOf(nullptr, 3)));
    receive(14, int64(8) + int64(1002) + int32(3));
}

TEST_F(PlayerAdapter, TakesAnEncodedRegistrationThatIsCutShortAsZeros) {
    EXPECT_CALL(mFactory, createProxy(63, 7, 0)).WillOnce(Return(nullptr));
    EXPECT_CALL(*mpService, registerCallBack(nullptr));
    receive(13, int64(7));
    EXPECT_CALL(mFactory, createProxy(64, 0, 0)).WillOnce(Return(nullptr));
    EXPECT_CALL(*mpService, registerNotify(notifyOf(nullptr, 0)));
    receive(14, {});
}

TEST_F(PlayerAdapter, TakesARegistrationFromInsideTheProcessAsARecord) {
    MediaPlayerServiceCallBackRemoteProxy callback(7);
    EXPECT_CALL(mFactory, createProxy(63, 7, 0)).WillOnce(Return(&callback));
    EXPECT_CALL(*mpService, registerCallBack(&callback));
    receive(13, memoryOf(_tagCallBackInfo{(1L << 32) + 7, 1003}), false);

    EXPECT_CALL(mFactory, createProxy(63, -1, 0)).WillOnce(Return(&callback));
    EXPECT_CALL(*mpService, registerCallBack(&callback));
    receive(13, memoryOf(_tagCallBackInfo{0xFFFFFFFF, 1003}), false);

    MediaPlayerServiceNotifyRemoteProxy notify(8);
    EXPECT_CALL(mFactory, createProxy(64, (1L << 32) + 8, 0)).WillOnce(Return(&notify));
    EXPECT_CALL(*mpService, registerNotify(notifyOf(&notify, 5)));
    receive(14, memoryOf(_tagNotifyInfo{(1L << 32) + 8, 1003, 5}), false);
}

TEST_F(PlayerAdapter, DeletesTheRecordOfARegistrationFromInsideTheProcess) {
    EXPECT_CALL(mFactory, createProxy(63, 7, 0)).WillOnce(Return(nullptr));
    EXPECT_CALL(*mpService, registerCallBack(nullptr));
    auto* const data = new char[sizeof(_tagCallBackInfo)]{7};
    PTC::Event event(62, 13, data, sizeof(_tagCallBackInfo), false, false);
    mAdapter->receive(&event);
    EXPECT_EQ(event.data, nullptr);
    EXPECT_EQ(event.size, 0);
}

TEST_F(PlayerAdapter, TakesTheFieldsThatARecordIsTooShortForAsZeros) {
    ON_CALL(mFactory, createProxy).WillByDefault(Return(nullptr));
    const Bytes callback = memoryOf(_tagCallBackInfo{7, 1003});
    EXPECT_CALL(mFactory, createProxy(63, 0, 0)).Times(5);
    EXPECT_CALL(*mpService, registerCallBack(nullptr)).Times(5);
    for (long length = 0; length < 4; ++length)
        receive(13, Bytes(callback.begin(), callback.begin() + length), false);
    PTC::Event none(62, 13, nullptr, sizeof(_tagCallBackInfo), false, false);
    mAdapter->receive(&none);

    const Bytes notify = memoryOf(_tagNotifyInfo{7, 1003, 5});
    EXPECT_CALL(mFactory, createProxy(64, 0, 0)).Times(9);
    EXPECT_CALL(mFactory, createProxy(64, 7, 0)).Times(12);
    EXPECT_CALL(*mpService, registerNotify(notifyOf(nullptr, 0))).Times(21);
    for (long length = 0; length < 20; ++length)
        receive(14, Bytes(notify.begin(), notify.begin() + length), false);
    PTC::Event negative(62, 14, nullptr, -1, false, false);
    mAdapter->receive(&negative);
}

TEST_F(PlayerAdapter, DecodesRequestsFromInsideTheProcessLikeOthers) {
    EXPECT_CALL(*mpService, play(4));
    receive(4, int32(4), false);
}

TEST_F(PlayerAdapter, TakesAnEventWithoutABlockAsAnEmptyOne) {
    EXPECT_CALL(*mpService, play(0));
    PTC::Event event(62, 4, nullptr, 100, true, false);
    mAdapter->receive(&event);
}

TEST_F(PlayerAdapter, DeletesItsService) {
    EXPECT_CALL(*mpService, died());
    mAdapter.reset();
}

TEST(PlayerAdapterWithoutAService, IgnoresEveryRequest) {
    MediaPlayerServiceAdapter adapter(62);
    for (long method = 0; method <= 15; ++method) {
        PTC::Event event(62, method, nullptr, 0, true, false);
        adapter.receive(&event);
    }
}
