// SPDX-License-Identifier: MIT
// The player's notification: nine fields, one of them text.
#include "bench/pack/Buffers.h"
#include "bench/pack/Compare.h"
#include "define/PlayerDefine.h"
#include "pack/ArgumentReader.h"
#include "pack/PackedArguments.h"

#include <string>

namespace bench {
namespace {

using MediaServiceDefine::_tagMediaPlayerNotify;

const std::string kNarrowText = "file:///media/videos/2026/holiday-12.mkv";

_tagMediaPlayerNotify makeRecord() {
    _tagMediaPlayerNotify record;
    record.iNotifyType = 1;
    record.strNotifyText = std::wstring(kNarrowText.begin(), kNarrowText.end());
    record.iNotifyParam1 = 1;
    record.iNotifyParam2 = 2;
    record.iNotifyParam3 = 300;
    record.ulNotifyValue1 = 5'400'000'000'000;
    record.ulNotifyValue2 = 1;
    record.lNotifyValue = -1;
    return record;
}

void packOurs(simplebuffer* to, const _tagMediaPlayerNotify& record) {
    CPack_Simplebuffer pack;
    pack.pack_simplebuffer_int(to, record.iNotifyType);
    pack.pack_simplebuffer_int32(to, record.iNotifyResult);
    pack.pack_simplebuffer_wstring(to, record.strNotifyText);
    pack.pack_simplebuffer_int(to, record.iNotifyParam1);
    pack.pack_simplebuffer_int(to, record.iNotifyParam2);
    pack.pack_simplebuffer_int(to, record.iNotifyParam3);
    pack.pack_simplebuffer_uint64(to, record.ulNotifyValue1);
    pack.pack_simplebuffer_uint64(to, record.ulNotifyValue2);
    pack.pack_simplebuffer_int64(to, record.lNotifyValue);
}

void packTheirs(msgpack_packer* to, const _tagMediaPlayerNotify& record, const std::string& text) {
    msgpack_pack_int32(to, record.iNotifyType);
    msgpack_pack_fix_int32(to, record.iNotifyResult);
    msgpack_pack_v4raw(to, text.size() + 1);
    msgpack_pack_v4raw_body(to, text.c_str(), text.size() + 1);
    msgpack_pack_int32(to, record.iNotifyParam1);
    msgpack_pack_int32(to, record.iNotifyParam2);
    msgpack_pack_int32(to, record.iNotifyParam3);
    msgpack_pack_fix_uint64(to, record.ulNotifyValue1);
    msgpack_pack_fix_uint64(to, record.ulNotifyValue2);
    msgpack_pack_fix_int64(to, record.lNotifyValue);
}

void comparePackedRecord(const Comparison& comparison, const _tagMediaPlayerNotify& record) {
    OurBuffer ourBuffer;
    TheirBuffer theirBuffer;
    const auto runTheirs = [&](const std::string& text) {
        keep(record);
        theirBuffer.clear();
        packTheirs(theirBuffer.packer(), record, text);
        keep(theirBuffer.get());
    };
    comparison.compare(
        "pack notification", ours([&](unsigned) {
            keep(record);
            ourBuffer.clear();
            packOurs(ourBuffer.get(), record);
            keep(*ourBuffer.get());
        }),
        theirsNarrowing([&](unsigned) { runTheirs(narrowedByC(record.strNotifyText)); }),
        theirsReady([&](unsigned) { runTheirs(kNarrowText); }));
}

/** As a notification is sent: the buffer is made for it and freed after it. */
void compareWholeRecord(const Comparison& comparison, const _tagMediaPlayerNotify& record) {
    const auto runTheirs = [&](const std::string& text) {
        keep(record);
        TheirBuffer buffer;
        packTheirs(buffer.packer(), record, text);
        keep(buffer.get());
    };
    comparison.compare(
        "pack notification, new buffer", ours([&](unsigned) {
            keep(record);
            PackedArguments arguments;
            packOurs(arguments.get(), record);
            keep(arguments);
        }),
        theirsNarrowing([&](unsigned) { runTheirs(narrowedByC(record.strNotifyText)); }),
        theirsReady([&](unsigned) { runTheirs(kNarrowText); }));
}

_tagMediaPlayerNotify unpackOurs(const void* data, long size) {
    _tagMediaPlayerNotify record;
    ArgumentReader reader(data, size);
    reader.read(record.iNotifyType);
    reader.read(record.iNotifyResult);
    reader.read(record.strNotifyText);
    reader.read(record.iNotifyParam1);
    reader.read(record.iNotifyParam2);
    reader.read(record.iNotifyParam3);
    reader.read(record.ulNotifyValue1);
    reader.read(record.ulNotifyValue2);
    reader.read(record.lNotifyValue);
    return record;
}

/** Leaves the text narrow and inside the packet. */
void unpackTheirs(const char* data, std::size_t size) {
    msgpack_unpacked value;
    msgpack_unpacked_init(&value);
    std::size_t offset = 0;
    while (msgpack_unpack_next(&value, data, size, &offset) == MSGPACK_UNPACK_SUCCESS)
        keep(value);
    msgpack_unpacked_destroy(&value);
}

void compareUnpackedRecord(const Comparison& comparison, const _tagMediaPlayerNotify& record) {
    PackedArguments packed;
    packOurs(packed.get(), record);
    const auto size = static_cast<long>(packed.size());
    const auto* const bytes = reinterpret_cast<const char*>(packed.data());
    comparison.compare("unpack notification (ours to wide text)",
                       ours([&](unsigned) { keep(unpackOurs(packed.data(), size)); }),
                       theirs([&](unsigned) { unpackTheirs(bytes, packed.size()); }));
}

} // namespace

void compareRecords(const Comparison& comparison) {
    const _tagMediaPlayerNotify record = makeRecord();
    comparePackedRecord(comparison, record);
    compareWholeRecord(comparison, record);
    compareUnpackedRecord(comparison, record);
}

} // namespace bench
