// SPDX-License-Identifier: MIT
#include "bench/all/Environment.h"

#include <cstdlib>
#include <ctime>
#include <fstream>
#include <gnu/libc-version.h>
#include <nlohmann/json.hpp>
#include <regex>
#include <string>
#include <sys/utsname.h>
#include <thread>
#include <unistd.h>

#include "bench/ChildProcess.h"
#include "bench/Programs.h"
#include "bench/all/BuiltFrom.h"

namespace bench {
namespace {

using Json = nlohmann::ordered_json;

struct Program {
    const char* name;
    const char* command;
    const char* option;
};

constexpr Program kPrograms[] = {
    {"MPD", "mpd", "--version"},
    {"dbus-daemon", "dbus-daemon", "--version"},
    {"ffmpegthumbnailer", "ffmpegthumbnailer", "-v"},
    {"ffprobe", "ffprobe", "-version"},
    {"mediainfo", "mediainfo", "--Version"},
    {"minidlna", "minidlnad", "-V"},
};

/** The first thing in the text that looks like a version. */
std::string versionIn(const std::string& text) {
    std::smatch match;
    return std::regex_search(text, match, std::regex("[0-9]+(\\.[0-9]+)+")) ? match.str() : "";
}

Json programs() {
    Json versions = Json::object();
    for (const Program& program : kPrograms)
        if (isInstalled(program.command))
            versions[program.name] = versionIn(runToEnd({program.command, program.option}).output);
    return versions;
}

Json libraries() {
    return {{"glibc", ::gnu_get_libc_version()},  {"Qt", QNS_QT_VERSION},
            {"GStreamer", QNS_GSTREAMER_VERSION}, {"libavformat", QNS_LIBAVFORMAT_VERSION},
            {"libmpv", QNS_MPV_VERSION},          {"libsystemd", QNS_SYSTEMD_VERSION},
            {"msgpack-c", QNS_MSGPACK_VERSION}};
}

/** What stands behind `name` in a file of lines. */
std::string valueIn(const char* path, const std::string& name) {
    std::ifstream file(path);
    for (std::string line; std::getline(file, line);) {
        std::smatch match;
        if (std::regex_match(line, match, std::regex(name + "\\s*[:=]\\s*\"?([^\"]*)\"?")))
            return match[1];
    }
    return "";
}

std::string utcNow() {
    const std::time_t now = std::time(nullptr);
    std::tm parts{};
    ::gmtime_r(&now, &parts);
    char text[32];
    std::strftime(text, sizeof text, "%Y-%m-%dT%H:%M:%SZ", &parts);
    return text;
}

/** Without what a vendor adds to the version. */
std::string kernel() {
    utsname names{};
    ::uname(&names);
    return std::string(names.sysname) + " " + versionIn(names.release) + " " + names.machine;
}

/** How busy the machine was in the minute before. */
double load() {
    double average = 0;
    ::getloadavg(&average, 1);
    return average;
}

} // namespace

Json describeEnvironment() {
    const long pages = ::sysconf(_SC_PHYS_PAGES);
    return {{"date", utcNow()},
            {"commit", QNS_BUILT_FROM},
            {"processor", valueIn("/proc/cpuinfo", "model name")},
            {"cores", std::thread::hardware_concurrency()},
            {"memoryMegabytes", pages / 1024 * ::sysconf(_SC_PAGESIZE) / 1024},
            {"loadBefore", load()},
            {"kernel", kernel()},
            {"system", valueIn("/etc/os-release", "PRETTY_NAME")},
            {"compiler", "g++ " __VERSION__},
            {"libraries", libraries()},
            {"programs", programs()}};
}

} // namespace bench
