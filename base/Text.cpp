// SPDX-License-Identifier: MIT
#include "base/Text.h"

#include "base/Ascii.h"

#include <array>
#include <atomic>
#include <clocale>
#include <cstring>
#include <cwchar>
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
    auto next = std::make_unique<LocaleSnapshot>(
        LocaleSnapshot{Environment(::environ), loadLocale(previous),
                       std::unique_ptr<const LocaleSnapshot>(previous)});
    gCurrent.store(next.get(), std::memory_order_release);
    return next.release();
}

locale_t environmentLocale() {
    const LocaleSnapshot* current = gCurrent.load(std::memory_order_acquire);
    if (current == nullptr || !current->environment.is(::environ))
        current = rebuild();
    return current->locale;
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

template<class To, class From>
std::basic_string<To> converted(std::basic_string_view<From> text) {
    adoptEnvironmentLocale();
    const std::size_t ascii = asciiPrefix(text.data(), text.size());
    std::basic_string<To> out(ascii, To{});
    copyAscii(text.data(), ascii, out.data());
    if (ascii == text.size() || text[ascii] == From{})
        return out;
    text.remove_prefix(ascii);
    const ThreadLocale use(environmentLocale());
    appendConverted(out, text.substr(0, text.find(From{})));
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
