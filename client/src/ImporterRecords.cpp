// SPDX-License-Identifier: MIT
#include "client/src/ImporterRecords.h"

#include <limits>

#include "client/src/Requests.h"

namespace qnsmedia {

std::optional<ImporterStatus> readImporterStatus(ArgumentReader& arguments) {
    constexpr long kAbsent = std::numeric_limits<long>::min();
    int state = 0;
    int reserved = 0;
    long done = 0;
    long total = kAbsent;
    arguments.read(state);
    arguments.read(reserved);
    arguments.read(done);
    arguments.read(total);
    if (total == kAbsent)
        return std::nullopt;
    return ImporterStatus{static_cast<ImporterState>(state), done, total};
}

std::optional<ImportNotification> readImportNotification(ArgumentReader& arguments) {
    ImportNotification notification;
    int kind = 0;
    arguments.read(kind);
    notification.kind = static_cast<ImportNotificationKind>(kind);
    arguments.read(notification.result);
    arguments.read(notification.text);
    arguments.read(notification.video);
    arguments.read(notification.audio);
    arguments.read(notification.width);
    arguments.read(notification.height);
    arguments.read(notification.frameRateNumerator);
    arguments.read(notification.frameRateDenominator);
    const std::optional<int> sampleRate = readInteger(arguments);
    if (!sampleRate)
        return std::nullopt;
    notification.sampleRate = *sampleRate;
    return notification;
}

} // namespace qnsmedia
