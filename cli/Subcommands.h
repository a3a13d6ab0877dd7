// SPDX-License-Identifier: MIT
#pragma once

#include <CLI/CLI.hpp>
#include <functional>

#include "qnsmedia/Connection.h"

/** What is to be run when the arguments have been read; returns an ExitCode. */
using Command = std::function<int()>;
using Options = qnsmedia::Connection::Options;

/**
 * Each adds a subcommand, which says what is to be run when it is the one that was given.
 * `options` and `command` must live until then.
 */
void addPlay(CLI::App& app, const Options& options, Command& command);
void addStatus(CLI::App& app, const Options& options, Command& command);
void addInfo(CLI::App& app, const Options& options, Command& command);
void addImage(CLI::App& app, const Options& options, Command& command);
void addExtensions(CLI::App& app, const Options& options, Command& command);
void addMonitor(CLI::App& app, const Options& options, Command& command);
void addPowerOff(CLI::App& app, const Options& options, Command& command);
void addImport(CLI::App& app, const Options& options, Command& command);
void addLibrary(CLI::App& app, Command& command);
