// SPDX-License-Identifier: MIT
#include "importer/MediaImporterServiceAdapter.h"

#include <cstring>
#include <limits>
#include <memory>

#include <gmock/gmock.h>

#include "define/RegistrationInfo.h"
#include "importer/IMediaImporterServiceCallBack.h"
#include "importer/IMediaImporterServiceNotify.h"
#include "importer/MediaImporterServiceCallBackRemoteProxy.h"
#include "importer/MediaImporterServiceNotifyRemoteProxy.h"
#include "ptc/IFactory.h"
#include "tests/support/Bytes.h"

using namespace MediaServiceDefine;
using testing::_;
using testing::AllOf;
using testing::Field;
using testing::Return;
using testing::StrictMock;

namespace {

class ServiceMock : public IMediaImporterService {
public:
    ~ServiceMock() override { died(); }

    MOCK_METHOD(void, died, ());
    MOCK_METHOD(void, initializeImporter, (int), (override));
    MOCK_METHOD(void, import, (_tagImportParam), (override));
    MOCK_METHOD(void, cancel, (int), (override));
    MOCK_METHOD(void, getImporterStatus, (int), (override));
    MOCK_METHOD(void, registerCallBack, (IMediaImporterServiceCallBack*), (override));
    MOCK_METHOD(void, registerNotify, (_tagIMediaImporterServiceNotify), (override));
    MOCK_METHOD(void, unregisterCallBack, (int), (override));
    MOCK_METHOD(void, unregisterNotify, (int), (override));
};

class ProxyFactoryMock : public PTC::IProxyFactory {
public:
    MOCK_METHOD(PTC::IProxyBase*, createProxy, (long, long, long), (override));
};

auto importParam(int id, const std::wstring& first, const std::wstring& second) {
    return AllOf(Field(&_tagImportParam::iClientID, id), Field(&_tagImportParam::strParam1, first),
                 Field(&_tagImportParam::strParam2, second));
}

auto notifyOf(IMediaImporterServiceNotify* notify, int id) {
    return AllOf(Field(&_tagIMediaImporterServiceNotify::pNotify, notify),
                 Field(&_tagIMediaImporterServiceNotify::iClientID, id));
}

template<typename Record>
Bytes memoryOf(const Record& record) {
    Bytes bytes(sizeof(record));
    std::memcpy(bytes.data(), &record, sizeof(record));
    return bytes;
}

class ImporterAdapter : public testing::Test {
protected:
    ImporterAdapter() {
        mAdapter->setProxyFactory(&mFactory);
        mAdapter->setTarget(static_cast<IMediaImporterService*>(mpService));
    }
    ~ImporterAdapter() override { EXPECT_CALL(*mpService, died()); }

    /** The block has exactly the size of the bytes, so that a sanitizer sees every overrun. */
    void receive(long method, const Bytes& bytes, bool isRemote = true) {
        auto* const data = new char[bytes.size()];
        std::copy(bytes.begin(), bytes.end(), data);
        PTC::Event event(56, method, data, static_cast<long>(bytes.size()), isRemote, false);
        mAdapter->receive(&event);
        delete[] event.data;
    }

    StrictMock<ServiceMock>* mpService = new StrictMock<ServiceMock>; ///< owned by the adapter
    StrictMock<ProxyFactoryMock> mFactory;
    std::unique_ptr<MediaImporterServiceAdapter> mAdapter =
        std::make_unique<MediaImporterServiceAdapter>(56);
};

} // namespace

TEST_F(ImporterAdapter, CallsTheOperationOfEachNumber) {
    EXPECT_CALL(*mpService, initializeImporter(1));
    receive(1, int32(1));
    EXPECT_CALL(*mpService, cancel(2));
    receive(3, int32(2));
    EXPECT_CALL(*mpService, getImporterStatus(3));
    receive(4, int32(3));
    EXPECT_CALL(*mpService, unregisterCallBack(4));
    receive(5, int32(4));
    EXPECT_CALL(*mpService, unregisterNotify(5));
    receive(6, int32(5));
}

TEST_F(ImporterAdapter, IgnoresOtherNumbers) {
    for (const long method : {0L, 9L, -1L, std::numeric_limits<long>::max()})
        receive(method, int32(1));
}

TEST_F(ImporterAdapter, TruncatesAClientIdTo32Bits) {
    EXPECT_CALL(*mpService, cancel(7));
    receive(3, int64(0x100000007));
}

TEST_F(ImporterAdapter, PassesBothTextsOfAnImport) {
    EXPECT_CALL(*mpService, import(importParam(6, L"/a b", L"c")));
    receive(2, int32(6) + text("/a b") + text("c"));
}

TEST_F(ImporterAdapter, ReadsEmptyTextsAsEmpty) {
    EXPECT_CALL(*mpService, import(importParam(6, L"", L"")));
    receive(2, int32(6) + Bytes{0xA1, 0x00, 0xA1, 0x00});
}

TEST_F(ImporterAdapter, LeavesDefaultsWhereAnImportIsCutOff) {
    EXPECT_CALL(*mpService, import(importParam(-1, L"", L"")));
    receive(2, {});
    EXPECT_CALL(*mpService, import(importParam(6, L"", L"")));
    receive(2, int32(6));
    EXPECT_CALL(*mpService, import(importParam(6, L"abc", L"")));
    receive(2, int32(6) + text("abc"));
}

TEST_F(ImporterAdapter, ReadsNothingBehindAnImportThatIsCutOffAnywhere) {
    const Bytes whole = int32(6) + text("abc") + text("de");
    EXPECT_CALL(*mpService, import(_)).Times(static_cast<int>(whole.size()));
    for (std::size_t length = 0; length < whole.size(); ++length)
        receive(2, Bytes(whole.begin(), whole.begin() + static_cast<std::ptrdiff_t>(length)));
}

TEST_F(ImporterAdapter, RegistersAClientsObjectsThroughProxies) {
    MediaImporterServiceCallBackRemoteProxy callback(100);
    EXPECT_CALL(mFactory, createProxy(57, 100, 1003)).WillOnce(Return(&callback));
    EXPECT_CALL(*mpService, registerCallBack(&callback));
    receive(7, int64(100) + int64(1003));

    MediaImporterServiceNotifyRemoteProxy notify(200);
    EXPECT_CALL(mFactory, createProxy(58, 200, 1003)).WillOnce(Return(&notify));
    EXPECT_CALL(*mpService, registerNotify(notifyOf(&notify, 4)));
    receive(8, int64(200) + int64(1003) + int32(4));
}

TEST_F(ImporterAdapter, RegistersNullWhenThereIsNoProxyOrOneOfAnotherKind) {
    EXPECT_CALL(mFactory, createProxy(57, 100, 1003)).WillOnce(Return(nullptr));
    EXPECT_CALL(*mpService, registerCallBack(nullptr));
    receive(7, int64(100) + int64(1003));

    MediaImporterServiceCallBackRemoteProxy callback(100);
    EXPECT_CALL(mFactory, createProxy(58, 200, 1003)).WillOnce(Return(&callback));
    EXPECT_CALL(*mpService, registerNotify(notifyOf(nullptr, 4)));
    receive(8, int64(200) + int64(1003) + int32(4));
}

TEST_F(ImporterAdapter, TakesThe32LowBitsOfTheObjectFromARecordInMemory) {
    _tagCallBackInfo callback;
    callback.lObjectID = 0x500000064;
    callback.lIdentity = 1003;
    EXPECT_CALL(mFactory, createProxy(57, 0x64, 0)).WillOnce(Return(nullptr));
    EXPECT_CALL(*mpService, registerCallBack(nullptr));
    receive(7, memoryOf(callback), false);

    _tagNotifyInfo notify;
    notify.lObjectID = 0x500000065;
    notify.iClientID = 4;
    EXPECT_CALL(mFactory, createProxy(58, 0x65, 0)).WillOnce(Return(nullptr));
    EXPECT_CALL(*mpService, registerNotify(notifyOf(nullptr, 4)));
    receive(8, memoryOf(notify), false);
}

TEST_F(ImporterAdapter, WithoutATargetDoesNothing) {
    MediaImporterServiceAdapter idle(56);
    PTC::Event event(56, 1, nullptr, 0, true, false);
    idle.receive(&event);
}
