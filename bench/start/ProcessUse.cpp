// SPDX-License-Identifier: MIT
#include "bench/start/ProcessUse.h"

#include <filesystem>
#include <fstream>
#include <string>
#include <system_error>
#include <unistd.h>
#include <vector>

namespace bench {
namespace {

namespace fs = std::filesystem;

/** The number behind `label` in a file of "label: number" lines. */
int64_t numberBehind(const fs::path& file, const std::string& label) {
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
double cpuSecondsOf(const fs::path& process) {
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

fs::path folderOf(pid_t pid) {
    return "/proc/" + std::to_string(pid);
}

double megabytesBehind(const fs::path& file, const std::string& label) {
    return static_cast<double>(numberBehind(file, label)) / 1024.0;
}

/** The process and all below it. */
std::vector<pid_t> familyOf(pid_t pid) {
    std::vector<pid_t> family = {pid};
    for (std::size_t i = 0; i < family.size(); ++i) {
        std::error_code gone;
        for (const auto& task : fs::directory_iterator(folderOf(family[i]) / "task", gone)) {
            std::ifstream children(task.path() / "children");
            for (pid_t child = 0; children >> child;)
                family.push_back(child);
        }
    }
    return family;
}

void addUse(pid_t pid, ProcessUse& use) {
    const fs::path process = folderOf(pid);
    use.residentMegabytes += megabytesBehind(process / "status", "VmRSS:");
    use.anonymousMegabytes += megabytesBehind(process / "status", "RssAnon:");
    use.cpuSeconds += cpuSecondsOf(process);
    std::error_code gone;
    for (const auto& task : fs::directory_iterator(process / "task", gone))
        use.contextSwitches += numberBehind(task.path() / "status", "voluntary_ctxt_switches:");
}

} // namespace

ProcessUse readProcessUse(pid_t pid) {
    ProcessUse use;
    for (const pid_t member : familyOf(pid))
        addUse(member, use);
    return use;
}

double readPeakMegabytes(pid_t pid) {
    double sum = 0;
    for (const pid_t member : familyOf(pid))
        sum += megabytesBehind(folderOf(member) / "status", "VmHWM:");
    return sum;
}

} // namespace bench
