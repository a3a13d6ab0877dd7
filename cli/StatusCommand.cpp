// SPDX-License-Identifier: MIT
#include <nlohmann/json.hpp>

#include "cli/Commands.h"
#include "cli/ExitCode.h"
#include "cli/HumanTime.h"
#include "cli/Output.h"
#include "cli/StateName.h"
#include "qnsmedia/Player.h"

int statusCommand(const qnsmedia::Connection::Options& options, bool json) {
    qnsmedia::Connection connection(options);
    qnsmedia::Player player(connection);
    const qnsmedia::PlayerStatus status = player.status().get();
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
