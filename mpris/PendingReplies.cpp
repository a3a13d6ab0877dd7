// SPDX-License-Identifier: MIT
#include "mpris/PendingReplies.h"

#include <sdbus-c++/Error.h>
#include <utility>

#include "mpris/InvalidArgument.h"
#include "mpris/Utf8.h"

namespace mpris {
namespace {

constexpr const char* kFailed = "org.freedesktop.DBus.Error.Failed";
constexpr const char* kInvalidArgs = "org.freedesktop.DBus.Error.InvalidArgs";

sdbus::Error busError(const std::exception_ptr& error) {
    try {
        std::rethrow_exception(error);
    } catch (const InvalidArgument& invalid) {
        return {kInvalidArgs, toUtf8(invalid.what())};
    } catch (const std::exception& failure) {
        return {kFailed, toUtf8(failure.what())};
    }
}

} // namespace

PendingReplies::~PendingReplies() {
    try {
        for (const auto& [number, call] : mCalls)
            call.returnError(sdbus::Error(kFailed, "the daemon has ended"));
    } catch (const sdbus::Error&) {
        // The bus has gone as well: nobody waits.
    }
}

Reply PendingReplies::add(sdbus::Result<>&& call) {
    const unsigned int number = ++mCount;
    mCalls.emplace(number, std::move(call));
    return [this, number](std::exception_ptr error) { answer(number, std::move(error)); };
}

void PendingReplies::answer(unsigned int number, std::exception_ptr error) {
    const auto node = mCalls.extract(number);
    if (error)
        node.mapped().returnError(busError(error));
    else
        node.mapped().returnResults();
}

} // namespace mpris
