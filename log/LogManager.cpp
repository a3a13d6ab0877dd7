// SPDX-License-Identifier: MIT
#include "log/LogManager.h"

#include <boost/thread/mutex.hpp>
#include <cstdlib>
#include <ctime>
#include <unistd.h>

#include "base/Text.h"
#include "qnsys.h"

std::wstring gProcName;
std::atomic<LogManager*> LogManager::mpLogManager{nullptr};

namespace {

constexpr int kLogOptionPid = 1;
constexpr int kLogFacilityLocal0 = 128;
constexpr const char* kUserOperatePath = "/var/log/qn_ope.log";
constexpr const char* kDebugOperatePath = "/var/log/qn_ope_debug.log";
constexpr const char* kFileLineFormat = "%s localhost %s[%d]: [%s] %03d: %s\n";

boost::mutex gInstanceMutex;

void openOnce(std::FILE*& file, const char* path) {
    if (file == nullptr)
        file = std::fopen(path, "a+e");
}

void closeFile(std::FILE*& file) {
    if (file != nullptr)
        std::fclose(file);
    file = nullptr;
}

} // namespace

ILogManager* ILogManager::getInstance() {
    return LogManager::getInstance();
}

void ILogManager::clearUp() {
    LogManager::clearUp();
}

LogManager* LogManager::getInstance() {
    if (LogManager* instance = mpLogManager.load(std::memory_order_acquire))
        return instance;
    const boost::mutex::scoped_lock lock(gInstanceMutex);
    if (mpLogManager.load(std::memory_order_relaxed) == nullptr)
        mpLogManager.store(new LogManager, std::memory_order_release);
    return mpLogManager.load(std::memory_order_relaxed);
}

void LogManager::clearUp() {
    delete mpLogManager.exchange(nullptr);
}

LogManager::LogManager() {
    qnsys_init();
    mProcessName = wstringToStringType(gProcName);
    qnsys_openlog(mProcessName.c_str(), kLogOptionPid, kLogFacilityLocal0);
    openOnce(mpUserOperateFile, kUserOperatePath);
    openOnce(mpDebugOperateFile, kDebugOperatePath);
}

LogManager::~LogManager() {
    closeFile(mpUserOperateFile);
    closeFile(mpDebugOperateFile);
    closeFile(mpDebugCameraFile);
}

void LogManager::logEvent(std::wstring name, int code, std::wstring message, int level) {
    logEvent(wstringToStringType(name), code, wstringToStringType(message), level);
}

void LogManager::logEvent(std::string name, int code, std::string message, int level) {
    qnsys_syslog(level, "%s %03d: %s", name.c_str(), code, message.c_str());
}

// The caller's format becomes part of the format strings below; that is how these forms work.
#pragma GCC diagnostic push
#pragma GCC diagnostic ignored "-Wformat-nonliteral"

void LogManager::logEvent(int level, const char* name, int code, const char* format,
                          va_list arguments) {
    char prefixed[256];
    std::snprintf(prefixed, sizeof prefixed, "%s %03d: %s", name, code, format);
    qnsys_vsyslog(level, prefixed, arguments);
}

void LogManager::putLog(std::FILE* file, const char* name, int code, const char* format,
                        va_list arguments) {
    if (file == nullptr)
        return;
    char line[512];
    std::snprintf(line, sizeof line, kFileLineFormat, getCurrentTime().c_str(),
                  mProcessName.c_str(), ::getpid(), name, code, format);
    if (std::vfprintf(file, line, arguments) >= 0)
        std::fflush(file);
}

void LogManager::putLog(std::FILE* file, const std::wstring& name, int code,
                        const std::wstring& message) {
    if (file == nullptr)
        return;
    std::fprintf(file, kFileLineFormat, getCurrentTime().c_str(), mProcessName.c_str(), ::getpid(),
                 wstringToStringType(name).c_str(), code, wstringToStringType(message).c_str());
    std::fflush(file);
}

#pragma GCC diagnostic pop

void LogManager::logUserOperate(std::wstring name, int code, std::wstring message) {
    putLog(mpUserOperateFile, name, code, message);
}

void LogManager::logUserOperate(const char* name, int code, const char* format, va_list arguments) {
    putLog(mpUserOperateFile, name, code, format, arguments);
}

void LogManager::logDebugOperate(std::wstring name, int code, std::wstring message) {
    putLog(mpDebugOperateFile, name, code, message);
}

void LogManager::logDebugCamera(const char* name, int code, const char* format, va_list arguments) {
    putLog(mpDebugCameraFile, name, code, format, arguments);
}

std::string LogManager::getCurrentTime() {
    timeval now{};
    return ::gettimeofday(&now, nullptr) == 0 ? formatTime(now) : std::string();
}

std::string LogManager::formatTime(const timeval& time) {
    std::tm broken{};
    if (localtime_r(&time.tv_sec, &broken) == nullptr)
        return {};
    char dateAndTime[128];
    std::strftime(dateAndTime, sizeof dateAndTime, "%FT%T", &broken);
    char microseconds[16];
    std::snprintf(microseconds, sizeof microseconds, "%06ld", static_cast<long>(time.tv_usec));

    // Log readers know this form: hours cut towards zero lose the sign of less than an hour.
    const int minutes = static_cast<int>(broken.tm_gmtoff / 60);
    const int hours = minutes / 60;
    char offset[32];
    std::snprintf(offset, sizeof offset, "%+03d:%02d", hours, std::abs(minutes - hours * 60));
    return std::string(dateAndTime) + "." + microseconds + offset;
}

std::string LogManager::wstringToStringType(const std::wstring& text) {
    return qns::narrow(text);
}

std::string LogManager::intToStringType(int number) {
    return std::to_string(number);
}

std::string LogManager::getProcID() {
    return intToStringType(::getpid());
}
