// SPDX-License-Identifier: MIT
// One notification that many have asked for: from the engine's telling it until the last one of
// them has it. The objects that listen share the clients' connections evenly.
#include <algorithm>
#include <cstring>
#include <functional>
#include <future>
#include <string>
#include <time.h>
#include <vector>

#include "bench/Benches.h"
#include "bench/rpc/DaemonTeam.h"
#include "bench/rpc/FloorPeer.h"
#include "bench/scale/CurveBuilder.h"
#include "bench/scale/Scales.h"

namespace bench {
namespace {

constexpr int kDefaultRounds = 30;
constexpr int kQuickRounds = 5;

/** A way to tell many listeners something. */
struct Contender {
    std::string name;
    Role role;
    std::vector<RpcClient*> clients;
    std::function<void(int listeners)> enlarge; ///< from now on there are so many listeners
    std::function<void(int listeners)> tell;
    /** When it was told, in CLOCK_MONOTONIC nanoseconds; 0 for a packet that is something else. */
    std::function<int64_t(const Packet&)> timeTold;
    int otherPackets; ///< that the first client gets each time
};

/** The first and the last moment that matter to one client. */
struct Told {
    int64_t told = 0;
    int64_t received = 0;
};

int64_t monotonicNanoseconds() {
    timespec now{};
    ::clock_gettime(CLOCK_MONOTONIC, &now);
    return now.tv_sec * 1'000'000'000L + now.tv_nsec;
}

Told receiveAll(const Contender& contender, RpcClient& client, int packets) {
    Told result;
    Packet packet;
    for (int i = 0; i < packets && client.receive(packet); ++i) {
        if (const int64_t told = contender.timeTold(packet)) {
            result.told = told;
            result.received = monotonicNanoseconds();
        }
    }
    return result;
}

double microsecondsToTell(const Contender& contender, int listeners) {
    const int clients = static_cast<int>(contender.clients.size());
    std::vector<std::future<Told>> receiving;
    for (int i = 0; i < clients; ++i) {
        const int packets = listeners / clients + (i < listeners % clients ? 1 : 0) +
                            (i == 0 ? contender.otherPackets : 0);
        RpcClient& client = *contender.clients[static_cast<std::size_t>(i)];
        receiving.push_back(std::async(std::launch::async, [&contender, &client, packets] {
            return receiveAll(contender, client, packets);
        }));
    }
    contender.tell(listeners);
    Told all;
    for (std::future<Told>& client : receiving) {
        const Told one = client.get();
        all.told = std::max(all.told, one.told);
        all.received = std::max(all.received, one.received);
    }
    return static_cast<double>(all.received - all.told) / 1000.0;
}

/** Registers more objects, of each client in turn, and waits until the daemon knows them all. */
void enlarge(DaemonTeam& team, int& known, int listeners) {
    for (; known < listeners; ++known)
        team.client(static_cast<std::size_t>(known % kMostClients)).listen(known);
    Packet reply;
    for (std::size_t i = 0; i < kMostClients; ++i) {
        team.client(i).rpc().send(team.client(i).statusRequest());
        team.client(i).rpc().receive(reply);
    }
}

Contender daemonContender(DaemonTeam& team, int& known) {
    Contender contender{"daemon", Role::ours, {}, {}, {}, {}, 1};
    for (std::size_t i = 0; i < kMostClients; ++i)
        contender.clients.push_back(&team.client(i).rpc());
    contender.enlarge = [&](int listeners) { enlarge(team, known, listeners); };
    contender.tell = [&](int) { team.client(0).rpc().send(team.client(0).openRequest()); };
    contender.timeTold = [](const Packet& packet) {
        return DaemonClient::isOpenNotification(packet) ? DaemonClient::notifyTime(packet) : 0;
    };
    return contender;
}

Contender floorContender(FloorPeer& floor) {
    Contender contender{"bare sockets", Role::floor, {}, [](int) {}, {}, {}, 0};
    for (std::size_t i = 0; i < kMostClients; ++i)
        contender.clients.push_back(&floor.client(i));
    contender.tell = [&](int listeners) {
        Packet packet{};
        std::memcpy(packet.data(), &listeners, sizeof listeners);
        floor.client().send(packet);
    };
    contender.timeTold = [](const Packet& packet) {
        int64_t told = 0;
        std::memcpy(&told, packet.data(), sizeof told);
        return told;
    };
    return contender;
}

void compare(const std::vector<Contender>& contenders, int rounds, Report& report) {
    const std::vector<int> places = {1, 3, 10, 30, 100, 300, 1000};
    CurveBuilder times({"a notification until all have it", "us", "listeners", places, {}});
    for (const Contender& contender : contenders)
        times.addLine(contender.name, contender.role);
    for (std::size_t place = 0; place < places.size(); ++place) {
        for (const Contender& contender : contenders)
            contender.enlarge(places[place]);
        for (int round = 0; round < rounds; ++round)
            for (std::size_t i = 0; i < contenders.size(); ++i)
                times.samples(i, place).push_back(microsecondsToTell(contenders[i], places[place]));
    }
    report.add(times.finish());
}

} // namespace

bool measureListeners(const Options& options, Report& report) {
    isolateNetwork();
    // Processes first: a fork is safe only while there is one thread.
    FloorPeer floor(2008, 2100, kMostClients, serveBroadcast);
    DaemonTeam team;
    if (!floor.ready() || !team.ready())
        return false;
    int known = 0;
    compare({daemonContender(team, known), floorContender(floor)},
            roundsOf(options, kDefaultRounds, kQuickRounds), report);
    return true;
}

} // namespace bench
