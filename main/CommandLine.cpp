// SPDX-License-Identifier: MIT
#include "main/CommandLine.h"

#include <cstdio>
#include <cstdlib>
#include <string_view>

namespace {

constexpr int kUsageError = 2;

constexpr const char* kHelp =
    "Usage: QNSMediaService [OPTION]...\n"
    "Plays media for other processes of this machine, which reach it at 127.0.0.1:1008.\n"
    "\n"
    "  --reconnect-clients serve clients that end and start again; without it the service\n"
    "                      connects to each client identity only once in its life\n"
    "  -h, --help          show this text and exit\n"
    "  --version           show the version and exit\n"
    "\n"
    "Options of Qt:\n"
    "  -platform NAME      window system; \"offscreen\" when there is no display\n"
    "  -display NAME, -platformpluginpath DIR, -platformtheme NAME, -plugin NAME,\n"
    "  -qwindowgeometry GEOMETRY, -qwindowicon FILE, -qwindowtitle TITLE, -reverse,\n"
    "  -style NAME, -stylesheet FILE\n"
    "\n"
    "Environment:\n"
    "  QNS_HV_PREFIX       installation prefix; share/mediaplayer lies below it\n"
    "  QNS_HV_DATA         data directory (default /var/lib/qnsmedia)\n"
    "  QT_QPA_PLATFORM     window system, as -platform\n"
    "  LC_ALL, LANG        encoding of file names and texts; use a UTF-8 locale\n"
    "\n"
    "Exit status: 0 after a client's power-off, SIGTERM or SIGINT; 255 when the platform\n"
    "library fails; 2 for a wrong option.\n";

struct QtOption {
    std::string_view name;
    bool takesValue = true;
};

constexpr QtOption kQtOptions[] = {
    {"-display"},        {"-platform"},        {"-platformpluginpath"}, {"-platformtheme"},
    {"-plugin"},         {"-qwindowgeometry"}, {"-qwindowicon"},        {"-qwindowtitle"},
    {"-reverse", false}, {"-style"},           {"-stylesheet"},
};

/** Qt takes its options with one dash or two. */
const QtOption* findQtOption(std::string_view argument) {
    if (argument.substr(0, 2) == "--")
        argument.remove_prefix(1);
    for (const QtOption& option : kQtOptions)
        if (option.name == argument)
            return &option;
    return nullptr;
}

CommandLine endWith(int status) {
    CommandLine result;
    result.exitStatus = status;
    return result;
}

CommandLine endWithText(const char* text) {
    std::fputs(text, stdout);
    return endWith(EXIT_SUCCESS);
}

CommandLine refuse(const char* problem, std::string_view argument) {
    std::fprintf(stderr, "QNSMediaService: %s: %.*s (try --help)\n", problem,
                 static_cast<int>(argument.size()), argument.data());
    return endWith(kUsageError);
}

bool isSet(const char* variable) {
    const char* value = std::getenv(variable);
    return value != nullptr && *value != '\0';
}

} // namespace

CommandLine readCommandLine(int argc, char** argv) {
    CommandLine result;
    for (int i = 1; i < argc; ++i) {
        const std::string_view argument = argv[i];
        if (argument == "--help" || argument == "-h")
            return endWithText(kHelp);
        if (argument == "--version")
            return endWithText("QNSMediaService " QNS_VERSION "\n");
        if (argument == "--reconnect-clients") {
            result.reconnectsClients = true;
            continue;
        }
        const QtOption* option = findQtOption(argument);
        if (option == nullptr)
            return refuse("unknown option", argument);
        if (option->takesValue && ++i == argc)
            return refuse("option without its value", argument);
        result.choosesPlatform |= option->name == "-platform";
    }
    return result;
}

void choosePlatform() {
    if (!isSet("DISPLAY") && !isSet("WAYLAND_DISPLAY") && !isSet("QT_QPA_PLATFORM"))
        ::setenv("QT_QPA_PLATFORM", "offscreen", 1);
}
