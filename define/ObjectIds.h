// SPDX-License-Identifier: MIT
#pragma once

/** The numbers that tie objects, receivers and loopback ports together. */
namespace MediaServiceDefine {

constexpr long kThreadedReceiverId = 8; ///< first field of every packet to the daemon
constexpr long kSocketReceiverId = 0;   ///< not used for routing

constexpr long kServiceIdentity = 1008; ///< port of the daemon
constexpr long kFirstClientIdentity = 1000;
constexpr long kLastClientIdentity = 1007;

constexpr long kDiscovererAdapterId = 51;
constexpr long kDiscovererCallBackId = 52;
constexpr long kImporterAdapterId = 56;
constexpr long kImporterCallBackId = 57;
constexpr long kImporterNotifyId = 58;
constexpr long kPlayerAdapterId = 62;
constexpr long kPlayerCallBackId = 63;
constexpr long kPlayerNotifyId = 64;

} // namespace MediaServiceDefine

/**
 * Receiver id of the client process with this identity. 1006 and 1007 are swapped against the
 * pattern of the others, and every other identity gives 8; deployed clients rely on both.
 */
constexpr long toModuleId(long identity) {
    switch (identity) {
    case 1000:
        return 1;
    case 1001:
        return 2;
    case 1002:
        return 3;
    case 1003:
        return 4;
    case 1004:
        return 5;
    case 1005:
        return 6;
    case 1007:
        return 7;
    default:
        return 8;
    }
}
