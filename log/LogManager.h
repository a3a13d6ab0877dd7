// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <cstdio>
#include <string>
#include <sys/time.h>

#include "log/ILogManager.h"

/** Writes to the system log and to the two operation log files. */
class LogManager : public ILogManager {
public:
    void logEvent(std::wstring name, int code, std::wstring message, int level) override;
    void logEvent(std::string name, int code, std::string message, int level) override;
    void logEvent(int level, const char* name, int code, const char* format,
                  va_list arguments) override;
    void logUserOperate(std::wstring name, int code, std::wstring message) override;
    void logUserOperate(const char* name, int code, const char* format, va_list arguments) override;
    void logDebugOperate(std::wstring name, int code, std::wstring message) override;
    void logDebugCamera(const char* name, int code, const char* format, va_list arguments) override;
    ~LogManager() override;

    static LogManager* getInstance();
    static void clearUp();

    /** Local time as RFC 3339 with microseconds and offset; empty when it cannot be told. */
    static std::string getCurrentTime();
    /** The same for a given time. */
    static std::string formatTime(const timeval& time);

    static std::string wstringToStringType(const std::wstring& text);
    static std::string intToStringType(int number);
    static std::string getProcID();

private:
    LogManager();

    /** Appends one line with the caller's format in the place of the message. */
    void putLog(std::FILE* file, const char* name, int code, const char* format, va_list arguments);
    void putLog(std::FILE* file, const std::wstring& name, int code, const std::wstring& message);

    std::FILE* mpUserOperateFile = nullptr;
    std::FILE* mpDebugOperateFile = nullptr;
    std::FILE* mpDebugCameraFile = nullptr; ///< never opened: there is no camera
    std::string mProcessName;

    static std::atomic<LogManager*> mpLogManager;
};

/** The process name that INIT_LOGGING was given; empty before. */
extern std::wstring gProcName;
