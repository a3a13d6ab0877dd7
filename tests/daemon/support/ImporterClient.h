// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstdint>
#include <string_view>

#include "tests/daemon/support/ServiceClient.h"

/** Method ids of the importer's requests and callbacks, and what stands in what it sends. */
namespace importer {

constexpr long kInitialize = 1;
constexpr long kImport = 2;
constexpr long kCancel = 3;
constexpr long kGetStatus = 4;
constexpr long kUnregister = 5;
constexpr long kUnregisterNotify = 6;
constexpr long kRegister = 7;
constexpr long kRegisterNotify = 8;

constexpr long kInitializeCallBack = 2;
constexpr long kImportCallBack = 3;
constexpr long kCancelCallBack = 4;
constexpr long kStatusCallBack = 5;

constexpr long kNotify = 1;

/** What a notification says of the file that was asked for last; all zero before the first. */
struct File {
    std::string_view video;
    std::string_view audio;
    std::array<std::int32_t, 5> values{};
};

/** Of a file of which the engine tells nothing: even so its frame rate is a fraction. */
constexpr File kNothingKnown{"", "", {0, 0, 0, 1, 0}};

wire::Bytes status(std::int32_t code, std::int64_t done, std::int64_t total);
wire::Bytes notification(std::int64_t kind, std::int32_t result, std::string_view text,
                         const File& file = {});

} // namespace importer

/** A client process with any number of clients of the importer service. */
class ImporterClient : public ServiceClient {
public:
    explicit ImporterClient(long identity);

    /** Registers a notify object for a client's id. There is no answer. */
    void registerNotify(long object, std::int32_t client);

    void import(std::int32_t client, std::string_view file, std::string_view folder = "");

    /** The next packet must be this notification to the object. */
    void expectNotification(long object, const wire::Bytes& arguments);
};
