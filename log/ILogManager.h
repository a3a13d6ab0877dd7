// SPDX-License-Identifier: MIT
#pragma once

#include <cstdarg>
#include <string>

/** Where log messages go; see Logging.h for what the arguments mean. Any thread may log. */
class ILogManager {
public:
    virtual void logEvent(std::wstring name, int code, std::wstring message, int level) = 0;
    virtual void logEvent(std::string name, int code, std::string message, int level) = 0;
    virtual void logEvent(int level, const char* name, int code, const char* format,
                          va_list arguments) = 0;
    virtual void logUserOperate(std::wstring name, int code, std::wstring message) = 0;
    virtual void logUserOperate(const char* name, int code, const char* format,
                                va_list arguments) = 0;
    virtual void logDebugOperate(std::wstring name, int code, std::wstring message) = 0;
    virtual void logDebugCamera(const char* name, int code, const char* format,
                                va_list arguments) = 0;
    virtual ~ILogManager() = default;

    /** The process's log manager, made at the first call. It stays owned by the class. */
    static ILogManager* getInstance();

    /** Ends the process's log manager. No other thread may be logging. */
    static void clearUp();
};
