// SPDX-License-Identifier: MIT
#include <CLI/CLI.hpp>
#include <csignal>
#include <cstdio>

#include "cli/ExitCode.h"
#include "cli/Output.h"
#include "cli/Subcommands.h"
#include "qnsmedia/Error.h"

namespace {

constexpr const char* kFooter =
    "Exit status: 0 done; 1 refused, the medium cannot be played or was taken away by another\n"
    "client, or the output cannot be written; 2 wrong usage; 3 the daemon is not running; 4 no\n"
    "answer, or the connection was lost; 128 + N ended by signal N, such as 130 by Ctrl-C.";

/** Runs a subcommand and turns its errors into messages and exit codes. */
template<typename Command>
int guarded(Command&& command) {
    const auto tell = [](const std::exception& error, int code) {
        std::fprintf(stderr, "qnsmedia: %s\n", error.what());
        return code;
    };
    try {
        return command();
    } catch (const qnsmedia::DaemonNotRunning& error) {
        return tell(error, kNotRunning);
    } catch (const qnsmedia::TimedOut& error) {
        return tell(error, kNoAnswer);
    } catch (const qnsmedia::ConnectionLost& error) {
        return tell(error, kNoAnswer);
    } catch (const OutputFailed& error) {
        return error.code() == std::errc::broken_pipe ? kReaderGone : tell(error, kFailed);
    } catch (const std::exception& error) {
        return tell(error, kFailed);
    }
}

} // namespace

int main(int argc, char** argv) {
    CLI::App app{"Talks to the media service daemon."};
    app.footer(kFooter);
    app.set_version_flag("--version", "qnsmedia " QNS_VERSION);
    app.require_subcommand(1);

    qnsmedia::Connection::Options options;
    double timeout = 5;
    app.add_option("--identity", options.identity, "Identity to use, instead of the first free")
        ->check(CLI::Range(1000, 1007));
    app.add_option("--timeout", timeout, "Seconds to wait for an answer")
        ->check(CLI::Range(0.001, 86400.0))
        ->capture_default_str();

    Command command;
    addPlay(app, options, command);
    addStatus(app, options, command);
    addInfo(app, options, command);
    addImage(app, options, command);
    addExtensions(app, options, command);
    addImport(app, options, command);
    addLibrary(app, command);
    addMonitor(app, options, command);
    addPowerOff(app, options, command);

    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& error) {
        return app.exit(error) == 0 ? kDone : kUsage;
    }
    // When nobody reads the output any more, what was begun is ended properly.
    std::signal(SIGPIPE, SIG_IGN);
    options.deadline = std::chrono::milliseconds(static_cast<long>(timeout * 1000));
    return guarded(command);
}
