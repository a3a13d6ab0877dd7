// SPDX-License-Identifier: MIT
#include "client/src/Requests.h"

#include <limits>

namespace qnsmedia {

std::optional<int> readInteger(ArgumentReader& arguments) {
    constexpr long kAbsent = std::numeric_limits<long>::min();
    long value = kAbsent;
    arguments.read(value);
    if (value == kAbsent)
        return std::nullopt;
    return static_cast<int>(value);
}

Error unreadable(const std::string& name) {
    return Error(name + ": the daemon's answer cannot be read");
}

void readAccepted(const std::string& name, ArgumentReader& answer) {
    const std::optional<int> result = readInteger(answer);
    if (!result)
        throw unreadable(name);
    if (*result != 0)
        throw Refused(name + ": refused by the daemon");
}

void readNothing(const std::string&, ArgumentReader&) {}

std::future<void> ask(const ServiceClient& client, const Operation& operation) {
    return ask(client, operation, client.ownId());
}

void ask(const ServiceClient& client, const Operation& operation, AcceptedCallback callback) {
    ask(client, operation, client.ownId(), std::move(callback));
}

std::future<void> ask(const ServiceClient& client, const Operation& operation,
                      PackedArguments arguments) {
    return ask(client, operation, std::move(arguments), readAccepted);
}

void ask(const ServiceClient& client, const Operation& operation, PackedArguments arguments,
         AcceptedCallback callback) {
    ask(client, operation, std::move(arguments), readAccepted, std::move(callback));
}

} // namespace qnsmedia
