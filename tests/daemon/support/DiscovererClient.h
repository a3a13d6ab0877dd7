// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>
#include <string_view>

#include "tests/daemon/support/ServiceClient.h"

/** Method ids of the discoverer's requests and callbacks, and what stands in the callbacks. */
namespace discoverer {

constexpr long kInitialize = 1;
constexpr long kOpen = 2;
constexpr long kClose = 3;
constexpr long kGetMetadata = 4;
constexpr long kGetImage = 5;
constexpr long kGetExtensions = 6;
constexpr long kUnregister = 7;
constexpr long kRegister = 8;

constexpr long kInitializeCallBack = 2;
constexpr long kOpenCallBack = 3;
constexpr long kCloseCallBack = 4;
constexpr long kMetadataCallBack = 5;
constexpr long kImageCallBack = 6;
constexpr long kExtensionsCallBack = 7;

wire::Bytes image(std::int32_t result, std::int32_t code, std::string_view file,
                  std::string_view image);
wire::Bytes extensions(std::string_view list, std::int32_t count);

/** A block of so many packed streams. */
wire::Bytes streams(const wire::Bytes& packed, std::int32_t count);

/** The answer with the values of a new record. */
wire::Bytes newMetadata(std::int32_t result, std::int32_t code);

} // namespace discoverer

/** A client process with any number of clients of the discoverer service. */
class DiscovererClient : public ServiceClient {
public:
    explicit DiscovererClient(long identity);

    void open(std::int32_t client, std::string_view file);

    /** Asks for a picture of 4 x 2 unless told otherwise. */
    void getImage(std::int32_t client, std::string_view image, std::string_view notice = "",
                  std::int64_t position = 0, std::int32_t width = 4, std::int32_t height = 2);
};
