// SPDX-License-Identifier: MIT
// The device's system services as a test wants them: results and directories come from the
// environment, log lines go nowhere but to standard error.
#include <cstdio>
#include <cstdlib>
#include <cstring>

#include "qnsys.h"

namespace {

int copyFrom(const char* variable, char* buffer, int capacity) {
    const char* value = std::getenv(variable);
    if (value == nullptr || std::strlen(value) >= static_cast<std::size_t>(capacity))
        return 0;
    std::strcpy(buffer, value);
    return static_cast<int>(std::strlen(value));
}

} // namespace

int qnsys_init(void) {
    const char* result = std::getenv("QNSYS_DOUBLE_INIT");
    return result != nullptr ? std::atoi(result) : 0;
}

int qnsys_getenv_hv_prefix(char* buffer, int capacity) {
    return copyFrom("QNSYS_DOUBLE_PREFIX", buffer, capacity);
}

int qnsys_getenv_hv_data(char* buffer, int capacity) {
    return copyFrom("QNSYS_DOUBLE_DATA", buffer, capacity);
}

void qnsys_openlog(const char*, int, int) {}

void qnsys_syslog(int priority, const char* format, ...) {
    va_list arguments;
    va_start(arguments, format);
    qnsys_vsyslog(priority, format, arguments);
    va_end(arguments);
}

void qnsys_vsyslog(int priority, const char* format, va_list arguments) {
    char message[1024];
    std::vsnprintf(message, sizeof message, format, arguments);
    std::fprintf(stderr, "<%d>%s\n", priority, message);
}

void qnsys_print_backtrace(void) {
    std::fputs("back-trace\n", stderr);
}
