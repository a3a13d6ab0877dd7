// SPDX-License-Identifier: MIT
#include "bench/Programs.h"

#include <cstdlib>
#include <filesystem>
#include <sstream>
#include <unistd.h>

#include "bench/Report.h"

namespace bench {

std::string programFolder() {
    return std::filesystem::read_symlink("/proc/self/exe").parent_path().string();
}

bool isInstalled(const std::string& program) {
    const char* const path = std::getenv("PATH");
    std::istringstream folders(path == nullptr ? "" : path);
    for (std::string folder; std::getline(folders, folder, ':');)
        if (::access((folder + "/" + program).c_str(), X_OK) == 0)
            return true;
    return false;
}

bool takesPart(const std::string& contender, const std::string& program, Report& report) {
    if (isInstalled(program))
        return true;
    report.leaveOut(contender);
    return false;
}

} // namespace bench
