// SPDX-License-Identifier: MIT
#include "tests/daemon/support/ImporterClient.h"

using wire::Bytes;

Bytes importer::status(std::int32_t code, std::int64_t done, std::int64_t total) {
    return wire::int32(code) + wire::int32(0) + wire::int64(done) + wire::int64(total);
}

Bytes importer::notification(std::int64_t kind, std::int32_t result, std::string_view text,
                             const File& file) {
    Bytes arguments = wire::integer(kind) + wire::int32(result) + wire::text(text) +
                      wire::text(file.video) + wire::text(file.audio);
    for (const auto value : file.values)
        arguments += wire::int32(value);
    return arguments;
}

ImporterClient::ImporterClient(long identity)
    : ServiceClient(identity, {56, importer::kRegister, importer::kUnregister}) {}

void ImporterClient::registerNotify(long object, std::int32_t client) {
    request(importer::kRegisterNotify,
            wire::integer(object) + wire::integer(identity()) + wire::integer(client));
}

void ImporterClient::import(std::int32_t client, std::string_view file, std::string_view folder) {
    request(importer::kImport, wire::integer(client) + wire::text(file) + wire::text(folder));
}

void ImporterClient::expectNotification(long object, const Bytes& arguments) {
    expectCallBack(object, importer::kNotify, arguments);
}
