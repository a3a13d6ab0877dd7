// SPDX-License-Identifier: MIT
// Decodes arbitrary bytes, value by value, as the fields of a request, and as what a worker says.
#include "pack/ArgumentReader.h"
#include "pack/CPack.h"
#include "pack/CUnpack.h"
#include "worker/Message.h"
#include "worker/Request.h"

#include <array>
#include <cstdlib>
#include <string>
#include <string_view>

namespace {

void require(bool holds) {
    if (!holds)
        std::abort();
}

/** Writes a decoded number in its widest form; 0 for what is not a number. */
uint32_t encodeAgain(uint8_t* destination, const unpack_info_t& info) {
    switch (info.type) {
    case UNPACK_SIGNED:
        return CPack().pack_int64(destination, info.value.signedInt);
    case UNPACK_UNSIGNED:
        return CPack().pack_uint64(destination, info.value.unsignedInt);
    default:
        return 0;
    }
}

void requireTheSameNumberAgain(const unpack_info_t& info) {
    std::array<uint8_t, 9> room{};
    const uint32_t length = encodeAgain(room.data(), info);
    if (length == 0)
        return;
    unpack_info_t again{};
    require(CUnpack().unpack(again, room.data(), length) == length);
    require(again.type == info.type && again.value.unsignedInt == info.value.unsignedInt);
}

void requireTheRawInside(const unpack_info_t& info, const uint8_t* end) {
    if (info.type != UNPACK_RAW)
        return;
    require(info.ptr + info.value.rawLength == end);
    require(s2ws(info.ptr, info.value.rawLength).size() <= info.value.rawLength);
}

void decodeEveryValue(const uint8_t* data, size_t size) {
    unpack_info_t info{};
    while (size > 0) {
        const uint32_t consumed = CUnpack().unpack(info, data, size);
        require(consumed <= size);
        if (consumed == 0)
            return;
        data += consumed;
        size -= consumed;
        requireTheRawInside(info, data);
        requireTheSameNumberAgain(info);
    }
}

void readFields(const uint8_t* data, size_t size) {
    ArgumentReader reader(data, static_cast<long>(size));
    for (size_t round = 0; round < size + 1; round += 6) {
        int client = -1;
        std::wstring text;
        long position = 0;
        bool option = false;
        uint8_t small = 0;
        enum Format : int { kFormat } format = kFormat;
        reader.read(client);
        reader.read(text);
        reader.read(position);
        reader.read(option);
        reader.read(small);
        reader.read(format);
    }
}

/** What is read is written and read again as the same. */
template<typename Record>
void readRecord(std::string_view bytes) {
    Record record;
    worker::MessageReader message(bytes);
    message(record);
    if (!message.isGood())
        return;
    worker::MessageWriter once;
    once(record);
    worker::MessageReader again(once.bytes());
    again(record);
    require(again.isGood());
    worker::MessageWriter twice;
    twice(record);
    require(twice.bytes() == once.bytes());
}

} // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
    decodeEveryValue(data, size);
    readFields(data, size);
    const std::string_view bytes(reinterpret_cast<const char*>(data), size);
    readRecord<worker::Request>(bytes);
    readRecord<worker::Demuxers>(bytes);
    readRecord<worker::Looked>(bytes);
    readRecord<discoverer::Details>(bytes);
    readRecord<discoverer::Thumbnail>(bytes);
    return 0;
}
