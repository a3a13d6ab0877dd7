// SPDX-License-Identifier: MIT
#include <chrono>
#include <exception>

#include "cli/Commands.h"
#include "cli/EventLoop.h"
#include "cli/EventText.h"
#include "cli/ExitCode.h"
#include "cli/Output.h"
#include "qnsmedia/Error.h"
#include "qnsmedia/Importer.h"
#include "qnsmedia/Player.h"

namespace {

constexpr std::chrono::hours kForever{1};

/** How the player is and everything that the daemon tells, line by line, until a signal or the
 * daemon's end. */
class Monitor {
public:
    Monitor(const qnsmedia::Connection::Options& options, bool json)
        : mJson(json), mConnection(options), mPlayer(mConnection), mImporter(mConnection) {
        mPlayer.onNotification([this](const auto& notification) { handOver(notification); });
        mImporter.onNotification([this](const auto& notification) { handOver(notification); });
        mConnection.onLost([this] { mLoop.post([this] { mIsLost = true; }); });
        // What is to follow is news to this. Another client that asks too may get the answer.
        mPlayer.status([this](std::exception_ptr error, const qnsmedia::PlayerStatus& status) {
            if (!error)
                handOver(status);
        });
    }

    int run() {
        mLoop.catchSignals();
        while (!mIsLost) {
            mLoop.wait(kForever);
            if (const int signal = mLoop.takeSignal(); signal != 0)
                return exitCodeOfSignal(signal);
        }
        throw qnsmedia::ConnectionLost("the daemon has ended");
    }

private:
    template<typename Event>
    void handOver(const Event& event) {
        mLoop.post([this, event] {
            show(mJson ? eventJson(event).dump(-1, ' ', false,
                                               nlohmann::json::error_handler_t::replace) +
                             '\n'
                       : eventText(event));
        });
    }

    const bool mJson;
    bool mIsLost = false;
    EventLoop mLoop;
    qnsmedia::Connection mConnection;
    qnsmedia::Player mPlayer; ///< behind the loop, like the next: what they tell uses it
    qnsmedia::Importer mImporter;
};

} // namespace

int monitorCommand(const qnsmedia::Connection::Options& options, bool json) {
    return Monitor(options, json).run();
}
