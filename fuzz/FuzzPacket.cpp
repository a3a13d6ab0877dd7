// SPDX-License-Identifier: MIT
// Delivers arbitrary packets to a service as the transport does with what a connection carries.
#include "ptc/EventPacket.h"
#include "ptc/IFactory.h"
#include "ptc/Receiver.h"
#include "ptc/ServiceAdapter.h"
#include "ptc/SocketRemoteReceiver.h"

#include <algorithm>
#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <string>

namespace {

constexpr long kReceiverId = 8;
constexpr long kObjectId = 62;

void require(bool holds) {
    if (!holds)
        std::abort();
}

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

struct File {
    int iClientID = -1;
    std::wstring strName;
    long lPosition = 0;
    bool bOption = false;
};

class Service {
public:
    void play(int) {}
    void open(File file) { require(file.strName.size() <= PTC::kMaxPayloadSize); }
    void registerCallBack(ICallBack* callback) { require(!callback); }
    void registerNotify(Listener listener) { require(!listener.pNotify); }
};

class NoProxies : public PTC::IProxyFactory {
public:
    PTC::IProxyBase* createProxy(long, long, long) override { return nullptr; }
};

class ServiceAdapter : public PTC::ServiceAdapter<Service> {
public:
    using PTC::ServiceAdapter<Service>::ServiceAdapter;

    void receive(PTC::Event* event) override {
        static constexpr Method kMethods[] = {
            {1, call<&Service::play>},
            {2, call<&Service::open, deserializeFile>},
            {13, registerCallBack<&Service::registerCallBack, 63>},
            {14, registerNotify<&Service::registerNotify, 64>},
            {15, registerNotify<&Service::registerNotify, 58, PTC::RecordObjectId::bits32>},
        };
        ++calls;
        dispatch(kMethods, *event);
    }

    int calls = 0;

private:
    static void deserializeFile(File& file, ArgumentReader& reader) {
        reader.read(file.iClientID);
        reader.read(file.strName);
        reader.read(file.lPosition);
        reader.read(file.bOption);
    }
};

/** The way from a packet to the service, without the sockets. */
class Route {
public:
    Route() {
        auto receiver = std::make_unique<PTC::Receiver>(kReceiverId);
        auto adapter = std::make_unique<ServiceAdapter>(kObjectId);
        adapter->setTarget(new Service);
        adapter->setProxyFactory(&mProxies);
        mpAdapter = adapter.get();
        receiver->addAdapter(adapter.release());
        mServer.addReceiver(receiver.release());
    }

    /** True when the packet has reached the service. */
    bool deliver(const char* packet) {
        mpAdapter->calls = 0;
        mServer.executePacket(packet);
        return mpAdapter->calls == 1;
    }

private:
    NoProxies mProxies;
    SocketRemoteReceiver mServer{0};
    ServiceAdapter* mpAdapter = nullptr; ///< owned by the receiver
};

bool isForTheService(const char* packet) {
    PTC::EventPacket header{};
    std::memcpy(&header, packet, sizeof(header));
    return header.receiverId == kReceiverId && header.objectId == kObjectId &&
           header.isCallback == 0 && header.size > 0 && header.size <= PTC::kMaxPayloadSize;
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    static Route route;
    const auto packet = std::make_unique<char[]>(PTC::kPacketSize);
    std::memcpy(packet.get(), data, std::min(size, PTC::kPacketSize));
    require(route.deliver(packet.get()) == isForTheService(packet.get()));
    return 0;
}
