// SPDX-License-Identifier: MIT
#pragma once

#include <string>

/**
 * The operation log: events go to the system log, user and debug operations to two text files.
 * Every entry point may be called from any thread and is a silent no-op while logging is off.
 *
 * `name` is the module, `code` a three-digit message number (1xx entry and success, 4xx
 * failures), `level` a syslog priority (3 error, 4 warning, 6 informational). Nothing is
 * reported back: a line that cannot be written is lost.
 */

/** Turns logging on under this process name. A second call keeps the first name. */
void INIT_LOGGING(std::wstring processName);

/** Turns logging off and closes the files. No other thread may still log. */
void UNINIT_LOGGING();

/**
 * System log, printf form: the name and `format` become parts of one format string. A line that
 * is longer than 255 characters before expansion is cut.
 */
[[gnu::format(printf, 4, 5)]] void LOG_EVENT(int level, const char* name, int code,
                                             const char* format, ...);

/** System log, string forms: everything is written as it stands. */
void LOG_EVENT(std::wstring name, int code, std::wstring message, int level);
void LOG_EVENT(std::string name, int code, std::string message, int level);

/** "/var/log/qn_ope.log". */
[[gnu::format(printf, 3, 4)]] void LOG_USER_OPERATE(const char* name, int code, const char* format,
                                                    ...);
void LOG_USER_OPERATE(std::wstring name, int code, std::wstring message);

/** "/var/log/qn_ope_debug.log". */
void LOG_DEBUG_OPERATE(std::wstring name, int code, std::wstring message);

/** No camera on this device: the messages are dropped. */
[[gnu::format(printf, 3, 4)]] void LOG_DEBUG_CAMERA(const char* name, int code, const char* format,
                                                    ...);
