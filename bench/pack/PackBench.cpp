// SPDX-License-Identifier: MIT
#include "bench/Benches.h"
#include "bench/pack/Buffers.h"
#include "bench/pack/Compare.h"

#include <clocale>
#include <string>

namespace bench {
namespace {

using Pack = CPack_Simplebuffer;

/** One value a call into a buffer that has room. */
template<class Value, class Ours, class Theirs>
void comparePack(const Comparison& comparison, const std::string& name, const Values<Value>& values,
                 Ours packOurs, Theirs packTheirs) {
    OurBuffer ourBuffer;
    TheirBuffer theirBuffer;
    comparison.compare("pack " + name, ours([&](unsigned call) {
                           ourBuffer.clear();
                           packOurs(ourBuffer.get(), values[call % kValues]);
                           keep(*ourBuffer.get());
                       }),
                       theirs([&](unsigned call) {
                           theirBuffer.clear();
                           packTheirs(theirBuffer.packer(), values[call % kValues]);
                           keep(theirBuffer.get());
                       }));
}

void compareSimple(const Comparison& comparison) {
    comparePack(
        comparison, "nil", allValues<uint8_t>(),
        [](simplebuffer* to, auto) { Pack().pack_simplebuffer_nil(to); },
        [](msgpack_packer* to, auto) { msgpack_pack_nil(to); });
    comparePack(
        comparison, "bool", valuesBetween<uint8_t>(0, 1),
        [](simplebuffer* to, auto value) { Pack().pack_simplebuffer_bool(to, value != 0); },
        [](msgpack_packer* to, auto value) {
            value != 0 ? msgpack_pack_true(to) : msgpack_pack_false(to);
        });
    comparePack(
        comparison, "float", valuesBetween(-1e6f, 1e6f),
        [](simplebuffer* to, auto value) { Pack().pack_simplebuffer_float(to, value); },
        [](msgpack_packer* to, auto value) { msgpack_pack_float(to, value); });
    comparePack(
        comparison, "double", valuesBetween(-1e6, 1e6),
        [](simplebuffer* to, auto value) { Pack().pack_simplebuffer_double(to, value); },
        [](msgpack_packer* to, auto value) { msgpack_pack_double(to, value); });
}

void compareFixedUnsigned(const Comparison& comparison) {
    comparePack(
        comparison, "fixuint", valuesBetween<uint8_t>(0, 127),
        [](simplebuffer* to, auto value) { Pack().pack_simplebuffer_fixuint(to, value); },
        [](msgpack_packer* to, auto value) { msgpack_pack_uint8(to, value); });
    comparePack(
        comparison, "uint8", allValues<uint8_t>(),
        [](simplebuffer* to, auto value) { Pack().pack_simplebuffer_uint8(to, value); },
        [](msgpack_packer* to, auto value) { msgpack_pack_fix_uint8(to, value); });
    comparePack(
        comparison, "uint16", allValues<uint16_t>(),
        [](simplebuffer* to, auto value) { Pack().pack_simplebuffer_uint16(to, value); },
        [](msgpack_packer* to, auto value) { msgpack_pack_fix_uint16(to, value); });
    comparePack(
        comparison, "uint32", allValues<uint32_t>(),
        [](simplebuffer* to, auto value) { Pack().pack_simplebuffer_uint32(to, value); },
        [](msgpack_packer* to, auto value) { msgpack_pack_fix_uint32(to, value); });
    comparePack(
        comparison, "uint64", allValues<uint64_t>(),
        [](simplebuffer* to, auto value) { Pack().pack_simplebuffer_uint64(to, value); },
        [](msgpack_packer* to, auto value) { msgpack_pack_fix_uint64(to, value); });
}

void compareFixedSigned(const Comparison& comparison) {
    comparePack(
        comparison, "fixint", valuesBetween<int8_t>(-32, -1),
        [](simplebuffer* to, auto value) { Pack().pack_simplebuffer_fixint(to, value); },
        [](msgpack_packer* to, auto value) { msgpack_pack_int8(to, value); });
    comparePack(
        comparison, "int8", allValues<int8_t>(),
        [](simplebuffer* to, auto value) { Pack().pack_simplebuffer_int8(to, value); },
        [](msgpack_packer* to, auto value) { msgpack_pack_fix_int8(to, value); });
    comparePack(
        comparison, "int16", allValues<int16_t>(),
        [](simplebuffer* to, auto value) { Pack().pack_simplebuffer_int16(to, value); },
        [](msgpack_packer* to, auto value) { msgpack_pack_fix_int16(to, value); });
    comparePack(
        comparison, "int32", allValues<int32_t>(),
        [](simplebuffer* to, auto value) { Pack().pack_simplebuffer_int32(to, value); },
        [](msgpack_packer* to, auto value) { msgpack_pack_fix_int32(to, value); });
    comparePack(
        comparison, "int64", allValues<int64_t>(),
        [](simplebuffer* to, auto value) { Pack().pack_simplebuffer_int64(to, value); },
        [](msgpack_packer* to, auto value) { msgpack_pack_fix_int64(to, value); });
}

void compareSmallest(const Comparison& comparison) {
    const auto ourUint = [](simplebuffer* to, auto value) {
        Pack().pack_simplebuffer_uint(to, value);
    };
    const auto theirUint = [](msgpack_packer* to, auto value) { msgpack_pack_uint32(to, value); };
    const auto ourInt = [](simplebuffer* to, auto value) {
        Pack().pack_simplebuffer_int(to, value);
    };
    const auto theirInt = [](msgpack_packer* to, auto value) { msgpack_pack_int32(to, value); };
    comparePack(comparison, "smallest uint below 128", valuesBetween(0u, 127u), ourUint, theirUint);
    comparePack(comparison, "smallest uint below 256", valuesBetween(0u, 255u), ourUint, theirUint);
    comparePack(comparison, "smallest uint, any", allValues<uint32_t>(), ourUint, theirUint);
    comparePack(comparison, "smallest int around 0", valuesBetween(-40, 40), ourInt, theirInt);
    comparePack(comparison, "smallest int around 16 bits", valuesBetween(-66000, 66000), ourInt,
                theirInt);
    comparePack(comparison, "smallest int, any", allValues<int32_t>(), ourInt, theirInt);
}

void compareRaws(const Comparison& comparison) {
    const std::string bytes(70000, 'r');
    for (const std::size_t length : {5, 40, 2000, 70000}) {
        comparePack(
            comparison, "raw of " + std::to_string(length) + " bytes", allValues<uint8_t>(),
            [&](simplebuffer* to, auto) { Pack().pack_simplebuffer_raw(to, bytes.data(), length); },
            [&](msgpack_packer* to, auto) {
                msgpack_pack_v4raw(to, length);
                msgpack_pack_v4raw_body(to, bytes.data(), length);
            });
    }
}

void packText(msgpack_packer* to, const std::string& text) {
    msgpack_pack_v4raw(to, text.size() + 1);
    msgpack_pack_v4raw_body(to, text.c_str(), text.size() + 1);
}

void compareNarrowText(const Comparison& comparison, std::size_t length) {
    const std::string text(length, 't');
    comparePack(
        comparison, "narrow text of " + std::to_string(length), allValues<uint8_t>(),
        [&](simplebuffer* to, auto) { Pack().pack_simplebuffer_string(to, text); },
        [&](msgpack_packer* to, auto) { packText(to, text); });
}

/** Theirs knows no wide text: it gets the text narrow, or narrowed with the C library first. */
void compareWideText(const Comparison& comparison, const std::string& name,
                     const std::wstring& text) {
    OurBuffer ourBuffer;
    TheirBuffer theirBuffer;
    const std::string narrowed = narrowedByC(text);
    comparison.compare("pack wide text, " + name, ours([&](unsigned) {
                           ourBuffer.clear();
                           Pack().pack_simplebuffer_wstring(ourBuffer.get(), text);
                           keep(*ourBuffer.get());
                       }),
                       theirsNarrowing([&](unsigned) {
                           theirBuffer.clear();
                           packText(theirBuffer.packer(), narrowedByC(text));
                           keep(theirBuffer.get());
                       }),
                       theirsReady([&](unsigned) {
                           theirBuffer.clear();
                           packText(theirBuffer.packer(), narrowed);
                           keep(theirBuffer.get());
                       }));
}

void compareTexts(const Comparison& comparison) {
    for (const std::size_t length : {5, 40, 2000})
        compareNarrowText(comparison, length);
    for (const std::size_t length : {5, 40, 2000})
        compareWideText(comparison, std::to_string(length) + " ASCII", std::wstring(length, L't'));
    compareWideText(comparison, "40 others", std::wstring(40, L'\u97f3'));
}

} // namespace

void comparePacking(const Comparison& comparison) {
    compareSimple(comparison);
    compareFixedUnsigned(comparison);
    compareFixedSigned(comparison);
    compareSmallest(comparison);
    compareRaws(comparison);
    compareTexts(comparison);
}

int runPack(const Options& options, Report& report) {
    constexpr int kRounds = 301;
    constexpr int kQuickRounds = 31;
    std::setlocale(LC_ALL, ""); // for the C library's conversion
    const Comparison comparison(report, roundsOf(options, kRounds, kQuickRounds));
    comparePacking(comparison);
    compareUnpacking(comparison);
    compareRecords(comparison);
    return 0;
}

} // namespace bench
