// SPDX-License-Identifier: MIT
#pragma once

#include "pack/CUnpack.h"

#include <cstddef>
#include <cstdint>
#include <string>
#include <type_traits>

/**
 * Reads the fields of one argument block in order. Preset each field, then call read() on it:
 *
 * - A number is cut to the field's width; its kind is not checked, so a raw gives its length and
 *   a float its bit pattern. A bool is true when any of the value's 64 bits is set.
 * - A byte that starts no known value is not consumed: this field and the rest take what was
 *   decoded last (0 when nothing was).
 * - Once a value does not fit in what is left of the block, or nothing is left, this field and
 *   all later ones keep their presets.
 * - A text field takes only a raw, up to its first NUL; after anything else it keeps its preset.
 *
 * The block is borrowed and must outlive the reader. For one thread.
 */
class ArgumentReader {
public:
    /** A null block or a size of 0 and below reads as an empty block. */
    ArgumentReader(const void* data, long size);

    template<class T>
    void read(T& field) {
        static_assert(std::is_integral_v<T> || std::is_enum_v<T>);
        if (!decodeNext())
            return;
        if constexpr (std::is_same_v<T, bool>)
            field = mInfo.value.unsignedInt != 0;
        else
            field = static_cast<T>(mInfo.value.unsignedInt);
    }
    void read(std::wstring& field);
    /** The text's bytes as they are. */
    void read(std::string& field);
    /** All of a raw's bytes, NULs too. */
    void readBytes(std::string& field);

private:
    /** False when the field keeps its preset. */
    bool decodeNext();

    const uint8_t* mpNext;
    std::size_t mLeft;
    unpack_info_t mInfo{};
};
