// SPDX-License-Identifier: MIT
#include <nlohmann/json.hpp>

#include "cli/Commands.h"
#include "cli/ExitCode.h"
#include "cli/Output.h"
#include "qnsmedia/Discoverer.h"

int extensionsCommand(const qnsmedia::Connection::Options& options, bool json) {
    qnsmedia::Connection connection(options);
    qnsmedia::Discoverer discoverer(connection);
    const std::vector<std::string> extensions = discoverer.extensions().get();
    std::string text;
    for (const std::string& extension : extensions)
        text += extension + '\n';
    show(json ? nlohmann::json(extensions).dump() + '\n' : text);
    return kDone;
}
