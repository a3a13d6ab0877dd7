// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string_view>

#include "tests/daemon/support/WireClient.h"

/** Method ids of the discoverer's requests and callbacks. */
namespace discoverer {
constexpr long kInitialize = 1;
constexpr long kOpen = 2;
constexpr long kClose = 3;
constexpr long kGetMetadata = 4;
constexpr long kGetImage = 5;
constexpr long kGetExtensions = 6;
constexpr long kUnregister = 7;
constexpr long kRegister = 8;

constexpr long kClientIdCallBack = 1;
constexpr long kInitializeCallBack = 2;
constexpr long kOpenCallBack = 3;
constexpr long kCloseCallBack = 4;
constexpr long kMetadataCallBack = 5;
constexpr long kImageCallBack = 6;
constexpr long kExtensionsCallBack = 7;

/** Arguments of the callback for a picture. */
wire::Bytes imageResult(std::int32_t result, std::int32_t code, std::string_view file,
                        std::string_view image);

/** What an empty block of streams adds to the arguments: itself, its length, its count. */
wire::Bytes noStreams();
} // namespace discoverer

/** A client process with any number of clients of the discoverer service. */
class DiscovererClient : public WireClient {
public:
    using WireClient::WireClient;

    /**
     * Registers a callback object, connecting first if necessary. Returns the client id, which
     * is expected to be answered first.
     */
    std::int32_t registerCallBack(long object);

    void request(long method, const wire::Bytes& arguments);
    void request(long method, std::int32_t client);
    void open(std::int32_t client, std::string_view file);
    void getImage(std::int32_t client, std::string_view image, std::string_view notice = "",
                  std::int64_t position = 0, std::int32_t width = 4, std::int32_t height = 2);

    /** The next packet must be this callback to the object. */
    void expectCallBack(long object, long method, const wire::Bytes& arguments);
    void expectResult(long object, long method, std::int32_t result);

    /** Everything that was sent before has been worked off, and nothing else has been answered. */
    void expectNothingElse();

private:
    static constexpr long kMarkerObject = 999;

    bool mConnected = false;
};
