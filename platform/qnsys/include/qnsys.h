/* SPDX-License-Identifier: MIT */
/**
 * The device's system services: directories, system log, back-trace.
 *
 * This header is a contract: a device brings its own libqnsys.so.1 with the same functions, and
 * the daemon runs with it unchanged. All functions may be called from any thread.
 */
#ifndef QNSYS_H
#define QNSYS_H

#include <stdarg.h>

#ifdef __cplusplus
extern "C" {
#endif

#if defined(__GNUC__)
#define QNSYS_API __attribute__((visibility("default")))
#define QNSYS_PRINTF(text, first) __attribute__((format(printf, text, first)))
#else
#define QNSYS_API
#define QNSYS_PRINTF(text, first)
#endif

/** Prepares the library. May be called more than once. Negative on failure. */
QNSYS_API int qnsys_init(void);

/**
 * Writes the installation prefix (below it lies share/mediaplayer/) into `buffer`, ended by a
 * zero byte. Returns the length written, or 0 when it is unknown or needs more than `capacity`
 * bytes; the buffer is then left as it was.
 */
QNSYS_API int qnsys_getenv_hv_prefix(char* buffer, int capacity);

/** The same for the data directory (media library and database). */
QNSYS_API int qnsys_getenv_hv_data(char* buffer, int capacity);

/**
 * As openlog(3). `ident` is copied; null or empty stands for the program's name. Of the options
 * only LOG_PID has a meaning: lines go to the log daemon and nowhere else.
 */
QNSYS_API void qnsys_openlog(const char* ident, int option, int facility);

/**
 * As syslog(3) and vsyslog(3), `%m` included, but never waiting for the log daemon: a line that
 * cannot be taken at once is dropped. The number of dropped lines is logged as soon as lines
 * are taken again.
 */
QNSYS_API void qnsys_syslog(int priority, const char* format, ...) QNSYS_PRINTF(2, 3);
QNSYS_API void qnsys_vsyslog(int priority, const char* format, va_list arguments)
    QNSYS_PRINTF(2, 0);

/**
 * Writes the calling thread's back-trace with function names to standard error. Uses
 * async-signal-safe means only, so a handler of a crash signal may call it.
 */
QNSYS_API void qnsys_print_backtrace(void);

#ifdef __cplusplus
}
#endif

#endif
