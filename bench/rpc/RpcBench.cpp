// SPDX-License-Identifier: MIT
// One request and its answer: the daemon beside what any daemon with this protocol must do, and
// beside a method call over D-Bus. All contenders take turns within one run.
#include <chrono>
#include <cstdio>
#include <functional>
#include <memory>
#include <optional>
#include <thread>

#include "bench/Benches.h"
#include "bench/Programs.h"
#include "bench/Report.h"
#include "bench/rpc/DaemonPeer.h"
#include "bench/rpc/DbusPeer.h"
#include "bench/rpc/FloorPeer.h"

namespace bench {
namespace {

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

constexpr int kDefaultRounds = 5;
constexpr int kCallsPerRound = 2000;
constexpr int kSpacedCallsPerRound = 100;
constexpr int kPipelined = 10000;

struct Contender {
    std::string name;
    Role role;
    std::function<void()> call;
    std::function<double()> pipeline; ///< requests a second; empty where there is none
};

double microsecondsOf(const std::function<void()>& call) {
    const auto start = Clock::now();
    call();
    return std::chrono::duration<double, std::micro>(Clock::now() - start).count();
}

Contender packetContender(std::string name, Role role, RpcClient& client, const Packet& request) {
    auto reply = std::make_shared<Packet>();
    return {std::move(name), role,
            [&client, &request, reply] {
                client.send(request);
                client.receive(*reply);
            },
            [&client, &request] { return client.pipeline(request, kPipelined, kPipelined); }};
}

/** `calls` calls of each contender in turn, `rounds` times, with a pause before each call. */
Row measureCalls(const std::string& name, const std::vector<Contender>& contenders, int rounds,
                 int calls, milliseconds pause) {
    std::vector<std::vector<double>> samples(contenders.size());
    for (int round = 0; round < rounds; ++round) {
        for (std::size_t i = 0; i < contenders.size(); ++i) {
            contenders[i].call(); // the first one after the others' turn finds cold caches
            for (int call = 0; call < calls; ++call) {
                if (pause.count() > 0)
                    std::this_thread::sleep_for(pause);
                samples[i].push_back(microsecondsOf(contenders[i].call));
            }
        }
    }
    Row row{name, "us", {}, Better::kLower};
    for (std::size_t i = 0; i < contenders.size(); ++i)
        row.entries.push_back(
            {contenders[i].name, summarize(std::move(samples[i])), contenders[i].role});
    return row;
}

Row measurePipelines(const std::vector<Contender>& contenders, int rounds) {
    Row row{"pipelined", "requests/s", {}, Better::kHigher};
    for (const Contender& contender : contenders)
        if (contender.pipeline)
            row.entries.push_back({contender.name, {}, contender.role});
    std::vector<std::vector<double>> samples(row.entries.size());
    for (int round = 0; round < rounds; ++round) {
        std::size_t i = 0;
        for (const Contender& contender : contenders)
            if (contender.pipeline)
                samples[i++].push_back(contender.pipeline());
    }
    for (std::size_t i = 0; i < samples.size(); ++i)
        row.entries[i].figures = summarize(std::move(samples[i]));
    return row;
}

int64_t monotonicNanoseconds() {
    return std::chrono::duration_cast<std::chrono::nanoseconds>(Clock::now().time_since_epoch())
        .count();
}

/** With a file open a status request goes on to the main thread, which calls the engine. */
void measureWayToEngine(DaemonClient& client, int calls, Report& report) {
    std::vector<double> toEngine;
    std::vector<double> andBack;
    Packet reply;
    for (int call = 0; call < calls; ++call) {
        const int64_t start = monotonicNanoseconds();
        client.rpc().send(client.statusRequest());
        client.rpc().receive(reply);
        andBack.push_back(static_cast<double>(monotonicNanoseconds() - start) / 1000.0);
        toEngine.push_back(static_cast<double>(DaemonClient::engineCallTime(reply) - start) /
                           1000.0);
    }
    report.add(Row{"request to engine call", "us", {{"daemon", summarize(std::move(toEngine))}}});
    report.add(Row{"the same and back", "us", {{"daemon", summarize(std::move(andBack))}}});
}

void measureAll(const std::vector<Contender>& contenders, int rounds, Report& report) {
    report.add(measureCalls("request to reply", contenders, rounds, kCallsPerRound, {}));
    report.add(measureCalls("request to reply, 2 ms between", contenders, rounds,
                            kSpacedCallsPerRound, milliseconds(2)));
    report.add(measurePipelines(contenders, rounds));
}

} // namespace

int runRpc(const Options& options, Report& report) {
    isolateNetwork();
    // Processes first: a fork is safe only while there is one thread.
    FloorPeer raw(2008, 2000, Hop::none);
    FloorPeer hop(2018, 2010, Hop::semaphore);
    std::optional<DbusPeer> dbus;
    if (takesPart("D-Bus", "dbus-daemon", report))
        dbus.emplace();
    DaemonPeer daemon;
    if (!raw.ready() || !hop.ready() || (dbus && !dbus->ready()) || !daemon.ready()) {
        std::fputs("qnsmedia-bench: a contender could not be started\n", stderr);
        return 1;
    }

    DaemonClient& client = daemon.client();
    const Packet& request = client.statusRequest();
    std::vector<Contender> contenders = {
        packetContender("daemon", Role::ours, client.rpc(), request),
        packetContender("bare sockets", Role::floor, raw.client(), request),
        packetContender("bare sockets, thread hop", Role::floor, hop.client(), request),
    };
    if (dbus)
        contenders.push_back({"D-Bus", Role::peer, [&dbus] { dbus->connection().call(); }, {}});
    const int rounds = roundsOf(options, kDefaultRounds, 1);
    measureAll(contenders, rounds, report);
    if (!client.openFile())
        return 1;
    measureWayToEngine(client, rounds * kCallsPerRound, report);
    return 0;
}

} // namespace bench
