// SPDX-License-Identifier: MIT
#include "pack/ArgumentReader.h"

#include <cstring>

ArgumentReader::ArgumentReader(const void* data, long size)
    : mpNext(static_cast<const uint8_t*>(data)),
      mLeft(data != nullptr && size > 0 ? static_cast<std::size_t>(size) : 0) {}

void ArgumentReader::read(std::wstring& field) {
    if (decodeNext() && mInfo.type == UNPACK_RAW)
        field = s2ws(mInfo.ptr, mInfo.value.rawLength);
}

void ArgumentReader::read(std::string& field) {
    if (!decodeNext() || mInfo.type != UNPACK_RAW)
        return;
    const auto* text = reinterpret_cast<const char*>(mInfo.ptr);
    field.assign(text, ::strnlen(text, mInfo.value.rawLength));
}

void ArgumentReader::readBytes(std::string& field) {
    if (decodeNext() && mInfo.type == UNPACK_RAW)
        field.assign(reinterpret_cast<const char*>(mInfo.ptr), mInfo.value.rawLength);
}

bool ArgumentReader::decodeNext() {
    if (mLeft == 0)
        return false;
    const uint32_t consumed = CUnpack().unpack(mInfo, mpNext, mLeft);
    if (consumed == 0) {
        const bool isUnknown = CUnpack().unpack_base(mpNext, mLeft).length == 0;
        if (!isUnknown)
            mLeft = 0;
        return isUnknown;
    }
    mpNext += consumed;
    mLeft -= consumed;
    return true;
}
