// SPDX-License-Identifier: MIT
#include "worker/Message.h"

#include <gtest/gtest.h>

#include "worker/Request.h"

using namespace worker;

namespace {

template<typename Record>
std::string written(Record record) {
    MessageWriter message;
    message(record);
    return message.bytes();
}

template<typename Record>
bool isRead(std::string_view bytes) {
    MessageReader message(bytes);
    Record record;
    message(record);
    return message.isGood();
}

discoverer::Details someDetails() {
    discoverer::Details details;
    details.hasPicture = true;
    details.info.system = {"video/mp4", L"TITLE=\x4e16\x754c", true, false, 123};
    details.info.videoCount = 1;
    details.info.video.description = L"H.264";
    details.info.video.pixelAspectNumerator = 16;
    details.info.audioCount = 2;
    details.info.audio[1] = {"audio/mpeg", L"MP3", 2, 44100, 16, 128000, 320000};
    return details;
}

Looked someLook() {
    Looked looked;
    looked.isDecided = true;
    looked.look.container = "mov";
    looked.look.duration = {std::chrono::nanoseconds(5), true};
    looked.look.video = probe::MediaLook::Video{"h264", 192, 108, 25.0};
    return looked;
}

/** A record in the form in which it arrives is the same, and nothing shorter is taken for it. */
template<typename Record>
void expectWholeOrNothing(const Record& record) {
    const std::string bytes = written(record);
    MessageReader message(bytes);
    Record copy;
    message(copy);
    EXPECT_TRUE(message.isGood());
    EXPECT_EQ(written(copy), bytes);
    for (std::size_t size = 0; size < bytes.size(); ++size)
        EXPECT_FALSE(isRead<Record>(std::string_view(bytes).substr(0, size))) << size;
}

} // namespace

TEST(WorkerMessage, BringsEveryRecordAsItWas) {
    expectWholeOrNothing(someDetails());
    expectWholeOrNothing(someLook());
    expectWholeOrNothing(Looked());
    expectWholeOrNothing(Demuxers{"mov,mp4"});
    expectWholeOrNothing(discoverer::Thumbnail{0, std::string("\xff\0\xd8", 3)});
    expectWholeOrNothing(Request{Kind::kDraw, {-1, 10, 20, discoverer::ImageForm::kJpeg}});
}

TEST(WorkerMessage, KeepsOptionalRecordsApart) {
    const std::string bytes = written(someLook());
    MessageReader message(bytes);
    Looked looked;
    looked.look.audio = probe::MediaLook::Audio{"old"};
    message(looked);
    EXPECT_EQ(looked.look.video.value().width, 192);
    EXPECT_FALSE(looked.look.audio);
}

TEST(WorkerMessage, RefusesLengthsBeyondItsEnd) {
    for (const std::uint32_t length : {4U, 0x40000000U, 0xffffffffU}) {
        std::uint32_t copy = length;
        MessageWriter message;
        message(copy);
        EXPECT_FALSE(isRead<std::wstring>(message.bytes() + "abc")) << length;
        EXPECT_FALSE(isRead<std::string>(message.bytes() + "abc")) << length;
    }
}

TEST(WorkerMessage, RefusesWhatIsNoCharacter) {
    EXPECT_TRUE(isRead<std::wstring>(written(std::wstring(1, static_cast<wchar_t>(0x10ffff)))));
    EXPECT_FALSE(isRead<std::wstring>(written(std::wstring(1, static_cast<wchar_t>(0x110000)))));
    EXPECT_FALSE(isRead<std::wstring>(written(std::wstring(1, static_cast<wchar_t>(-1)))));
}
