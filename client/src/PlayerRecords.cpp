// SPDX-License-Identifier: MIT
#include "client/src/PlayerRecords.h"

#include <limits>

namespace qnsmedia {
namespace {

/** Stays in a field that was not there; nobody has a position of minus 292 years. */
constexpr long kAbsent = std::numeric_limits<long>::min();

} // namespace

std::optional<PlayerStatus> readStatus(ArgumentReader& arguments) {
    int state = 0;
    int reserved = 0;
    long position = 0;
    long duration = kAbsent;
    arguments.read(state);
    arguments.read(reserved);
    arguments.read(position);
    arguments.read(duration);
    if (duration == kAbsent)
        return std::nullopt;
    return PlayerStatus{static_cast<PlayerState>(state), Nanoseconds(position),
                        Nanoseconds(duration)};
}

std::optional<PlayerNotification> readNotification(ArgumentReader& arguments) {
    PlayerNotification notification;
    notification.value = kAbsent;
    int kind = 0;
    arguments.read(kind);
    notification.kind = static_cast<NotificationKind>(kind);
    arguments.read(notification.result);
    arguments.read(notification.text);
    arguments.read(notification.param1);
    arguments.read(notification.param2);
    arguments.read(notification.param3);
    arguments.read(notification.value1);
    arguments.read(notification.value2);
    arguments.read(notification.value);
    if (notification.value == kAbsent)
        return std::nullopt;
    return notification;
}

} // namespace qnsmedia
