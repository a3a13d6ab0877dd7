// SPDX-License-Identifier: MIT
#include "tests/support/PlatformDouble.h"

#include <cstdarg>
#include <cstdio>
#include <cstring>
#include <mutex>
#include <utility>

#include "qnsys.h"

namespace {

std::mutex gMutex; ///< guards gLog
std::vector<platform_double::LogLine> gLog;

} // namespace

std::vector<platform_double::LogLine> platform_double::takeLog() {
    const std::lock_guard lock(gMutex);
    return std::exchange(gLog, {});
}

int qnsys_init() {
    return 0;
}

int qnsys_getenv_hv_prefix(char* buffer, int capacity) {
    return std::snprintf(buffer, static_cast<std::size_t>(capacity), "%s",
                         platform_double::kPrefix);
}

int qnsys_getenv_hv_data(char*, int) {
    return 0;
}

void qnsys_openlog(const char*, int, int) {}

void qnsys_syslog(int priority, const char* format, ...) {
    va_list arguments;
    va_start(arguments, format);
    qnsys_vsyslog(priority, format, arguments);
    va_end(arguments);
}

void qnsys_vsyslog(int priority, const char* format, va_list arguments) {
    char text[2048];
    std::vsnprintf(text, sizeof(text), format, arguments);
    const std::lock_guard lock(gMutex);
    gLog.push_back({priority, text});
}

void qnsys_print_backtrace() {}
