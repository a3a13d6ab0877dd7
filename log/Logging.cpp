// SPDX-License-Identifier: MIT
#include "log/Logging.h"

#include <atomic>
#include <boost/thread/mutex.hpp>
#include <cstdarg>
#include <utility>

#include "log/LogManager.h"

namespace {

/** Null while logging is off. */
std::atomic<ILogManager*> gLogManager{nullptr};

boost::mutex gSwitchMutex; ///< held while logging is turned on or off

} // namespace

void INIT_LOGGING(std::wstring processName) {
    const boost::mutex::scoped_lock lock(gSwitchMutex);
    gProcName = std::move(processName);
    gLogManager = LogManager::getInstance();
}

void UNINIT_LOGGING() {
    const boost::mutex::scoped_lock lock(gSwitchMutex);
    LogManager::clearUp();
    gLogManager = nullptr;
}

void LOG_EVENT(int level, const char* name, int code, const char* format, ...) {
    ILogManager* manager = gLogManager;
    if (manager == nullptr)
        return;
    va_list arguments;
    va_start(arguments, format);
    manager->logEvent(level, name, code, format, arguments);
    va_end(arguments);
}

void LOG_EVENT(std::wstring name, int code, std::wstring message, int level) {
    if (ILogManager* manager = gLogManager)
        manager->logEvent(std::move(name), code, std::move(message), level);
}

void LOG_EVENT(std::string name, int code, std::string message, int level) {
    if (ILogManager* manager = gLogManager)
        manager->logEvent(std::move(name), code, std::move(message), level);
}

void LOG_USER_OPERATE(const char* name, int code, const char* format, ...) {
    ILogManager* manager = gLogManager;
    if (manager == nullptr)
        return;
    va_list arguments;
    va_start(arguments, format);
    manager->logUserOperate(name, code, format, arguments);
    va_end(arguments);
}

void LOG_USER_OPERATE(std::wstring name, int code, std::wstring message) {
    if (ILogManager* manager = gLogManager)
        manager->logUserOperate(std::move(name), code, std::move(message));
}

void LOG_DEBUG_OPERATE(std::wstring name, int code, std::wstring message) {
    if (ILogManager* manager = gLogManager)
        manager->logDebugOperate(std::move(name), code, std::move(message));
}

void LOG_DEBUG_CAMERA(const char* name, int code, const char* format, ...) {
    ILogManager* manager = gLogManager;
    if (manager == nullptr)
        return;
    va_list arguments;
    va_start(arguments, format);
    manager->logDebugCamera(name, code, format, arguments);
    va_end(arguments);
}
