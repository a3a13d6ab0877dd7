// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "qnsmedia/Connection.h"

/** The subcommands. Each returns an ExitCode and throws qnsmedia::Error. */
int playCommand(const qnsmedia::Connection::Options& options, const std::string& file);
int statusCommand(const qnsmedia::Connection::Options& options, bool json);
