// SPDX-License-Identifier: MIT
#include <memory>

#include "cli/Commands.h"
#include "cli/Subcommands.h"

void addMonitor(CLI::App& app, const Options& options, Command& command) {
    CLI::App* const monitor =
        app.add_subcommand("monitor", "Tell everything that the daemon notifies, as it happens");
    const auto json = std::make_shared<bool>(false);
    monitor->add_flag("--json", *json, "As a JSON object a line; times in nanoseconds");
    monitor->footer("Ctrl-C ends it.\n\nExample: qnsmedia monitor --json");
    monitor->callback([=, &options, &command] {
        command = [=, &options] { return monitorCommand(options, *json); };
    });
}

void addPowerOff(CLI::App& app, const Options& options, Command& command) {
    CLI::App* const powerOff =
        app.add_subcommand("poweroff", "End the daemon, for all its clients");
    const auto yes = std::make_shared<bool>(false);
    powerOff->add_flag("-y,--yes", *yes, "Without asking, which it only does in a terminal");
    powerOff->footer("Example: qnsmedia poweroff --yes");
    powerOff->callback([=, &options, &command] {
        command = [=, &options] { return powerOffCommand(options, !*yes); };
    });
}
