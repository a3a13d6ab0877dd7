// SPDX-License-Identifier: MIT
#include <chrono>
#include <future>
#include <nlohmann/json.hpp>

#include "cli/Commands.h"
#include "cli/ExitCode.h"
#include "cli/HumanTime.h"
#include "cli/Output.h"
#include "cli/StateName.h"
#include "qnsmedia/Player.h"

namespace {

constexpr std::chrono::milliseconds kAskAgain{500};

/** Another client that asks at the same time may get the answer: then it is asked for again. */
qnsmedia::PlayerStatus askStatus(qnsmedia::Player& player) {
    std::future<qnsmedia::PlayerStatus> answer = player.status();
    while (answer.wait_for(kAskAgain) != std::future_status::ready)
        (void)player.status(); // one answer serves all requests that wait
    return answer.get();
}

} // namespace

int statusCommand(const qnsmedia::Connection::Options& options, bool json) {
    qnsmedia::Connection connection(options);
    qnsmedia::Player player(connection);
    const qnsmedia::PlayerStatus status = askStatus(player);
    if (json) {
        const nlohmann::json object = {{"state", stateName(status.state)},
                                       {"position_ns", status.position.count()},
                                       {"duration_ns", status.duration.count()}};
        show(object.dump() + '\n');
        return kDone;
    }
    show(std::string(stateName(status.state)) + "  " + humanTime(status.position) + " / " +
         humanTime(status.duration) + '\n');
    return kDone;
}
