// SPDX-License-Identifier: MIT
#include "text/Text.h"

#include <algorithm>
#include <climits>
#include <clocale>
#include <cwchar>
#include <locale.h>
#include <optional>

namespace engine {

namespace {

/** Makes the environment's character set this thread's while it lives. */
class EnvironmentLocale {
public:
    EnvironmentLocale() : mLocale(newlocale(LC_CTYPE_MASK, "", nullptr)) {
        if (mLocale)
            mPrevious = uselocale(mLocale);
    }
    ~EnvironmentLocale() {
        if (mLocale) {
            uselocale(mPrevious);
            freelocale(mLocale);
        }
    }
    EnvironmentLocale(const EnvironmentLocale&) = delete;
    EnvironmentLocale& operator=(const EnvironmentLocale&) = delete;

private:
    locale_t mLocale;
    locale_t mPrevious = nullptr;
};

std::optional<std::string> inEnvironmentCharset(std::wstring_view text) {
    const EnvironmentLocale locale;
    std::string bytes;
    std::mbstate_t state{};
    char character[MB_LEN_MAX];
    for (const wchar_t wide : text) {
        const std::size_t size = std::wcrtomb(character, wide, &state);
        if (size == static_cast<std::size_t>(-1))
            return std::nullopt;
        bytes.append(character, size);
    }
    return bytes;
}

/** Every locale's character set keeps ASCII, and to ask for the locale takes longer than a look. */
bool isAscii(std::wstring_view text) {
    return std::all_of(text.begin(), text.end(), [](char32_t wide) { return wide < 0x80; });
}

void appendUtf8(std::string& bytes, char32_t code) {
    const auto trail = [&](int shift) {
        bytes += static_cast<char>(0x80 | ((code >> shift) & 0x3f));
    };
    if (code < 0x80) {
        bytes += static_cast<char>(code);
    } else if (code < 0x800) {
        bytes += static_cast<char>(0xc0 | (code >> 6));
        trail(0);
    } else if (code < 0x10000) {
        bytes += static_cast<char>(0xe0 | (code >> 12));
        trail(6);
        trail(0);
    } else {
        bytes += static_cast<char>(0xf0 | ((code >> 18) & 0x07));
        trail(12);
        trail(6);
        trail(0);
    }
}

constexpr wchar_t kLastCharacter = 0x10ffff; // the C library's UTF-8 goes beyond

std::optional<std::wstring> fromEnvironmentCharset(std::string_view bytes) {
    const EnvironmentLocale locale;
    std::wstring text;
    std::mbstate_t state{};
    while (!bytes.empty()) {
        wchar_t wide = 0;
        const std::size_t size = std::mbrtowc(&wide, bytes.data(), bytes.size(), &state);
        if (size > bytes.size() || wide > kLastCharacter)
            return std::nullopt;
        text += wide;
        bytes.remove_prefix(std::max<std::size_t>(size, 1));
    }
    return text;
}

constexpr wchar_t kReplacement = 0xfffd;

/** How many bytes the character has that begins so; 0 when none does. */
std::size_t utf8Length(unsigned char first) {
    if (first < 0x80)
        return 1;
    if (first < 0xc2 || first > 0xf4)
        return 0;
    return first < 0xe0 ? 2 : first < 0xf0 ? 3 : 4;
}

/** False for what is no character, or has a shorter form. */
bool isCharacter(char32_t code, std::size_t length) {
    constexpr char32_t kSmallest[] = {0, 0x80, 0x800, 0x10000};
    return code >= kSmallest[length - 1] && code <= kLastCharacter &&
           (code < 0xd800 || code > 0xdfff);
}

/** Takes one character off the front. */
wchar_t takeUtf8(std::string_view& bytes) {
    const std::size_t length = utf8Length(static_cast<unsigned char>(bytes.front()));
    if (length == 0 || length > bytes.size()) {
        bytes.remove_prefix(1);
        return kReplacement;
    }
    constexpr unsigned int kFirstBits[] = {0x7f, 0x1f, 0x0f, 0x07};
    char32_t code = static_cast<unsigned char>(bytes.front()) & kFirstBits[length - 1];
    for (std::size_t index = 1; index < length; ++index) {
        const auto trail = static_cast<unsigned char>(bytes[index]);
        if ((trail & 0xc0) != 0x80) {
            bytes.remove_prefix(index);
            return kReplacement;
        }
        code = (code << 6) | (trail & 0x3f);
    }
    bytes.remove_prefix(length);
    return isCharacter(code, length) ? static_cast<wchar_t>(code) : kReplacement;
}

} // namespace

std::string toBytes(std::wstring_view text) {
    if (isAscii(text))
        return {text.begin(), text.end()};
    if (auto bytes = inEnvironmentCharset(text))
        return *std::move(bytes);
    return toUtf8(text);
}

std::wstring toWide(std::string_view bytes) {
    if (auto text = fromEnvironmentCharset(bytes))
        return *std::move(text);
    return fromUtf8(bytes);
}

std::wstring fromUtf8(std::string_view bytes) {
    std::wstring text;
    while (!bytes.empty())
        text += takeUtf8(bytes);
    return text;
}

std::string toUtf8(std::wstring_view text) {
    std::string bytes;
    for (const wchar_t wide : text)
        appendUtf8(bytes, static_cast<char32_t>(wide));
    return bytes;
}

} // namespace engine
