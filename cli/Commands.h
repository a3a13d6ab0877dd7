// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

#include "cli/MediaTime.h"
#include "qnsmedia/Connection.h"

/** A picture of a file, to be written to another. */
struct ImageRequest {
    std::string file;
    std::string output;
    MediaTime at;
    int width = 0;  ///< 0: from the height, or as it is
    int height = 0; ///< the same
};

/** The subcommands. Each returns an ExitCode and throws qnsmedia::Error. */
int playCommand(const qnsmedia::Connection::Options& options, const std::string& file);
int statusCommand(const qnsmedia::Connection::Options& options, bool json);
int infoCommand(const qnsmedia::Connection::Options& options, const std::vector<std::string>& files,
                bool json);
int imageCommand(const qnsmedia::Connection::Options& options, const ImageRequest& request);
int extensionsCommand(const qnsmedia::Connection::Options& options, bool json);
