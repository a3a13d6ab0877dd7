// SPDX-License-Identifier: MIT
#include "pack/CPack_Simplebuffer.h"

#include "base/Ascii.h"
#include "base/Text.h"

#include <cstring>
#include <new>

namespace {

/**
 * Most text is ASCII and most buffers have room: such text goes straight there, with neither a
 * locale nor a temporary string. Anything else changes nothing and returns false.
 */
bool packAsciiInPlace(simplebuffer* buffer, const std::wstring& text) {
    const uint64_t length = text.size() + 1;
    const uint64_t header = qns::Encoding::sizeOfRawHeader(length);
    if (header == 0 || buffer->alloc < buffer->size ||
        buffer->alloc - buffer->size < header + length)
        return false;
    uint8_t* const start = buffer->data + buffer->size;
    if (qns::copyAsciiPrefix(text.data(), text.size(), start + header) != text.size())
        return false;
    CPack().pack_raw_header(start, length);
    start[header + text.size()] = 0;
    buffer->size += header + length;
    return true;
}

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

int CPack_Simplebuffer::pack_simplebuffer_wstring(simplebuffer* buffer, const std::wstring& text) {
    return packAsciiInPlace(buffer, text) ? 1 : packConverted(buffer, text);
}
