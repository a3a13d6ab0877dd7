// SPDX-License-Identifier: MIT
#include "tests/daemon/support/Nuisance.h"

#include <chrono>
#include <random>

#include "tests/daemon/support/Life.h"
#include "tests/daemon/support/PlayerClient.h"

namespace {

constexpr long kRoad = 1006; ///< listens, and is told nothing
constexpr long kOther = 1004;

constexpr std::int32_t kUnknownClient = 1'000'000;

/** A pace at which a daemon that wastes no time has nearly all of it left. */
void takeTurn() {
    std::this_thread::sleep_for(std::chrono::milliseconds(1));
}

wire::Bytes randomBytes(std::mt19937& random, std::size_t most) {
    wire::Bytes bytes(1 + random() % most, '\0');
    for (auto& byte : bytes)
        byte = static_cast<char>(random());
    return bytes;
}

/** Connects, and sends what it is given until it is to stop. */
template<typename Next>
void sendAll(const std::atomic<bool>& stop, Next next) {
    WireClient road(kRoad);
    road.connect();
    for (std::mt19937 random(1); !stop; takeTurn())
        road.sendBytes(next(random));
}

void sendRandomBytes(const std::atomic<bool>& stop) {
    sendAll(stop, [](std::mt19937& random) { return randomBytes(random, wire::kPacketSize); });
}

void sendSinglePieces(const std::atomic<bool>& stop) {
    sendAll(stop, [](std::mt19937& random) { return randomBytes(random, 7); });
}

void sendWrongSizes(const std::atomic<bool>& stop) {
    sendAll(stop, [](std::mt19937& random) {
        const auto size = static_cast<std::int64_t>(random()) << 32 | random();
        return wire::toBytes({8, 62, request::kPlay, false, true, "x"}, size);
    });
}

void sendCutOffRequests(const std::atomic<bool>& stop) {
    sendAll(stop, [](std::mt19937& random) {
        const auto& service = kAllServices[random() % std::size(kAllServices)];
        // Not the registrations: one of these by chance would name an identity that is there.
        const auto method = 1 + static_cast<long>(random() % (service.registerCallBack - 1));
        const bool isPowerOff =
            service.object == kPlayerService.object && method == request::kPowerOffMediaPlayer;
        const auto arguments = wire::int32(kUnknownClient) + randomBytes(random, 40);
        return wire::toBytes({8, service.object, isPowerOff ? request::kPlay : method, false, true,
                              arguments.substr(0, 1 + random() % arguments.size())});
    });
}

void registerWithoutListening(const std::atomic<bool>& stop) {
    sendAll(stop, [](std::mt19937&) {
        return wire::toBytes({8, 62, request::kRegisterCallBack, false, true,
                              wire::integer(1) + wire::integer(kOther)});
    });
}

/** A client, and another that asks in its name. */
void askFor(Life& client, std::int32_t id, int count) {
    for (int i = 0; i < count; ++i)
        client.request(kPlayerService, request::kPause, wire::integer(id));
}

void neverRead(const std::atomic<bool>& stop) {
    Life deaf(kOther);
    const auto id = deaf.registerCallBack(kPlayerService);
    for (; !stop; takeTurn())
        askFor(deaf, id, 1);
}

void closeWhileAnswered(const std::atomic<bool>& stop) {
    WireClient road(kRoad);
    road.connect();
    for (; !stop; takeTurn()) {
        Life hasty(road, kOther);
        askFor(hasty, hasty.registerCallBack(kPlayerService), 10);
        static_cast<void>(hasty.receive());
    }
}

} // namespace

const std::vector<Nuisance>& allNuisances() {
    static const std::vector<Nuisance> all{{"SendsRandomBytes", sendRandomBytes},
                                           {"SendsPacketsInTinyPieces", sendSinglePieces},
                                           {"SendsWrongSizes", sendWrongSizes},
                                           {"CutsItsRequestsOffAnywhere", sendCutOffRequests},
                                           {"RegistersWithoutListening", registerWithoutListening},
                                           {"NeverReadsItsAnswers", neverRead},
                                           {"ClosesWhileItIsAnswered", closeWhileAnswered}};
    return all;
}
