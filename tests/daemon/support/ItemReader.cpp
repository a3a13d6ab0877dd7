// SPDX-License-Identifier: MIT
#include "tests/daemon/support/ItemReader.h"

#include <gtest/gtest.h>

std::int64_t ItemReader::integer() {
    const int tag = next();
    if (tag < 0x80)
        return tag;
    if (tag >= 0xE0)
        return tag - 256;
    if (tag >= 0xCC && tag <= 0xCF)
        return number(std::size_t{1} << (tag - 0xCC), false);
    if (tag >= 0xD0 && tag <= 0xD3)
        return number(std::size_t{1} << (tag - 0xD0), true);
    ADD_FAILURE() << "Not an integer: " << tag;
    return 0;
}

std::string ItemReader::text() {
    const int tag = next();
    const auto length = static_cast<std::size_t>(tag == 0xDA            ? number(2, false)
                                                 : (tag & 0xE0) == 0xA0 ? tag & 0x1F
                                                                        : 0);
    if (length == 0 || mOffset + length > mBytes.size()) {
        ADD_FAILURE() << "Not a text";
        return {};
    }
    mOffset += length;
    return mBytes.substr(mOffset - length, length - 1);
}

int ItemReader::next() {
    return mOffset < mBytes.size() ? static_cast<unsigned char>(mBytes[mOffset++]) : 0;
}

std::int64_t ItemReader::number(std::size_t width, bool isSigned) {
    std::uint64_t value = 0;
    for (std::size_t i = 0; i < width; ++i)
        value = value << 8 | static_cast<std::uint64_t>(next());
    const auto shift = 64 - 8 * width;
    return isSigned ? static_cast<std::int64_t>(value << shift) >> shift
                    : static_cast<std::int64_t>(value);
}
