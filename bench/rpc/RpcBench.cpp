// SPDX-License-Identifier: MIT
// One request and its answer: the daemon beside what any daemon with this protocol must do, and
// beside a method call over D-Bus. All contenders take turns within one run.
#include <chrono>
#include <cstdio>
#include <functional>
#include <memory>
#include <thread>

#include "bench/Benches.h"
#include "bench/Report.h"
#include "bench/rpc/DaemonPeer.h"
#include "bench/rpc/DbusPeer.h"
#include "bench/rpc/FloorServer.h"

namespace bench {
namespace {

using Clock = std::chrono::steady_clock;
using std::chrono::milliseconds;

constexpr int kDefaultRounds = 5;
constexpr int kCallsPerRound = 2000;
constexpr int kSpacedCallsPerRound = 100;
constexpr int kPipelined = 10000;

/** A floor server in a process of its own, and the client that calls it. */
class FloorPeer {
public:
    FloorPeer(uint16_t servicePort, uint16_t clientPort, Hop hop)
        : mServer(ChildProcess::call([=] { serveFloor(servicePort, clientPort, hop); })),
          mClient(servicePort, clientPort) {
        mReady = mClient.awaitConnectionBack(nullptr);
    }

    [[nodiscard]] bool ready() const { return mReady; }
    [[nodiscard]] RpcClient& client() { return mClient; }

private:
    ChildProcess mServer;
    RpcClient mClient;
    bool mReady = false;
};

struct Contender {
    std::string name;
    std::function<void()> call;
    std::function<double()> pipeline; ///< requests a second; empty where there is none
};

double microsecondsOf(const std::function<void()>& call) {
    const auto start = Clock::now();
    call();
    return std::chrono::duration<double, std::micro>(Clock::now() - start).count();
}

Contender packetContender(std::string name, RpcClient& client, const Packet& request) {
    auto reply = std::make_shared<Packet>();
    return {std::move(name),
            [&client, &request, reply] {
                client.send(request);
                client.receive(*reply);
            },
            [&client, &request] { return client.pipeline(request, kPipelined); }};
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
        row.entries.push_back({contenders[i].name, summarize(std::move(samples[i]))});
    return row;
}

Row measurePipelines(const std::vector<Contender>& contenders, int rounds) {
    Row row{"pipelined", "requests/s", {}, Better::kHigher};
    for (const Contender& contender : contenders)
        if (contender.pipeline)
            row.entries.push_back({contender.name, {}});
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
void measureWayToEngine(DaemonPeer& daemon, int rounds, Report& report) {
    std::vector<double> toEngine;
    std::vector<double> andBack;
    Packet reply;
    for (int call = 0; call < rounds * kCallsPerRound; ++call) {
        const int64_t start = monotonicNanoseconds();
        daemon.client().send(daemon.statusRequest());
        daemon.client().receive(reply);
        andBack.push_back(static_cast<double>(monotonicNanoseconds() - start) / 1000.0);
        toEngine.push_back(static_cast<double>(DaemonPeer::engineCallTime(reply) - start) / 1000.0);
    }
    report.add({"request to engine call", "us", {{"daemon", summarize(std::move(toEngine))}}});
    report.add({"the same and back", "us", {{"daemon", summarize(std::move(andBack))}}});
}

} // namespace

int runRpc(const Options& options, Report& report) {
    if (!enterOwnNetwork())
        std::fputs("qnsmedia-bench: no network of its own; using the machine's ports\n", stderr);
    const int rounds = options.rounds > 0 ? options.rounds : kDefaultRounds;

    // Processes first: a fork is safe only while there is one thread.
    FloorPeer raw(2008, 2000, Hop::none);
    FloorPeer hop(2018, 2010, Hop::semaphore);
    DbusPeer dbus;
    DaemonPeer daemon;
    if (!raw.ready() || !hop.ready() || !dbus.ready() || !daemon.ready()) {
        std::fputs("qnsmedia-bench: a contender could not be started\n", stderr);
        return 1;
    }

    const Packet& request = daemon.statusRequest();
    const std::vector<Contender> contenders = {
        packetContender("daemon", daemon.client(), request),
        packetContender("raw sockets", raw.client(), request),
        packetContender("raw sockets and a thread hop", hop.client(), request),
        {"D-Bus", [&dbus] { dbus.call(); }, {}},
    };
    report.add(measureCalls("request to reply", contenders, rounds, kCallsPerRound, {}));
    report.add(measureCalls("request to reply, 2 ms between", contenders, rounds,
                            kSpacedCallsPerRound, milliseconds(2)));
    report.add(measurePipelines(contenders, rounds));
    if (!daemon.openFile())
        return 1;
    measureWayToEngine(daemon, rounds, report);
    return 0;
}

} // namespace bench
