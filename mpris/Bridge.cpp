// SPDX-License-Identifier: MIT
#include "mpris/Bridge.h"

#include <algorithm>
#include <sdbus-c++/Error.h>
#include <stdexcept>
#include <string>

#include "qnsmedia/Error.h"

using namespace std::chrono_literals;

namespace mpris {
namespace {

/** Between two tries to reach a daemon. */
constexpr auto kTryAgain = 500ms;

std::unique_ptr<sdbus::IConnection> connectToBus() {
    try {
        return sdbus::createSessionBusConnection();
    } catch (const sdbus::Error& error) {
        throw std::runtime_error(std::string("no session bus: ") + error.what());
    }
}

} // namespace

Bridge::Bridge(const Options& options) : mOptions(options), mpBus(connectToBus()) {}

int Bridge::run() {
    mLoop.catchSignals();
    while (!takeSignal()) {
        const auto session = connect();
        if (!session) {
            wait(kTryAgain);
            continue;
        }
        follow(*session);
        if (mSignal == 0 && !mOptions.wait)
            throw qnsmedia::ConnectionLost("the daemon has ended");
    }
    return mSignal;
}

/** Null when there is no daemon and one is waited for. */
std::unique_ptr<Session> Bridge::connect() {
    try {
        return std::make_unique<Session>(mLoop, *mpBus, mOptions);
    } catch (const qnsmedia::DaemonNotRunning&) {
        if (!mOptions.wait)
            throw;
    } catch (const qnsmedia::ConnectionLost&) {
        if (!mOptions.wait)
            throw;
    }
    return nullptr;
}

void Bridge::follow(Session& session) {
    while (!session.lost() && !takeSignal())
        wait(session.tick());
}

bool Bridge::takeSignal() {
    if (mSignal == 0)
        mSignal = mLoop.takeSignal();
    return mSignal != 0;
}

/** In turn: neither a busy bus nor a busy daemon keeps the other waiting. */
void Bridge::wait(std::chrono::milliseconds time) {
    if (mpBus->processPendingRequest())
        time = 0ms;
    const auto bus = mpBus->getEventLoopPollData();
    const auto busTime = bus.getPollTimeout();
    if (busTime >= 0)
        time = std::min(time, std::chrono::milliseconds(busTime));
    mLoop.wait(time, bus.fd, bus.events);
}

} // namespace mpris
