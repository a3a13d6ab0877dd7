// SPDX-License-Identifier: MIT
#include "base/Text.h"

#include "base/Ascii.h"

#include <array>
#include <atomic>
#include <clocale>
#include <cstring>
#include <cwchar>
#include <langinfo.h>
#include <locale.h>
#include <memory>
#include <mutex>
#include <unistd.h>
#include <vector>

namespace qns {
namespace {

/**
 * The environment as it was when its locale was loaded. The C library replaces an entry's string
 * when setenv(3) changes it, so comparing pointers finds every change.
 */
class Environment {
public:
    explicit Environment(char** entries) {
        for (; entries != nullptr && *entries != nullptr; ++entries)
            mEntries.push_back(*entries);
    }

    /** Stops at the first difference, so it never reads past the end of a shorter list. */
    [[nodiscard]] bool is(char** entries) const {
        if (entries == nullptr)
            return mEntries.empty();
        for (const char* entry : mEntries)
            if (*entries++ != entry)
                return false;
        return *entries == nullptr;
    }

private:
    std::vector<const char*> mEntries;
};

/** Immutable once published. Older ones stay: another thread may be converting with them. */
struct LocaleSnapshot {
    Environment environment;
    locale_t locale;
    bool isUtf8;
    std::unique_ptr<const LocaleSnapshot> previous;
};

std::atomic<const LocaleSnapshot*> gCurrent{nullptr};
std::mutex gRebuild;

/** As setlocale does: a locale that is not installed leaves the one before in effect. */
locale_t loadLocale(const LocaleSnapshot* previous) {
    if (const locale_t locale = ::newlocale(LC_ALL_MASK, "", nullptr))
        return locale;
    return previous != nullptr ? previous->locale : ::newlocale(LC_ALL_MASK, "C", nullptr);
}

const LocaleSnapshot* rebuild() {
    const std::lock_guard lock(gRebuild);
    const LocaleSnapshot* previous = gCurrent.load(std::memory_order_acquire);
    if (previous != nullptr && previous->environment.is(::environ))
        return previous;
    const locale_t locale = loadLocale(previous);
    auto next = std::make_unique<LocaleSnapshot>(LocaleSnapshot{
        Environment(::environ), locale, std::strcmp(::nl_langinfo_l(CODESET, locale), "UTF-8") == 0,
        std::unique_ptr<const LocaleSnapshot>(previous)});
    gCurrent.store(next.get(), std::memory_order_release);
    return next.release();
}

const LocaleSnapshot& environmentLocale() {
    const LocaleSnapshot* current = gCurrent.load(std::memory_order_acquire);
    if (current == nullptr || !current->environment.is(::environ))
        current = rebuild();
    return *current;
}

/** The process's own locale is the environment's from the first conversion on. */
void adoptEnvironmentLocale() {
    [[maybe_unused]] static const char* const name = std::setlocale(LC_ALL, "");
}

class ThreadLocale {
public:
    explicit ThreadLocale(locale_t locale) : mPrevious(::uselocale(locale)) {}
    ~ThreadLocale() { ::uselocale(mPrevious); }
    ThreadLocale(const ThreadLocale&) = delete;
    ThreadLocale& operator=(const ThreadLocale&) = delete;

private:
    locale_t mPrevious;
};

std::size_t convert(char* to, const wchar_t** from, std::size_t count, std::size_t room,
                    std::mbstate_t* state) {
    return ::wcsnrtombs(to, from, count, room, state);
}

std::size_t convert(wchar_t* to, const char** from, std::size_t count, std::size_t room,
                    std::mbstate_t* state) {
    return ::mbsnrtowcs(to, from, count, room, state);
}

/**
 * Appends what `from` converts to. When a character does not convert the C library tells where
 * it stands but not how much it wrote before it, so the part before it is converted once more.
 */
template<class From, class To>
void appendConverted(std::basic_string<To>& out, std::basic_string_view<From> from) {
    constexpr auto kFailed = static_cast<std::size_t>(-1);
    std::array<To, 1024> chunk;
    std::mbstate_t state{};
    const From* at = from.data();
    const From* const end = at + from.size();
    while (at != nullptr && at < end) {
        const From* const start = at;
        const std::mbstate_t before = state;
        std::size_t written =
            convert(chunk.data(), &at, static_cast<std::size_t>(end - at), chunk.size(), &state);
        const bool failed = written == kFailed;
        if (failed) {
            const auto good = static_cast<std::size_t>(at - start);
            at = start;
            state = before;
            written = good == 0 ? 0 : convert(chunk.data(), &at, good, chunk.size(), &state);
        }
        if (written != kFailed)
            out.append(chunk.data(), written);
        if (failed || at == start)
            return;
    }
}

char* encodeUtf8(char32_t character, char* to) {
    const auto put = [&to](char32_t byte) { *to++ = static_cast<char>(byte); };
    if (character < 0x80) {
        put(character);
        return to;
    }
    if (character < 0x800) {
        put(0xC0 | character >> 6);
    } else {
        if (character < 0x10000) {
            put(0xE0 | character >> 12);
        } else {
            put(0xF0 | character >> 18);
            put(0x80 | (character >> 12 & 0x3F));
        }
        put(0x80 | (character >> 6 & 0x3F));
    }
    put(0x80 | (character & 0x3F));
    return to;
}

bool isUnicode(char32_t character) {
    return character < 0xD800 || (character > 0xDFFF && character <= 0x10FFFF);
}

/**
 * Converts what needs no C library: the common case, in a third of its time. Takes it from `text`,
 * and leaves what begins with a character that is none in Unicode.
 */
void appendUtf8(std::string& out, std::wstring_view& text) {
    constexpr std::size_t kLongest = 4;
    std::array<char, 1024> chunk;
    char* to = chunk.data();
    std::size_t at = 0;
    for (; at < text.size() && isUnicode(static_cast<char32_t>(text[at])); ++at) {
        if (to > chunk.data() + chunk.size() - kLongest) {
            out.append(chunk.data(), to);
            to = chunk.data();
        }
        to = encodeUtf8(static_cast<char32_t>(text[at]), to);
    }
    out.append(chunk.data(), to);
    text.remove_prefix(at);
}

/** The C library reads UTF-8 well enough. */
void appendUtf8(std::wstring&, std::string_view&) {}

template<class To, class From>
void appendOthers(std::basic_string<To>& out, std::basic_string_view<From> text) {
    const LocaleSnapshot& environment = environmentLocale();
    if (environment.isUtf8)
        appendUtf8(out, text);
    if (text.empty())
        return;
    const ThreadLocale use(environment.locale);
    appendConverted(out, text);
}

template<class To, class From>
std::basic_string<To> converted(std::basic_string_view<From> text) {
    adoptEnvironmentLocale();
    std::basic_string<To> out(text.size(), To{});
    const std::size_t ascii = copyAsciiPrefix(text.data(), text.size(), out.data());
    out.resize(ascii);
    text.remove_prefix(ascii);
    text = text.substr(0, text.find(From{}));
    if (!text.empty())
        appendOthers(out, text);
    return out;
}

} // namespace

std::string narrow(std::wstring_view text) {
    return converted<char>(text);
}

std::wstring widen(std::string_view text) {
    return converted<wchar_t>(text);
}

} // namespace qns
