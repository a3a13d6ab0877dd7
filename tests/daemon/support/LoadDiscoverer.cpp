// SPDX-License-Identifier: MIT
#include <gtest/gtest.h>

#include "tests/daemon/support/DiscovererClient.h"
#include "tests/daemon/support/LoadParts.h"

namespace load {

namespace {

constexpr std::int64_t kSecond = 1'000'000'000;
constexpr std::int32_t kIsOpen = 5; ///< why an open is refused

} // namespace

void DiscovererPart::registerAll() {
    mId = mLink.registerCallBack(kDiscovererService);
    mLink.askFor(kDiscovererService, discoverer::kInitialize, id(), discoverer::kInitializeCallBack,
                 0);
}

void DiscovererPart::learn() {
    const auto answerTo = [this](long method, const wire::Bytes& arguments) {
        mLink.request(kDiscovererService, method, arguments);
        const auto packet = mLink.receive();
        return packet ? packet->payload : wire::Bytes();
    };
    EXPECT_EQ(answerTo(discoverer::kOpen, id() + wire::text(mBoard.film)), wire::int32(0));
    mBoard.metadata = answerTo(discoverer::kGetMetadata, id());
    EXPECT_EQ(answerTo(discoverer::kClose, id()), wire::int32(0));
    mBoard.extensions = answerTo(discoverer::kGetExtensions, id());
}

void DiscovererPart::ask() {
    if (isWaiting())
        return;
    const auto number = mLink.below(100);
    if (!mOpen || number < 5)
        open();
    else if (number < 55)
        askFor(discoverer::kGetMetadata, id(), discoverer::kMetadataCallBack, mBoard.metadata);
    else if (number < 75)
        askForImage();
    else if (number < 90)
        askForExtensions();
    else
        close();
}

void DiscovererPart::open() {
    const auto arguments = id() + wire::text(mBoard.film);
    if (mOpen)
        mLink.askFor(kDiscovererService, discoverer::kOpen, arguments, discoverer::kOpenCallBack,
                     kIsOpen);
    else
        askFor(discoverer::kOpen, arguments, discoverer::kOpenCallBack, wire::int32(0));
    mOpen = true;
}

/** Only what is answered behind it tells that the file is closed. */
void DiscovererPart::close() {
    mLink.askFor(kDiscovererService, discoverer::kClose, id(), discoverer::kCloseCallBack, 0);
    mOpen = false;
    askForExtensions();
}

void DiscovererPart::askForImage() {
    const auto image = mBoard.folder + '/' + std::to_string(mLink.identity()) + ".png";
    askFor(discoverer::kGetImage,
           id() + wire::integer(16 + mLink.below(48)) + wire::integer(0) +
               wire::integer(mLink.below(9) * kSecond) + wire::text(image) + wire::text(""),
           discoverer::kImageCallBack, discoverer::image(0, 0, mBoard.film, image));
}

void DiscovererPart::askForExtensions() {
    askFor(discoverer::kGetExtensions, id(), discoverer::kExtensionsCallBack, mBoard.extensions);
}

void DiscovererPart::askFor(long method, const wire::Bytes& arguments, long answerMethod,
                            const wire::Bytes& answer) {
    mLink.ask(kDiscovererService, method, arguments);
    mAwaited = answerMethod;
    mAnswer = answer;
}

bool DiscovererPart::take(const wire::Packet& packet) {
    const auto expected = mLink.answer(kDiscovererService, mAwaited, mAnswer);
    if (!isWaiting() || packet.object != expected.object || packet.method != mAwaited)
        return false;
    // A refused open is answered like one that is not, but no open is awaited then.
    EXPECT_EQ(packet, expected);
    mAwaited = 0;
    return true;
}

} // namespace load
