// SPDX-License-Identifier: MIT
#include "tests/daemon/support/MediaClient.h"

#include <gtest/gtest.h>

#include "tests/daemon/support/DiscovererClient.h"
#include "tests/daemon/support/ImporterClient.h"
#include "tests/daemon/support/ItemReader.h"
#include "tests/daemon/support/PlayerClient.h"

namespace {

constexpr std::int64_t kOpened = 1;
constexpr std::int64_t kImported = 2;

} // namespace

MediaClient::MediaClient(long identity) : mLife(identity) {
    const auto player = mLife.registerCallBack(kPlayerService);
    mLife.registerNotify(kPlayerService, player);
    const auto importer = mLife.registerCallBack(kImporterService);
    mLife.registerNotify(kImporterService, importer);
    mPlayer = wire::integer(player);
    mImporter = wire::integer(importer);
    mDiscoverer = wire::integer(mLife.registerCallBack(kDiscovererService));
}

std::int64_t MediaClient::play(const std::string& film) {
    mLife.request(kPlayerService, request::kOpenPlayer, mPlayer + wire::text(film));
    const auto result = awaitResult(kPlayerService, kOpened);
    mLife.request(kPlayerService, request::kPlay, mPlayer);
    awaitPayload(mLife.answer(kPlayerService, callback::kPlay, {}));
    return result;
}

std::int64_t MediaClient::import(const std::string& file, const std::string& folder) {
    // A notification that comes twice is over with the status.
    mLife.request(kImporterService, importer::kGetStatus, mImporter);
    awaitPayload(mLife.answer(kImporterService, importer::kStatusCallBack, {}));
    mLife.request(kImporterService, importer::kImport,
                  mImporter + wire::text(file) + wire::text(folder));
    return awaitResult(kImporterService, kImported);
}

std::int64_t MediaClient::open(const std::string& film) {
    mLife.request(kDiscovererService, discoverer::kClose, mDiscoverer);
    // What is answered behind it tells that the file before is closed.
    mLife.request(kDiscovererService, discoverer::kGetExtensions, mDiscoverer);
    awaitPayload(mLife.answer(kDiscovererService, discoverer::kExtensionsCallBack, {}));
    mLife.request(kDiscovererService, discoverer::kOpen, mDiscoverer + wire::text(film));
    return wire::readInt32(
        awaitPayload(mLife.answer(kDiscovererService, discoverer::kOpenCallBack, {})));
}

std::int64_t MediaClient::describe(const std::string& film) {
    if (const auto opened = open(film))
        return opened;
    mLife.request(kDiscovererService, discoverer::kGetMetadata, mDiscoverer);
    ItemReader items(
        awaitPayload(mLife.answer(kDiscovererService, discoverer::kMetadataCallBack, {})));
    const auto failed = items.integer();
    const auto result = items.integer();
    EXPECT_EQ(failed != 0, result != 0);
    return result;
}

std::int64_t MediaClient::draw(const std::string& film, const std::string& picture) {
    if (const auto opened = open(film))
        return opened;
    mLife.request(kDiscovererService, discoverer::kGetImage,
                  mDiscoverer + wire::integer(64) + wire::integer(0) + wire::integer(0) +
                      wire::text(picture) + wire::text(""));
    ItemReader items(
        awaitPayload(mLife.answer(kDiscovererService, discoverer::kImageCallBack, {})));
    const auto failed = items.integer();
    const auto result = items.integer();
    EXPECT_EQ(failed != 0, result != 0);
    return result;
}

wire::Bytes MediaClient::awaitPayload(const wire::Packet& like) {
    while (auto packet = mLife.receive())
        if (packet->object == like.object && packet->method == like.method)
            return packet->payload;
    ADD_FAILURE() << "Not told";
    return wire::int32(-1) + wire::int32(-1);
}

std::int64_t MediaClient::awaitResult(const WireService& service, std::int64_t kind) {
    for (;;) {
        ItemReader items(awaitPayload(mLife.notification(service, {})));
        const auto told = items.integer();
        const auto result = items.integer();
        if (told == kind || testing::Test::HasFailure())
            return result;
    }
}
