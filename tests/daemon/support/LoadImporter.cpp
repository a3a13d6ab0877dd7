// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "tests/daemon/support/ImporterClient.h"
#include "tests/daemon/support/LoadParts.h"

namespace load {

namespace {

constexpr long kMostStatesOwed = 16;
constexpr std::int32_t kIdle = 0;
constexpr std::int32_t kCancelling = 2;

} // namespace

void ImporterPart::registerAll() {
    mId = mLink.registerCallBack(kImporterService);
    mLink.registerNotify(kImporterService, mId);
}

void ImporterPart::ask() {
    const auto number = mLink.below(100);
    if (number < 20)
        mLink.askFor(kImporterService, importer::kInitialize, id(), importer::kInitializeCallBack,
                     0);
    else if (number < 90)
        askForState();
    else if (number < 97)
        import();
    else
        cancel();
}

void ImporterPart::cancel() {
    mLink.askFor(kImporterService, importer::kCancel, id(), importer::kCancelCallBack, 0);
}

void ImporterPart::import() {
    const bool copies = mLink.happens(50);
    mLink.askFor(kImporterService, importer::kImport,
                 id() + wire::text(copies ? mBoard.sound : mBoard.film) +
                     wire::text(copies ? "Sounds" : ""),
                 importer::kImportCallBack, 0);
}

void ImporterPart::askForState() {
    if (mBoard.importerStatesOwed >= kMostStatesOwed)
        return;
    ++mBoard.importerStatesOwed;
    mLink.ask(kImporterService, importer::kGetStatus, id());
}

bool ImporterPart::take(const wire::Packet& packet) {
    if (packet.object == mLink.notification(kImporterService, {}).object) {
        mNotifications.take(packet);
        return true;
    }
    if (packet.object != mLink.answer(kImporterService, 0, {}).object ||
        packet.method != importer::kStatusCallBack)
        return false;
    const auto code = wire::readInt32(packet.payload.substr(0, 5));
    EXPECT_TRUE(code >= kIdle && code <= kCancelling) << code;
    mIdle = code == kIdle;
    EXPECT_GE(--mBoard.importerStatesOwed, 0);
    return true;
}

} // namespace load
