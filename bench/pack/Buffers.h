// SPDX-License-Identifier: MIT
#pragma once

#include "pack/CPack_Simplebuffer.h"
#include "pack/CSimpleBuffer.h"

#include <array>
#include <cstdint>
#include <cstdlib>
#include <limits>
#include <msgpack.h>
#include <random>
#include <string>
#include <type_traits>

namespace bench {

/** Our buffer, with room from the start. */
class OurBuffer {
public:
    OurBuffer() {
        CSimpleBuffer().simplebuffer_init(&mBuffer, nullptr, 0);
        CSimpleBuffer().simplebuffer_checksize(&mBuffer, 4096);
        mBuffer.size = 0;
    }
    ~OurBuffer() { CSimpleBuffer().simplebuffer_destroy(&mBuffer); }
    OurBuffer(const OurBuffer&) = delete;
    OurBuffer& operator=(const OurBuffer&) = delete;

    simplebuffer* get() { return &mBuffer; }
    void clear() { mBuffer.size = 0; }

private:
    simplebuffer mBuffer;
};

/** Theirs, which takes 8192 bytes with the first value. */
class TheirBuffer {
public:
    TheirBuffer() {
        msgpack_sbuffer_init(&mBuffer);
        msgpack_packer_init(&mPacker, &mBuffer, msgpack_sbuffer_write);
        msgpack_pack_nil(&mPacker);
        clear();
    }
    ~TheirBuffer() { msgpack_sbuffer_destroy(&mBuffer); }
    TheirBuffer(const TheirBuffer&) = delete;
    TheirBuffer& operator=(const TheirBuffer&) = delete;

    msgpack_packer* packer() { return &mPacker; }
    msgpack_sbuffer& get() { return mBuffer; }
    void clear() { msgpack_sbuffer_clear(&mBuffer); }

private:
    msgpack_sbuffer mBuffer;
    msgpack_packer mPacker;
};

inline constexpr unsigned kValues = 256;

template<class Value>
using Values = std::array<Value, kValues>;

/** Random values from `lowest` to `highest`, so that no branch can be foreseen for ever. */
template<class Value>
Values<Value> valuesBetween(Value lowest, Value highest) {
    std::mt19937_64 random(1);
    Values<Value> values;
    if constexpr (std::is_floating_point_v<Value>) {
        for (Value& value : values)
            value = std::uniform_real_distribution<Value>(lowest, highest)(random);
    } else {
        using Wide = std::conditional_t<std::is_signed_v<Value>, int64_t, uint64_t>;
        for (Value& value : values)
            value =
                static_cast<Value>(std::uniform_int_distribution<Wide>(lowest, highest)(random));
    }
    return values;
}

template<class Value>
Values<Value> allValues() {
    return valuesBetween(std::numeric_limits<Value>::min(), std::numeric_limits<Value>::max());
}

inline std::string narrowedByC(const std::wstring& text) {
    std::string bytes(text.size() * 4, '\0');
    const std::size_t length = std::wcstombs(bytes.data(), text.c_str(), bytes.size());
    bytes.resize(length == static_cast<std::size_t>(-1) ? 0 : length);
    return bytes;
}

} // namespace bench
