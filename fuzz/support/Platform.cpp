// SPDX-License-Identifier: MIT
// The system services of a fuzz target: every line of the system log is formatted, and then lost.
#include <array>
#include <cstdarg>
#include <cstdio>

#include "qnsys.h"

int qnsys_init() {
    return 0;
}

int qnsys_getenv_hv_prefix(char* buffer, int capacity) {
    return std::snprintf(buffer, static_cast<std::size_t>(capacity), "/usr");
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

void qnsys_vsyslog(int, const char* format, va_list arguments) {
    std::array<char, 1024> line;
    std::vsnprintf(line.data(), line.size(), format, arguments);
}

void qnsys_print_backtrace() {}
