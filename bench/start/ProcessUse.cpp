// SPDX-License-Identifier: MIT
#include "bench/start/ProcessUse.h"

#include <filesystem>
#include <fstream>
#include <string>
#include <unistd.h>

namespace bench {
namespace {

/** The number behind `label` in a file of "label: number" lines. */
int64_t numberBehind(const std::filesystem::path& file, const std::string& label) {
    std::ifstream in(file);
    std::string word;
    while (in >> word) {
        int64_t value = 0;
        if (word == label && in >> value)
            return value;
    }
    return 0;
}

/** User and system time of the whole process. */
double cpuSecondsOf(const std::filesystem::path& process) {
    std::ifstream in(process / "stat");
    std::string text((std::istreambuf_iterator<char>(in)), {});
    std::size_t at = text.rfind(')');
    // User and system time are the 12th and 13th fields behind the name.
    for (int field = 0; field < 12 && at != std::string::npos; ++field)
        at = text.find(' ', at + 1);
    if (at == std::string::npos)
        return 0;
    std::size_t used = 0;
    const long user = std::stol(text.substr(at), &used);
    const long system = std::stol(text.substr(at + used));
    return static_cast<double>(user + system) / static_cast<double>(::sysconf(_SC_CLK_TCK));
}

} // namespace

ProcessUse readProcessUse(pid_t pid) {
    const std::filesystem::path process = "/proc/" + std::to_string(pid);
    ProcessUse use;
    use.residentMegabytes =
        static_cast<double>(numberBehind(process / "status", "VmRSS:")) / 1024.0;
    use.cpuSeconds = cpuSecondsOf(process);
    for (const auto& task : std::filesystem::directory_iterator(process / "task"))
        use.contextSwitches += numberBehind(task.path() / "status", "voluntary_ctxt_switches:");
    return use;
}

double readPeakMegabytes(pid_t pid) {
    const std::filesystem::path process = "/proc/" + std::to_string(pid);
    double sum = static_cast<double>(numberBehind(process / "status", "VmHWM:")) / 1024.0;
    std::ifstream children(process / "task" / std::to_string(pid) / "children");
    for (pid_t child = 0; children >> child;)
        sum += readPeakMegabytes(child);
    return sum;
}

} // namespace bench
