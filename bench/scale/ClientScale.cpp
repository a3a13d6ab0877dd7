// SPDX-License-Identifier: MIT
// Several clients, and several requests of one client, at a time.
#include <chrono>
#include <functional>
#include <future>
#include <numeric>
#include <optional>
#include <string>
#include <thread>

#include "bench/Benches.h"
#include "bench/Programs.h"
#include "bench/rpc/DaemonTeam.h"
#include "bench/rpc/DbusPeer.h"
#include "bench/rpc/FloorPeer.h"
#include "bench/scale/CurveBuilder.h"
#include "bench/scale/Scales.h"

namespace bench {
namespace {

using Clock = std::chrono::steady_clock;

constexpr int kDefaultRounds = 5;
constexpr int kCallsPerClient = 2000;
constexpr int kQuickCallsPerClient = 300;
constexpr int kPipelined = 5000;
constexpr int kQuickPipelined = 1000;

using Call = std::function<void()>;

struct Contender {
    std::string name;
    Role role;
    std::vector<Call> calls; ///< one for each client
};

/** What clients that called side by side have seen. */
struct Crowd {
    double callsPerSecond = 0;
    std::vector<double> microseconds; ///< of each call
};

std::vector<double> callAgainAndAgain(const Call& call, int times) {
    std::vector<double> samples;
    samples.reserve(static_cast<std::size_t>(times));
    for (int i = 0; i < times; ++i) {
        const auto begin = Clock::now();
        call();
        samples.push_back(std::chrono::duration<double, std::micro>(Clock::now() - begin).count());
    }
    return samples;
}

Crowd callSideBySide(const Contender& contender, int clients, int times) {
    std::vector<std::future<std::vector<double>>> running;
    std::promise<void> start;
    const std::shared_future<void> started = start.get_future().share();
    for (int i = 0; i < clients; ++i)
        running.push_back(std::async(std::launch::async, [&, i] {
            started.wait();
            return callAgainAndAgain(contender.calls[static_cast<std::size_t>(i)], times);
        }));
    Crowd crowd;
    const auto begin = Clock::now();
    start.set_value();
    for (auto& client : running) {
        const std::vector<double> samples = client.get();
        crowd.microseconds.insert(crowd.microseconds.end(), samples.begin(), samples.end());
    }
    const std::chrono::duration<double> took = Clock::now() - begin;
    crowd.callsPerSecond = static_cast<double>(crowd.microseconds.size()) / took.count();
    return crowd;
}

Call roundTrip(RpcClient& client, const Packet& request) {
    return [&client, &request, reply = Packet{}]() mutable {
        client.send(request);
        client.receive(reply);
    };
}

Contender floorContender(const char* name, FloorPeer& floor, const Packet& request) {
    Contender contender{name, Role::floor, {}};
    for (std::size_t i = 0; i < kMostClients; ++i)
        contender.calls.push_back(roundTrip(floor.client(i), request));
    return contender;
}

Contender daemonContender(DaemonTeam& team) {
    Contender contender{"daemon", Role::ours, {}};
    for (std::size_t i = 0; i < kMostClients; ++i)
        contender.calls.push_back(roundTrip(team.client(i).rpc(), team.client(i).statusRequest()));
    return contender;
}

Contender dbusContender(DbusPeer& dbus) {
    Contender contender{"D-Bus", Role::peer, {}};
    for (std::size_t i = 0; i < kMostClients; ++i)
        contender.calls.emplace_back([&dbus, i] { dbus.connection(i).call(); });
    return contender;
}

void compareCrowds(const std::vector<Contender>& contenders, int rounds, int times,
                   Report& report) {
    std::vector<int> clients(kMostClients);
    std::iota(clients.begin(), clients.end(), 1);
    CurveBuilder rates(
        {"requests of clients side by side", "1/s", "clients", clients, {}, Better::kHigher});
    CurveBuilder delays({"request to reply, clients side by side", "us", "clients", clients, {}});
    for (const Contender& contender : contenders) {
        rates.addLine(contender.name, contender.role);
        delays.addLine(contender.name, contender.role);
    }
    for (int round = 0; round < rounds; ++round)
        for (std::size_t place = 0; place < clients.size(); ++place)
            for (std::size_t i = 0; i < contenders.size(); ++i) {
                const Crowd crowd = callSideBySide(contenders[i], clients[place], times);
                rates.samples(i, place).push_back(crowd.callsPerSecond);
                std::vector<double>& samples = delays.samples(i, place);
                samples.insert(samples.end(), crowd.microseconds.begin(), crowd.microseconds.end());
            }
    report.add(rates.finish());
    report.add(delays.finish());
}

struct Pipe {
    std::string name;
    Role role;
    RpcClient& client;
};

void comparePipes(const std::vector<Pipe>& pipes, const Packet& request, int rounds, int count,
                  Report& report) {
    const std::vector<int> places = {1, 2, 4, 8, 16, 32, 64};
    CurveBuilder rates(
        {"requests with several unanswered", "1/s", "unanswered", places, {}, Better::kHigher});
    for (const Pipe& pipe : pipes)
        rates.addLine(pipe.name, pipe.role);
    for (int round = 0; round < rounds; ++round)
        for (std::size_t place = 0; place < places.size(); ++place)
            for (std::size_t i = 0; i < pipes.size(); ++i)
                rates.samples(i, place).push_back(
                    pipes[i].client.pipeline(request, count, places[place]));
    report.add(rates.finish());
}

} // namespace

bool measureClients(const Options& options, Report& report) {
    isolateNetwork();
    // Processes first: a fork is safe only while there is one thread.
    FloorPeer raw(2008, 2100, kMostClients, sendBack(Hop::none));
    FloorPeer hop(2018, 2200, kMostClients, sendBack(Hop::semaphore));
    std::optional<DbusPeer> dbus;
    if (takesPart("D-Bus", "dbus-daemon", report))
        dbus.emplace(kMostClients);
    DaemonTeam team;
    if (!raw.ready() || !hop.ready() || (dbus && !dbus->ready()) || !team.ready())
        return false;
    const Packet& request = team.client(0).statusRequest();
    std::vector<Contender> contenders = {daemonContender(team),
                                         floorContender("bare sockets", raw, request),
                                         floorContender("bare sockets, thread hop", hop, request)};
    if (dbus)
        contenders.push_back(dbusContender(*dbus));
    compareCrowds(contenders, roundsOf(options, kDefaultRounds, 1),
                  options.quick ? kQuickCallsPerClient : kCallsPerClient, report);
    return true;
}

bool measureInFlight(const Options& options, Report& report) {
    isolateNetwork();
    FloorPeer raw(2008, 2000, Hop::none);
    FloorPeer hop(2018, 2010, Hop::semaphore);
    DaemonPeer daemon;
    if (!raw.ready() || !hop.ready() || !daemon.ready())
        return false;
    comparePipes({{"daemon", Role::ours, daemon.client().rpc()},
                  {"bare sockets", Role::floor, raw.client()},
                  {"bare sockets, thread hop", Role::floor, hop.client()}},
                 daemon.client().statusRequest(), roundsOf(options, kDefaultRounds, 1),
                 options.quick ? kQuickPipelined : kPipelined, report);
    return true;
}

} // namespace bench
