// SPDX-License-Identifier: MIT
#include <cstdio>
#include <nlohmann/json.hpp>

#include "cli/Commands.h"
#include "cli/ExitCode.h"
#include "cli/HumanTime.h"
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
        std::puts(object.dump().c_str());
        return kDone;
    }
    std::printf("%s  %s / %s\n", stateName(status.state), humanTime(status.position).c_str(),
                humanTime(status.duration).c_str());
    return kDone;
}
