// SPDX-License-Identifier: MIT
// What is the same in the other library's encoding must be the same byte for byte.
#include "pack/CUnpack.h"
#include "tests/pack/PackTestTools.h"

#include <cstring>
#include <gtest/gtest.h>
#include <msgpack.h>
#include <random>
#include <string>

using Pack = CPack_Simplebuffer;

namespace {

/** What the other library writes. */
template<class Operation, class... Arguments>
Bytes theirs(Operation operation, const Arguments&... arguments) {
    msgpack_sbuffer buffer;
    msgpack_sbuffer_init(&buffer);
    msgpack_packer packer;
    msgpack_packer_init(&packer, &buffer, msgpack_sbuffer_write);
    operation(&packer, arguments...);
    const Bytes bytes(buffer.data, buffer.data + buffer.size);
    msgpack_sbuffer_destroy(&buffer);
    return bytes;
}

/** Random numbers of every magnitude, and the borders between the forms. */
template<class Number>
class Numbers {
public:
    template<class Check>
    void forEach(Check check) {
        for (const uint64_t border : {uint64_t{0}, uint64_t{32}, uint64_t{128}, uint64_t{256},
                                      uint64_t{32768}, uint64_t{65536}, uint64_t{1} << 31})
            for (int64_t offset = -2; offset <= 2; ++offset) {
                check(static_cast<Number>(border + static_cast<uint64_t>(offset)));
                check(static_cast<Number>(static_cast<uint64_t>(offset) - border));
            }
        for (int round = 0; round < 20000; ++round)
            check(static_cast<Number>(mRandom() >> (mRandom() % 64)));
    }

private:
    std::mt19937_64 mRandom{3};
};

/** The value of one decoded item, whose whole encoding `bytes` must be. */
unpack_info_t decoded(const Bytes& bytes) {
    unpack_info_t info{};
    EXPECT_EQ(CUnpack().unpack(info, bytes.data(), bytes.size()), bytes.size());
    return info;
}

template<class Number, class Ours, class Theirs>
void expectSameNumbers(Ours ours, Theirs theirOperation) {
    Numbers<Number>().forEach([&](Number value) {
        const Bytes bytes = packed(ours, value);
        ASSERT_EQ(bytes, theirs(theirOperation, value)) << +value;
        ASSERT_EQ(static_cast<Number>(decoded(bytes).value.unsignedInt), value);
    });
}

void packTheirRaw(msgpack_packer* packer, const Bytes& contents) {
    msgpack_pack_v4raw(packer, contents.size());
    msgpack_pack_v4raw_body(packer, contents.data(), contents.size());
}

Bytes randomBytes(std::mt19937& random, std::size_t length) {
    Bytes bytes(length);
    for (uint8_t& byte : bytes)
        byte = static_cast<uint8_t>(random());
    return bytes;
}

} // namespace

TEST(Peer, NilAndTruthAreTheSame) {
    EXPECT_EQ(packed(&Pack::pack_simplebuffer_nil), theirs(msgpack_pack_nil));
    EXPECT_EQ(packed(&Pack::pack_simplebuffer_bool, true), theirs(msgpack_pack_true));
    EXPECT_EQ(packed(&Pack::pack_simplebuffer_bool, false), theirs(msgpack_pack_false));
}

TEST(Peer, FixedWidthNumbersAreTheSame) {
    expectSameNumbers<uint8_t>(&Pack::pack_simplebuffer_uint8, msgpack_pack_fix_uint8);
    expectSameNumbers<uint16_t>(&Pack::pack_simplebuffer_uint16, msgpack_pack_fix_uint16);
    expectSameNumbers<uint32_t>(&Pack::pack_simplebuffer_uint32, msgpack_pack_fix_uint32);
    expectSameNumbers<uint64_t>(&Pack::pack_simplebuffer_uint64, msgpack_pack_fix_uint64);
    expectSameNumbers<int8_t>(&Pack::pack_simplebuffer_int8, msgpack_pack_fix_int8);
    expectSameNumbers<int16_t>(&Pack::pack_simplebuffer_int16, msgpack_pack_fix_int16);
    expectSameNumbers<int32_t>(&Pack::pack_simplebuffer_int32, msgpack_pack_fix_int32);
    expectSameNumbers<int64_t>(&Pack::pack_simplebuffer_int64, msgpack_pack_fix_int64);
}

TEST(Peer, SmallestFormsAreTheSame) {
    expectSameNumbers<uint32_t>(&Pack::pack_simplebuffer_uint, msgpack_pack_uint32);
    expectSameNumbers<int32_t>(&Pack::pack_simplebuffer_int, msgpack_pack_int32);
}

TEST(Peer, FloatingPointIsTheSame) {
    Numbers<uint64_t>().forEach([](uint64_t bits) {
        float single;
        double wide;
        const auto half = static_cast<uint32_t>(bits);
        std::memcpy(&single, &half, sizeof single);
        std::memcpy(&wide, &bits, sizeof wide);
        const Bytes singleBytes = packed(&Pack::pack_simplebuffer_float, single);
        const Bytes wideBytes = packed(&Pack::pack_simplebuffer_double, wide);
        ASSERT_EQ(singleBytes, theirs(msgpack_pack_float, single));
        ASSERT_EQ(wideBytes, theirs(msgpack_pack_double, wide));
        ASSERT_EQ(decoded(singleBytes).value.floatBits, half);
        ASSERT_EQ(decoded(wideBytes).value.doubleBits, bits);
    });
}

TEST(Peer, RawsAreTheSame) {
    std::mt19937 random(4);
    for (const std::size_t length : {0, 1, 30, 31, 32, 33, 255, 256, 65534, 65535, 65536, 100000}) {
        const Bytes contents = randomBytes(random, length);
        const Bytes bytes = packed(&Pack::pack_simplebuffer_raw, contents.data(), uint64_t{length});
        ASSERT_EQ(bytes, theirs(packTheirRaw, contents));
        const unpack_info_t info = decoded(bytes);
        ASSERT_EQ(info.type, UNPACK_RAW);
        ASSERT_EQ(Bytes(info.ptr, info.ptr + info.value.rawLength), contents);
    }
}

TEST(Peer, TextsOfEveryLengthComeBackAsTheyWere) {
    std::mt19937 random(5);
    for (std::size_t length = 0; length < 300; ++length) {
        std::wstring text;
        while (text.size() < length)
            text += static_cast<wchar_t>(1 + random() % (random() % 2 != 0 ? 0x7F : 0xD000));
        const Bytes bytes = packed(&Pack::pack_simplebuffer_wstring, text);
        const unpack_info_t info = decoded(bytes);
        ASSERT_EQ(s2ws(info.ptr, info.value.rawLength), text);
    }
}
