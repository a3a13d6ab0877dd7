// SPDX-License-Identifier: MIT
// The system log without syslog(3), which blocks for ever when nobody reads /dev/log. The lines
// have the form that the C library gives them.
#include <cstdio>
#include <cstdlib>
#include <ctime>
#include <mutex>
#include <string>
#include <syslog.h>
#include <unistd.h>

#include "platform/qnsys/src/SystemLogSocket.h"
#include "qnsys.h"

namespace {

/** Leaked on purpose: threads may log until the process has ended. */
struct SystemLog {
    std::mutex mutex; ///< guards all below
    std::string ident;
    int options = 0;
    int facility = LOG_USER;
    unsigned long dropped = 0;
    qnsys::SystemLogSocket socket;
};

SystemLog& systemLog() {
    static SystemLog& log = *new SystemLog;
    return log;
}

/** As "%h %e %T " of strftime(3) in the C locale; empty when the time cannot be told. */
std::string timeStamp() {
    static constexpr const char* kMonths[] = {"Jan", "Feb", "Mar", "Apr", "May", "Jun",
                                              "Jul", "Aug", "Sep", "Oct", "Nov", "Dec"};
    const std::time_t now = std::time(nullptr);
    std::tm broken{};
    if (localtime_r(&now, &broken) == nullptr)
        return {};
    char text[64];
    std::snprintf(text, sizeof text, "%s %2d %02d:%02d:%02d ", kMonths[broken.tm_mon % 12],
                  broken.tm_mday, broken.tm_hour, broken.tm_min, broken.tm_sec);
    return text;
}

std::string formatMessage(const char* format, va_list arguments) {
    char* text = nullptr;
    const int length = ::vasprintf(&text, format, arguments);
    if (length < 0)
        return {};
    std::string message(text, static_cast<std::size_t>(length));
    std::free(text);
    return message;
}

std::string frame(const SystemLog& log, int priority, const std::string& stamp,
                  const std::string& message) {
    priority &= LOG_PRIMASK | LOG_FACMASK;
    if ((priority & LOG_FACMASK) == 0)
        priority |= log.facility;
    std::string line = "<" + std::to_string(priority) + ">" + stamp;
    line += log.ident.empty() ? program_invocation_short_name : log.ident.c_str();
    if ((log.options & LOG_PID) != 0)
        line += "[" + std::to_string(::getpid()) + "]";
    return line + ": " + message;
}

/** False, and nothing is sent, while the lines dropped so far cannot be told. */
bool tellDropped(SystemLog& log, const std::string& stamp) {
    if (log.dropped == 0)
        return true;
    const std::string message = std::to_string(log.dropped) + " log lines were dropped";
    if (!log.socket.send(frame(log, LOG_WARNING, stamp, message)))
        return false;
    log.dropped = 0;
    return true;
}

} // namespace

void qnsys_openlog(const char* ident, int option, int facility) {
    SystemLog& log = systemLog();
    const std::lock_guard lock(log.mutex);
    log.ident = ident != nullptr ? ident : "";
    log.options = option;
    if (facility != 0 && (facility & ~LOG_FACMASK) == 0)
        log.facility = facility;
}

void qnsys_syslog(int priority, const char* format, ...) {
    va_list arguments;
    va_start(arguments, format);
    qnsys_vsyslog(priority, format, arguments);
    va_end(arguments);
}

void qnsys_vsyslog(int priority, const char* format, va_list arguments) {
    // First of all, since the format may ask for errno, and outside the lock, since arguments may
    // be long and the time zone may have to be read from a file.
    const std::string message = formatMessage(format, arguments);
    const std::string stamp = timeStamp();
    SystemLog& log = systemLog();
    const std::lock_guard lock(log.mutex);
    if (!tellDropped(log, stamp) || !log.socket.send(frame(log, priority, stamp, message)))
        ++log.dropped;
}
