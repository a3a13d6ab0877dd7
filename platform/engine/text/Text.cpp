// SPDX-License-Identifier: MIT
#include "text/Text.h"

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

std::string inUtf8(std::wstring_view text) {
    std::string bytes;
    for (const wchar_t wide : text)
        appendUtf8(bytes, static_cast<char32_t>(wide));
    return bytes;
}

} // namespace

std::string toBytes(std::wstring_view text) {
    if (auto bytes = inEnvironmentCharset(text))
        return *std::move(bytes);
    return inUtf8(text);
}

} // namespace engine
