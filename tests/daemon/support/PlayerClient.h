// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <optional>
#include <string_view>

#include "tests/daemon/support/WireClient.h"

/** Method ids of the player's requests. */
namespace request {
constexpr long kInitializePlayer = 1;
constexpr long kOpenPlayer = 2;
constexpr long kClosePlayer = 3;
constexpr long kPlay = 4;
constexpr long kPause = 5;
constexpr long kSeek = 6;
constexpr long kGetPlayerStatus = 7;
constexpr long kSetRepeat = 8;
constexpr long kPowerOffMediaPlayer = 9;
constexpr long kUnregisterCallBack = 10;
constexpr long kUnregisterNotify = 11;
constexpr long kSetSystemFormat = 12;
constexpr long kRegisterCallBack = 13;
constexpr long kRegisterNotify = 14;
} // namespace request

/** Method ids of its callbacks. */
namespace callback {
constexpr long kSetPlayerClientId = 1;
constexpr long kInitializePlayer = 2;
constexpr long kOpenPlayer = 3;
constexpr long kClosePlayer = 4;
constexpr long kPlay = 5;
constexpr long kPause = 6;
constexpr long kSeek = 7;
constexpr long kGetPlayerStatus = 8;
constexpr long kSetRepeat = 9;
constexpr long kPowerOffMediaPlayer = 10;
} // namespace callback

/** The first field of every packet to the client with this identity. */
std::int64_t receiverOf(long identity);

/** A status reply's payload, and what is in one. */
struct PlayerStatus {
    std::int32_t code = 0;
    std::int64_t value1 = 0;
    std::int64_t value2 = 0;
};
wire::Bytes encode(const PlayerStatus& status);
PlayerStatus decodeStatus(const std::optional<wire::Packet>& reply);

/** A client of the player service. */
class PlayerClient : public WireClient {
public:
    /** Object ids are chosen so that no two of all clients' objects are the same. */
    explicit PlayerClient(long identity);

    [[nodiscard]] long callbackObject() const { return mCallbackObject; }
    [[nodiscard]] long notifyObject() const { return mCallbackObject + 1; }

    /** The id that the daemon gave; -1 before. */
    [[nodiscard]] std::int32_t id() const { return mId; }

    /** Registers the callback object, connecting first if necessary, and waits for the id. */
    void registerCallBack();

    /** Registers the notify object, and waits until that is done. */
    void registerNotify();

    /** Sends a request with these arguments. */
    void request(long method, const wire::Bytes& arguments);

    /** Sends a request whose only argument is the client's id. */
    void request(long method);

    void open(std::string_view name);
    void seek(std::int64_t position, std::int32_t mode, bool option = false);
    void setRepeat(bool repeat, std::int64_t start, std::int64_t end);

    /** What the daemon sends to the client's callback object, or to its notify object. */
    [[nodiscard]] wire::Packet callbackPacket(long method, const wire::Bytes& payload) const;
    [[nodiscard]] wire::Packet notifyPacket(const wire::Bytes& payload) const;

    /** The next packet must be this callback with this result. */
    void expectReply(long method, std::int32_t result);

    /** Sends a request with the client's id and waits for its accepting reply. */
    void callAccepted(long method, long callback);

    /**
     * Everything that this client sent before has been worked off, and nothing has been sent to
     * it that was not received: the next packet answers a request made here, the registration
     * of one more callback object.
     */
    void expectNothingElse();

private:
    long mCallbackObject;
    std::int32_t mId = -1;
};
