// SPDX-License-Identifier: MIT
#include <CLI/CLI.hpp>
#include <csignal>
#include <cstdio>
#include <exception>

#include "cli/ExitCode.h"
#include "mpris/Bridge.h"
#include "qnsmedia/Error.h"

namespace {

constexpr const char* kFooter =
    "Exit status: 1 no session bus, or another process shows the player there; 2 wrong usage;\n"
    "3 the daemon is not running; 4 no answer, or the daemon has ended; 128 + N ended by\n"
    "signal N, such as 143 by SIGTERM.\n\n"
    "Example: qnsmedia-mpris & playerctl -p qnsmedia play-pause";

int tell(const std::exception& error, int code) {
    std::fprintf(stderr, "qnsmedia-mpris: %s\n", error.what());
    return code;
}

int run(const mpris::Options& options) {
    try {
        return exitCodeOfSignal(mpris::Bridge(options).run());
    } catch (const qnsmedia::DaemonNotRunning& error) {
        return tell(error, kNotRunning);
    } catch (const qnsmedia::TimedOut& error) {
        return tell(error, kNoAnswer);
    } catch (const qnsmedia::ConnectionLost& error) {
        return tell(error, kNoAnswer);
    } catch (const std::exception& error) {
        return tell(error, kFailed);
    }
}

} // namespace

int main(int argc, char** argv) {
    CLI::App app{"Shows the media service daemon's player on the session bus, where desktops and\n"
                 "their media keys find it as org.mpris.MediaPlayer2.qnsmedia."};
    app.footer(kFooter);
    app.set_version_flag("--version", "qnsmedia-mpris " QNS_VERSION);

    mpris::Options options;
    app.add_option("--identity", options.connection.identity,
                   "Identity to use, instead of the first free")
        ->check(CLI::Range(1000, 1007));
    app.add_flag("--wait", options.wait,
                 "Wait for the daemon, also after it has ended, instead of ending too");
    app.add_option("--pictures", options.pictures,
                   "Folder for pictures, which the daemon can write to and desktops can read;\n"
                   "without it one that is made for them")
        ->check(CLI::ExistingDirectory);
    try {
        app.parse(argc, argv);
    } catch (const CLI::ParseError& error) {
        return app.exit(error) == 0 ? kDone : kUsage;
    }
    std::signal(SIGPIPE, SIG_IGN);
    return run(options);
}
