// SPDX-License-Identifier: MIT
#include "pack/CPack_Simplebuffer.h"

#include "base/Ascii.h"
#include "base/Text.h"

#include <cstring>
#include <new>

namespace {

/** Apart from the common case, which it would slow down. */
[[gnu::noinline]] int packConverted(simplebuffer* buffer, const std::wstring& text) {
    try {
        return CPack_Simplebuffer().pack_simplebuffer_string(buffer, qns::narrow(text));
    } catch (const std::bad_alloc&) {
        return 0;
    }
}

} // namespace

int CPack_Simplebuffer::pack_simplebuffer_raw_header(simplebuffer* buffer, uint64_t length) {
    const uint32_t size = Encoding::sizeOfRawHeader(length);
    if (size == 0)
        return 0;
    return append(buffer, size, [=](uint8_t* to) { CPack().pack_raw_header(to, length); });
}

int CPack_Simplebuffer::pack_simplebuffer_raw(simplebuffer* buffer, const void* bytes,
                                              uint64_t length) {
    return appendRaw(buffer, length, [=](uint8_t* to) {
        if (length != 0)
            std::memcpy(to, bytes, length);
    });
}

int CPack_Simplebuffer::pack_simplebuffer_string(simplebuffer* buffer, const std::string& text) {
    return pack_simplebuffer_raw(buffer, text.c_str(), text.size() + 1);
}

// Most text is ASCII and needs neither a locale nor a temporary string.
int CPack_Simplebuffer::pack_simplebuffer_wstring(simplebuffer* buffer, const std::wstring& text) {
    const std::size_t ascii = qns::asciiPrefix(text.data(), text.size());
    if (text.c_str()[ascii] != L'\0')
        return packConverted(buffer, text);
    return appendRaw(buffer, ascii + 1, [&](uint8_t* to) {
        qns::copyAscii(text.data(), ascii, to);
        to[ascii] = 0;
    });
}
