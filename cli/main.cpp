// SPDX-License-Identifier: MIT
#include <CLI/CLI.hpp>
#include <cstdio>

#include "cli/Commands.h"
#include "cli/ExitCode.h"
#include "qnsmedia/Error.h"

namespace {

constexpr const char* kFooter =
    "Exit status: 0 done; 1 refused, or the medium cannot be played; 2 wrong usage;\n"
    "3 the daemon is not running; 4 no answer, or the connection was lost; 130 interrupted.";

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
    } catch (const std::exception& error) {
        return tell(error, kRefused);
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
        ->check(CLI::PositiveNumber)
        ->capture_default_str();

    std::string file;
    CLI::App* play = app.add_subcommand("play", "Play a file or a URI to its end");
    play->add_option("FILE", file, "Path or URI")->required();
    play->footer("Keys in a terminal: space pauses and resumes, left and right seek 5 seconds,\n"
                 "down and up 30, a marks the start of a loop and b its end, a again ends the\n"
                 "loop, q quits.\n\nExample: qnsmedia play film.mp4");

    bool json = false;
    CLI::App* status = app.add_subcommand("status", "Tell the player's state and position");
    status->add_flag("--json", json, "As a JSON object; times in nanoseconds");
    status->footer("Example: qnsmedia status --json");

    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& error) {
        return app.exit(error) == 0 ? kDone : kUsage;
    }
    options.deadline = std::chrono::milliseconds(static_cast<long>(timeout * 1000));
    return guarded(
        [&] { return play->parsed() ? playCommand(options, file) : statusCommand(options, json); });
}
