// SPDX-License-Identifier: MIT
#include "pack/CUnpack.h"

#include "base/Text.h"
#include "pack/Encoding.h"

#include <array>
#include <string_view>

namespace {

using qns::Encoding;

/** What a first byte says: the length of the header (0: unknown) and the tag it stands for. */
struct FirstByte {
    uint8_t length;
    uint8_t tag;
};

constexpr uint8_t headerLength(uint8_t tag) {
    switch (tag) {
    case Encoding::kFixUint:
    case Encoding::kFixInt:
    case Encoding::kFixRaw:
    case Encoding::kNil:
    case Encoding::kFalse:
    case Encoding::kTrue:
        return 1;
    case Encoding::kUint8:
    case Encoding::kInt8:
        return 2;
    case Encoding::kUint16:
    case Encoding::kInt16:
    case Encoding::kRaw16:
        return 3;
    case Encoding::kFloat:
    case Encoding::kUint32:
    case Encoding::kInt32:
    case Encoding::kRaw32:
        return 5;
    case Encoding::kDouble:
    case Encoding::kUint64:
    case Encoding::kInt64:
        return 9;
    default:
        return 0;
    }
}

constexpr uint8_t foldedTag(uint8_t byte) {
    if (byte < 0x80)
        return Encoding::kFixUint;
    if (byte >= Encoding::kFixInt)
        return Encoding::kFixInt;
    if ((byte & 0xE0) == Encoding::kFixRaw)
        return Encoding::kFixRaw;
    return byte;
}

constexpr std::array<FirstByte, 256> firstBytes() {
    std::array<FirstByte, 256> table{};
    for (unsigned byte = 0; byte < table.size(); ++byte) {
        const uint8_t tag = foldedTag(static_cast<uint8_t>(byte));
        table[byte] = FirstByte{headerLength(tag), tag};
    }
    return table;
}

constexpr auto kFirstBytes = firstBytes();

uint64_t headerValue(const uint8_t* bytes, FirstByte first) {
    switch (first.length) {
    case 1:
        if (first.tag == Encoding::kFixRaw)
            return bytes[0] & 0x1Fu;
        return first.tag == Encoding::kFixUint || first.tag == Encoding::kFixInt ? bytes[0] : 0;
    case 2:
        return bytes[1];
    case 3:
        return Encoding::load<uint16_t>(bytes + 1);
    case 5:
        return Encoding::load<uint32_t>(bytes + 1);
    default:
        return Encoding::load<uint64_t>(bytes + 1);
    }
}

void setBoolean(unpack_info_t& info, uint64_t value) {
    info.type = UNPACK_BOOLEAN;
    info.value.boolean = value;
}

void setSigned(unpack_info_t& info, int64_t value) {
    info.type = UNPACK_SIGNED;
    info.value.signedInt = value;
}

void setUnsigned(unpack_info_t& info, uint64_t value) {
    info.type = UNPACK_UNSIGNED;
    info.value.unsignedInt = value;
}

void setFloat(unpack_info_t& info, uint64_t bits) {
    info.type = UNPACK_FLOAT;
    info.value.unsignedInt = 0; // all of the union is defined, whichever member is read
    info.value.floatBits = static_cast<uint32_t>(bits);
}

void setDouble(unpack_info_t& info, uint64_t bits) {
    info.type = UNPACK_DOUBLE;
    info.value.doubleBits = bits;
}

/** Every value but a raw. */
void setScalar(unpack_info_t& info, const CUnpack::Header& header) {
    switch (header.tag) {
    case Encoding::kNil:
        info.type = UNPACK_NIL;
        return;
    case Encoding::kFalse:
    case Encoding::kTrue:
        return setBoolean(info, header.tag == Encoding::kTrue);
    case Encoding::kFloat:
        return setFloat(info, header.value);
    case Encoding::kDouble:
        return setDouble(info, header.value);
    case Encoding::kFixInt:
    case Encoding::kInt8:
        return setSigned(info, static_cast<int8_t>(header.value));
    case Encoding::kInt16:
        return setSigned(info, static_cast<int16_t>(header.value));
    case Encoding::kInt32:
        return setSigned(info, static_cast<int32_t>(header.value));
    case Encoding::kInt64:
        return setSigned(info, static_cast<int64_t>(header.value));
    default:
        return setUnsigned(info, header.value);
    }
}

bool isRaw(uint8_t tag) {
    return tag == Encoding::kFixRaw || tag == Encoding::kRaw16 || tag == Encoding::kRaw32;
}

} // namespace

CUnpack::Header CUnpack::unpack_base(const void* data, size_t available) {
    if (available == 0)
        return Header{};
    const auto* const bytes = static_cast<const uint8_t*>(data);
    const FirstByte first = kFirstBytes[bytes[0]];
    const bool readable = first.length != 0 && first.length <= available;
    return Header{first.length, first.tag, readable ? headerValue(bytes, first) : 0};
}

uint32_t CUnpack::unpack(unpack_info_t& info, const void* data, size_t available) {
    const Header header = unpack_base(data, available);
    if (header.length == 0 || header.length > available)
        return 0;
    if (!isRaw(header.tag)) {
        setScalar(info, header);
        return header.length;
    }
    // The count of consumed bytes has 32 bits as well.
    if (header.value > available - header.length || header.value > UINT32_MAX - header.length)
        return 0;
    info.type = UNPACK_RAW;
    info.value.rawLength = header.value;
    info.ptr = static_cast<const uint8_t*>(data) + header.length;
    return header.length + static_cast<uint32_t>(header.value);
}

std::wstring s2ws(const void* text, uint64_t length) {
    return text == nullptr ? std::wstring() : qns::widen({static_cast<const char*>(text), length});
}
