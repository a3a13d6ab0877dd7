// SPDX-License-Identifier: MIT
#pragma once

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <string>
#include <type_traits>

namespace fuzz {

/** Takes an input apart, from front to back. What it lacks is 0 or empty. */
class Input {
public:
    Input(const uint8_t* data, std::size_t size) : mpNext(data), mLeft(size) {}

    [[nodiscard]] bool isEmpty() const { return mLeft == 0; }

    /** In host byte order. */
    template<typename Number>
    Number number() {
        static_assert(std::is_integral_v<Number>);
        Number value = 0;
        const std::size_t length = std::min(sizeof(value), mLeft);
        std::memcpy(&value, mpNext, length);
        skip(length);
        return value;
    }

    uint8_t byte() { return number<uint8_t>(); }

    std::string bytes(std::size_t most) {
        const std::size_t length = std::min(most, mLeft);
        std::string taken(reinterpret_cast<const char*>(mpNext), length);
        skip(length);
        return taken;
    }

    /** As many bytes as the 16-bit number before them says. */
    std::string block() { return bytes(number<uint16_t>()); }

    /** Whatever 16-bit codes there are, surrogates and controls too; their number stands first. */
    std::wstring text() {
        std::wstring taken;
        for (std::size_t left = number<uint16_t>(); left > 0 && !isEmpty(); --left)
            taken += static_cast<wchar_t>(number<uint16_t>());
        return taken;
    }

private:
    void skip(std::size_t length) {
        mpNext += length;
        mLeft -= length;
    }

    const uint8_t* mpNext;
    std::size_t mLeft;
};

} // namespace fuzz
