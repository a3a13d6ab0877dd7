// SPDX-License-Identifier: MIT
#include "base/Text.h"

#include <atomic>
#include <clocale>
#include <cstdlib>
#include <gtest/gtest.h>
#include <langinfo.h>
#include <string>
#include <thread>
#include <vector>

using qns::narrow;
using qns::widen;

namespace {

constexpr const wchar_t* kWide = L"na\u00efve \u97f3\u697d \U0001F3B5";
constexpr const char* kNarrow = "na\xC3\xAFve \xE9\x9F\xB3\xE6\xA5\xBD \xF0\x9F\x8E\xB5";

/** Sets an environment variable, or removes it, for one scope. */
class Variable {
public:
    Variable(const char* name, const char* value) : mName(name) {
        if (const char* const before = std::getenv(name)) {
            mWasSet = true;
            mBefore = before;
        }
        set(value);
    }
    ~Variable() { set(mWasSet ? mBefore.c_str() : nullptr); }
    Variable(const Variable&) = delete;
    Variable& operator=(const Variable&) = delete;

    void set(const char* value) {
        if (value != nullptr)
            ::setenv(mName, value, 1);
        else
            ::unsetenv(mName);
    }

private:
    const char* mName;
    bool mWasSet = false;
    std::string mBefore;
};

std::string repeated(std::string_view part, int times) {
    std::string text;
    for (int i = 0; i < times; ++i)
        text += part;
    return text;
}

} // namespace

TEST(Text, ConvertsUtf8BothWays) {
    const Variable locale("LC_ALL", "C.UTF-8");
    EXPECT_EQ(narrow(kWide), kNarrow);
    EXPECT_EQ(widen(kNarrow), kWide);
}

TEST(Text, NarrowsTheFirstAndLastCharacterOfEachUtf8Length) {
    const Variable locale("LC_ALL", "C.UTF-8");
    EXPECT_EQ(narrow(L"\x01\x7F\x80"), "\x01\x7F\xC2\x80");
    EXPECT_EQ(narrow(L"\u07FF\u0800"), "\xDF\xBF\xE0\xA0\x80");
    EXPECT_EQ(narrow(L"\uD7FF\uE000"), "\xED\x9F\xBF\xEE\x80\x80");
    EXPECT_EQ(narrow(L"\uFFFF\U00010000"), "\xEF\xBF\xBF\xF0\x90\x80\x80");
    EXPECT_EQ(narrow(L"\U0010FFFF"), "\xF4\x8F\xBF\xBF");
}

/** All characters, and what lies between and behind them, just as the C library has it. */
TEST(Text, NarrowsEachCharacterAsTheCLibraryDoes) {
    const Variable locale("LC_ALL", "C.UTF-8");
    ASSERT_NE(std::setlocale(LC_ALL, ""), nullptr);
    for (unsigned character = 1; character < 0x120000; ++character) {
        const wchar_t text[] = {static_cast<wchar_t>(character), L'\0'};
        char expected[16]{};
        if (std::wcstombs(expected, text, sizeof expected) == static_cast<std::size_t>(-1))
            expected[0] = '\0';
        ASSERT_EQ(narrow(text), expected) << character;
    }
}

TEST(Text, ConvertsEveryLengthAroundTheBlocksOfTheFastPath) {
    const Variable locale("LC_ALL", "C.UTF-8");
    for (std::size_t length = 0; length < 70; ++length) {
        std::string bytes;
        std::wstring wide;
        for (std::size_t i = 0; i < length; ++i) {
            bytes += static_cast<char>('!' + i);
            wide += static_cast<wchar_t>(L'!' + i);
        }
        EXPECT_EQ(narrow(wide), bytes);
        EXPECT_EQ(widen(bytes), wide);
        EXPECT_EQ(narrow(wide + L"\u00e9!"), bytes + "\xC3\xA9!");
        EXPECT_EQ(widen(bytes + "\xC3\xA9!"), wide + L"\u00e9!");
    }
}

TEST(Text, StopsAtTheFirstNul) {
    const Variable locale("LC_ALL", "C.UTF-8");
    EXPECT_EQ(narrow({L"ab\0cd", 5}), "ab");
    EXPECT_EQ(widen({"ab\0cd", 5}), L"ab");
    EXPECT_EQ(narrow({L"\u00e9\0\u00e9", 3}), "\xC3\xA9");
    EXPECT_EQ(widen({"\xC3\xA9\0\xC3\xA9", 5}), L"\u00e9");
    EXPECT_EQ(narrow(std::wstring(40, L'\0')), "");
    EXPECT_EQ(widen(std::string(40, '\0')), L"");
}

TEST(Text, TheCLocaleStopsAtTheFirstCharacterThatIsNotAscii) {
    const Variable locale("LC_ALL", "C");
    EXPECT_EQ(narrow(kWide), "na");
    EXPECT_EQ(narrow(L"\u00e9"), "");
}

// What follows an unconvertible character is dropped, what precedes it is kept.
TEST(Text, KeepsWhatComesBeforeAnInvalidSequence) {
    const Variable locale("LC_ALL", "C.UTF-8");
    EXPECT_EQ(widen("\xC3\xA9q\xFFz"), L"\u00e9q");
    EXPECT_EQ(widen("abc\xC0\x80z"), L"abc");
    EXPECT_EQ(widen("\xED\xA0\x80"), L"");
    EXPECT_EQ(widen("\xC3\xA9\xE9\x9F"), L"\u00e9");
    EXPECT_EQ(widen("\x80"), L"");
}

TEST(Text, KeepsWhatComesBeforeALoneSurrogateOrAnImpossibleCharacter) {
    const Variable locale("LC_ALL", "C.UTF-8");
    const std::wstring surrogate(1, static_cast<wchar_t>(0xD800));
    const std::wstring impossible(1, static_cast<wchar_t>(0x80000000u));
    EXPECT_EQ(narrow(L"ab" + surrogate + L"c"), "ab");
    EXPECT_EQ(narrow(L"\u00e9b" + surrogate + L"c"), "\xC3\xA9"
                                                     "b");
    EXPECT_EQ(narrow(L"\u00e9b" + impossible + L"c"), "\xC3\xA9"
                                                      "b");
}

TEST(Text, ConvertsTextOfAHundredThousandCharacters) {
    const Variable locale("LC_ALL", "C.UTF-8");
    const std::string bytes = repeated("a\xE9\x9F\xB3\xF0\x9F\x8E\xB5z", 25000);
    const std::wstring wide = widen(bytes);
    EXPECT_EQ(wide.size(), 100000u);
    EXPECT_EQ(narrow(wide), bytes);
    EXPECT_EQ(narrow(std::wstring(100000, L'x')), std::string(100000, 'x'));
}

// The failing character falls on every place of the chunks in which text is converted.
TEST(Text, KeepsWhatComesBeforeAnInvalidCharacterWhereverItStands) {
    const Variable locale("LC_ALL", "C.UTF-8");
    for (std::size_t before = 500; before < 1100; ++before) {
        const std::wstring good(before, L'\u00e9');
        ASSERT_EQ(narrow(good + L'\xD800' + L"tail").size(), 2 * before);
        ASSERT_EQ(widen(repeated("\xC3\xA9", static_cast<int>(before)) + "\xFFtail"), good);
    }
}

TEST(Text, FollowsAChangeOfTheEnvironmentAtTheNextCall) {
    Variable locale("LC_ALL", "C");
    for (int round = 0; round < 3; ++round) {
        EXPECT_EQ(narrow(L"a\u00e9"), "a");
        locale.set("C.UTF-8");
        EXPECT_EQ(narrow(L"a\u00e9"), "a\xC3\xA9");
        EXPECT_EQ(widen("a\xC3\xA9"), L"a\u00e9");
        locale.set("C");
    }
}

TEST(Text, ReadsTheVariablesInTheirOrderOfPrecedence) {
    Variable all("LC_ALL", nullptr);
    Variable characters("LC_CTYPE", nullptr);
    Variable language("LANG", nullptr);
    EXPECT_EQ(narrow(L"\u00e9"), "");
    language.set("C.UTF-8");
    EXPECT_EQ(narrow(L"\u00e9"), "\xC3\xA9");
    characters.set("C");
    EXPECT_EQ(narrow(L"\u00e9"), "");
    all.set("C.UTF-8");
    EXPECT_EQ(narrow(L"\u00e9"), "\xC3\xA9");
}

// Neither the number of entries nor the last one tells this change.
TEST(Text, SeesAVariableThatTookThePlaceOfAnother) {
    const Variable all("LC_ALL", nullptr);
    const Variable characters("LC_CTYPE", nullptr);
    Variable language("LANG", nullptr);
    Variable first("QNS_TEXT_TEST_FIRST", "1");
    Variable last("QNS_TEXT_TEST_LAST", "1");
    EXPECT_EQ(narrow(L"\u00e9"), "");
    first.set(nullptr);
    last.set(nullptr);
    language.set("C.UTF-8");
    last.set("1");
    EXPECT_EQ(narrow(L"\u00e9"), "\xC3\xA9");
}

TEST(Text, ALocaleThatIsNotInstalledLeavesTheOneBefore) {
    Variable locale("LC_ALL", "C.UTF-8");
    EXPECT_EQ(narrow(L"\u00e9"), "\xC3\xA9");
    locale.set("xx_XX.unknown");
    EXPECT_EQ(narrow(L"\u00e9"), "\xC3\xA9");
}

TEST(Text, LeavesTheLocaleOfTheCallingThreadAsItWas) {
    const Variable locale("LC_ALL", "C.UTF-8");
    const locale_t own = ::newlocale(LC_ALL_MASK, "C", nullptr);
    const locale_t before = ::uselocale(own);
    EXPECT_EQ(narrow(L"\u00e9"), "\xC3\xA9");
    EXPECT_EQ(::uselocale(nullptr), own);
    ::uselocale(before);
    ::freelocale(own);
}

TEST(TextDeathTest, TheFirstConversionSetsTheProcessLocaleAndLaterOnesDoNot) {
    ::testing::FLAGS_gtest_death_test_style = "threadsafe";
    const auto body = [] {
        Variable locale("LC_ALL", "C.UTF-8");
        const std::string before = std::setlocale(LC_ALL, nullptr);
        narrow(L"text");
        const std::string first = std::setlocale(LC_ALL, nullptr);
        locale.set("C");
        narrow(L"\u00e9");
        const std::string later = std::setlocale(LC_ALL, nullptr);
        std::_Exit(before == "C" && first == "C.UTF-8" && later == "C.UTF-8" ? 0 : 1);
    };
    EXPECT_EXIT(body(), ::testing::ExitedWithCode(0), "");
}

TEST(Text, EightThreadsConvertAtOnceWhileTheLocaleIsFirstLoaded) {
    for (const char* name : {"C.UTF-8", "C", "C.UTF-8"}) {
        const Variable locale("LC_ALL", name);
        const std::string expected = std::string(name) == "C" ? "na" : kNarrow;
        std::atomic<int> wrong{0};
        std::vector<std::thread> threads;
        for (int i = 0; i < 8; ++i)
            threads.emplace_back([&] {
                for (int round = 0; round < 500; ++round)
                    wrong += narrow(kWide) != expected;
            });
        for (std::thread& thread : threads)
            thread.join();
        EXPECT_EQ(wrong, 0);
    }
}
