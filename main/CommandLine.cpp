// SPDX-License-Identifier: MIT
#include "main/CommandLine.h"

#include <cstdio>
#include <cstring>
#include <string_view>

namespace {

constexpr const char* kHelp =
    "Usage: QNSMediaService [OPTION]...\n"
    "Plays media for other processes of this machine, which reach it at 127.0.0.1:1008.\n"
    "\n"
    "  --help              show this text and exit\n"
    "  --version           show the version and exit\n"
    "  -platform NAME      Qt's window system; \"offscreen\" when there is no display\n"
    "\n"
    "Environment:\n"
    "  QNS_HV_PREFIX       installation prefix; share/mediaplayer lies below it\n"
    "  QNS_HV_DATA         data directory (default /var/lib/qnsmedia)\n"
    "  LC_ALL, LANG        encoding of file names and texts; use a UTF-8 locale\n"
    "\n"
    "Exit status: 0 after a client's power-off, SIGTERM or SIGINT; 255 when the platform\n"
    "library fails; 2 for a wrong option.\n";

/** Qt's own options that take a value of their own. */
bool takesValue(std::string_view option) {
    return option == "-platform" || option == "-platformpluginpath" || option == "-style";
}

} // namespace

std::optional<int> runCommandLine(int argc, char** argv) {
    for (int i = 1; i < argc; ++i) {
        const std::string_view argument = argv[i];
        if (argument == "--help" || argument == "-h") {
            std::fputs(kHelp, stdout);
            return 0;
        }
        if (argument == "--version") {
            std::puts("QNSMediaService " QNS_VERSION);
            return 0;
        }
        if (takesValue(argument)) {
            ++i;
            continue;
        }
        std::fprintf(stderr, "QNSMediaService: unknown option %s (try --help)\n", argv[i]);
        return 2;
    }
    return std::nullopt;
}

bool choosesPlatform(int argc, char** argv) {
    for (int i = 1; i < argc; ++i)
        if (std::strcmp(argv[i], "-platform") == 0)
            return true;
    return false;
}
