// SPDX-License-Identifier: MIT
#include "tests/daemon/support/DiscovererClient.h"

using wire::Bytes;

Bytes discoverer::image(std::int32_t result, std::int32_t code, std::string_view file,
                        std::string_view image) {
    return wire::int32(result) + wire::int32(code) + wire::text(file) + wire::text(image);
}

Bytes discoverer::extensions(std::string_view list, std::int32_t count) {
    return wire::text(list) + wire::int32(0) + wire::int32(count);
}

Bytes discoverer::streams(const Bytes& packed, std::int32_t count) {
    return wire::raw(packed) + wire::int32(static_cast<std::int32_t>(packed.size())) +
           wire::int32(count);
}

Bytes discoverer::newMetadata(std::int32_t result, std::int32_t code) {
    return wire::int32(result) + wire::int32(code) + wire::text("") + wire::text("") +
           wire::integer(0) + wire::integer(0) + wire::int64(0) + streams("", 0) + streams("", 0);
}

DiscovererClient::DiscovererClient(long identity)
    : ServiceClient(identity, {51, discoverer::kRegister, discoverer::kUnregister}) {}

void DiscovererClient::open(std::int32_t client, std::string_view file) {
    request(discoverer::kOpen, wire::integer(client) + wire::text(file));
}

void DiscovererClient::getImage(std::int32_t client, std::string_view image,
                                std::string_view notice, std::int64_t position, std::int32_t width,
                                std::int32_t height) {
    request(discoverer::kGetImage, wire::integer(client) + wire::integer(width) +
                                       wire::integer(height) + wire::integer(position) +
                                       wire::text(image) + wire::text(notice));
}
