// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace bench {

class Report;

/** Folder of this program, which is also the daemon's. */
std::string programFolder();

/** Whether a folder of PATH has the program. */
[[nodiscard]] bool isInstalled(const std::string& program);

/** The same; when it is missing the report says that `contender` is left out. */
[[nodiscard]] bool takesPart(const std::string& contender, const std::string& program,
                             Report& report);

} // namespace bench
