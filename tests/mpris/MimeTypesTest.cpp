// SPDX-License-Identifier: MIT
#include "mpris/MimeTypes.h"

#include <gmock/gmock.h>

using testing::ElementsAre;
using testing::IsEmpty;

namespace {

TEST(MimeTypes, AreTheOnesOfTheEndings) {
    EXPECT_THAT(mpris::mimeTypesOf({"mkv", "mp3"}), ElementsAre("video/x-matroska", "audio/mpeg"));
}

TEST(MimeTypes, AreToldOnce) {
    EXPECT_THAT(mpris::mimeTypesOf({"jpeg", "jpg", "m4v", "mp4"}),
                ElementsAre("image/jpeg", "video/mp4"));
}

TEST(MimeTypes, LeaveOutWhatIsNotKnown) {
    EXPECT_THAT(mpris::mimeTypesOf({"", "nothing"}), IsEmpty());
    EXPECT_THAT(mpris::mimeTypesOf({}), IsEmpty());
}

} // namespace
