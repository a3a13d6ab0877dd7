// SPDX-License-Identifier: MIT
#include "importer/Outlet.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <chrono>
#include <future>
#include <utility>
#include <vector>

#include "LibMediaPlayer/Result.h"

using namespace LibMediaPlayer;
using namespace std::chrono_literals;
using Clock = std::chrono::steady_clock;
using testing::ElementsAre;

namespace {

/** What a listener hears until the text "end". */
class Listener {
public:
    explicit Listener(importer::Outlet& outlet) {
        outlet.setFunction([this](MediaImporterNotify& notification) {
            if (std::exchange(mFirst, false)) {
                mReached.set_value();
                mGo.get_future().wait();
            }
            mTexts.push_back(notification.text);
            mTimes.push_back(Clock::now());
            if (notification.text == L"end")
                mEnd.set_value();
        });
    }

    /** Until the first notification is being delivered; it waits for go(). */
    void awaitFirst() { mReached.get_future().wait(); }
    std::vector<std::wstring> go() {
        mGo.set_value();
        mEnd.get_future().wait();
        return mTexts;
    }
    [[nodiscard]] const std::vector<Clock::time_point>& times() const { return mTimes; }

private:
    bool mFirst = true;
    std::promise<void> mReached;
    std::promise<void> mGo;
    std::promise<void> mEnd;
    std::vector<std::wstring> mTexts;
    std::vector<Clock::time_point> mTimes;
};

} // namespace

TEST(ImportOutlet, AListenerThatTakesItsTimeHearsAllAnswersButOnlyTheLatestNews) {
    importer::Outlet outlet(0us);
    Listener listener(outlet);
    outlet.tell(kImportStarted, kOk, L"a");
    listener.awaitFirst();
    outlet.tell(kImportProgress, kOk, L"a 1");
    outlet.tell(kImportProgress, kOk, L"a 2");
    outlet.tell(kImportFinished, kOk, L"a done");
    outlet.tell(kImportFinished, kCancelled, L"b done");
    outlet.tell(kImportStarted, kOk, L"c");
    outlet.tell(kImportStarted, kOk, L"d");
    outlet.tell(kImportProgress, kOk, L"d 1");
    outlet.tell(kImportFinished, kOk, L"end");
    EXPECT_THAT(listener.go(),
                ElementsAre(L"a", L"a 2", L"a done", L"b done", L"d", L"d 1", L"end"));
}

TEST(ImportOutlet, NothingIsSentOnTheHeelsOfAnother) {
    importer::Outlet outlet(5ms);
    Listener listener(outlet);
    for (const wchar_t* const text : {L"a", L"b", L"c", L"end"})
        outlet.tell(kImportFinished, kOk, text);
    listener.go();
    ASSERT_EQ(listener.times().size(), 4U);
    for (std::size_t index = 1; index < 4; ++index)
        EXPECT_GE(listener.times()[index] - listener.times()[index - 1], 5ms);
}
