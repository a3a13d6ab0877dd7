// SPDX-License-Identifier: MIT
#pragma once

#include "pack/CPack_Simplebuffer.h"
#include "pack/CSimpleBuffer.h"

#include <cstdint>
#include <string>
#include <utility>

/**
 * Builds one argument block and owns its memory:
 *
 *     PackedArguments arguments;
 *     arguments.int32(result).text(path);
 *     invokeMethod(method, arguments.data(), arguments.size());
 *
 * A value for which there is no memory is left out. For one thread.
 */
class PackedArguments {
public:
    PackedArguments() {
        CSimpleBuffer().simplebuffer_init(&mBuffer, nullptr, 0);
        // Room for nearly every reply and notification at once; the buffer grows for the rest.
        CSimpleBuffer().simplebuffer_checksize(&mBuffer, kFirstRoom);
        mBuffer.size = 0;
    }
    ~PackedArguments() { CSimpleBuffer().simplebuffer_destroy(&mBuffer); }
    PackedArguments(PackedArguments&& other) noexcept
        : mBuffer(std::exchange(other.mBuffer, simplebuffer{})) {}
    PackedArguments& operator=(PackedArguments&& other) noexcept {
        std::swap(mBuffer, other.mBuffer);
        return *this;
    }
    PackedArguments(const PackedArguments&) = delete;
    PackedArguments& operator=(const PackedArguments&) = delete;

    PackedArguments& boolean(bool value) {
        CPack_Simplebuffer().pack_simplebuffer_bool(&mBuffer, value);
        return *this;
    }
    PackedArguments& int32(int32_t value) {
        CPack_Simplebuffer().pack_simplebuffer_int32(&mBuffer, value);
        return *this;
    }
    PackedArguments& int64(int64_t value) {
        CPack_Simplebuffer().pack_simplebuffer_int64(&mBuffer, value);
        return *this;
    }
    PackedArguments& uint64(uint64_t value) {
        CPack_Simplebuffer().pack_simplebuffer_uint64(&mBuffer, value);
        return *this;
    }
    /** In the smallest form. */
    PackedArguments& integer(int32_t value) {
        CPack_Simplebuffer().pack_simplebuffer_int(&mBuffer, value);
        return *this;
    }
    PackedArguments& text(const std::wstring& value) {
        CPack_Simplebuffer().pack_simplebuffer_wstring(&mBuffer, value);
        return *this;
    }
    PackedArguments& raw(const void* bytes, uint64_t length) {
        CPack_Simplebuffer().pack_simplebuffer_raw(&mBuffer, bytes, length);
        return *this;
    }

    /** For the encoders themselves. The memory stays owned by this object. */
    [[nodiscard]] simplebuffer* get() { return &mBuffer; }

    /** Valid until the next value is added. */
    [[nodiscard]] uint8_t* data() { return mBuffer.data; }
    [[nodiscard]] const uint8_t* data() const { return mBuffer.data; }
    [[nodiscard]] uint64_t size() const { return mBuffer.size; }

private:
    static constexpr uint64_t kFirstRoom = 128;

    simplebuffer mBuffer;
};
