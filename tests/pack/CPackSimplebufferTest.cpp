// SPDX-License-Identifier: MIT
#include "pack/CPack_Simplebuffer.h"

#include "tests/pack/PackTestTools.h"

#include <array>
#include <cstdlib>
#include <cstring>
#include <functional>
#include <gtest/gtest.h>

using Pack = CPack_Simplebuffer;

namespace {

Bytes packedText(const std::wstring& text) {
    return packed(&Pack::pack_simplebuffer_wstring, text);
}

struct Form {
    uint64_t size;
    std::function<int(simplebuffer*)> write;
};

/** Every operation that writes, with the size that it must reserve. */
const std::array kForms{
    Form{1, [](simplebuffer* b) { return Pack().pack_simplebuffer_nil(b); }},
    Form{1, [](simplebuffer* b) { return Pack().pack_simplebuffer_bool(b, true); }},
    Form{5, [](simplebuffer* b) { return Pack().pack_simplebuffer_float(b, 1.5f); }},
    Form{9, [](simplebuffer* b) { return Pack().pack_simplebuffer_double(b, 1.5); }},
    Form{1, [](simplebuffer* b) { return Pack().pack_simplebuffer_fixuint(b, 1); }},
    Form{2, [](simplebuffer* b) { return Pack().pack_simplebuffer_uint8(b, 1); }},
    Form{3, [](simplebuffer* b) { return Pack().pack_simplebuffer_uint16(b, 1); }},
    Form{5, [](simplebuffer* b) { return Pack().pack_simplebuffer_uint32(b, 1); }},
    Form{9, [](simplebuffer* b) { return Pack().pack_simplebuffer_uint64(b, 1); }},
    Form{1, [](simplebuffer* b) { return Pack().pack_simplebuffer_fixint(b, -1); }},
    Form{2, [](simplebuffer* b) { return Pack().pack_simplebuffer_int8(b, 1); }},
    Form{3, [](simplebuffer* b) { return Pack().pack_simplebuffer_int16(b, 1); }},
    Form{5, [](simplebuffer* b) { return Pack().pack_simplebuffer_int32(b, 1); }},
    Form{9, [](simplebuffer* b) { return Pack().pack_simplebuffer_int64(b, 1); }},
    Form{1, [](simplebuffer* b) { return Pack().pack_simplebuffer_uint(b, 127); }},
    Form{2, [](simplebuffer* b) { return Pack().pack_simplebuffer_uint(b, 128); }},
    Form{3, [](simplebuffer* b) { return Pack().pack_simplebuffer_uint(b, 256); }},
    Form{5, [](simplebuffer* b) { return Pack().pack_simplebuffer_uint(b, 65536); }},
    Form{1, [](simplebuffer* b) { return Pack().pack_simplebuffer_int(b, -32); }},
    Form{2, [](simplebuffer* b) { return Pack().pack_simplebuffer_int(b, -33); }},
    Form{3, [](simplebuffer* b) { return Pack().pack_simplebuffer_int(b, -129); }},
    Form{5, [](simplebuffer* b) { return Pack().pack_simplebuffer_int(b, -32769); }},
    Form{1, [](simplebuffer* b) { return Pack().pack_simplebuffer_raw_header(b, 31); }},
    Form{3, [](simplebuffer* b) { return Pack().pack_simplebuffer_raw_header(b, 32); }},
    Form{5, [](simplebuffer* b) { return Pack().pack_simplebuffer_raw_header(b, 65536); }},
    Form{4, [](simplebuffer* b) { return Pack().pack_simplebuffer_raw(b, "abc", 3); }},
    Form{4, [](simplebuffer* b) { return Pack().pack_simplebuffer_string(b, "ab"); }},
    Form{4, [](simplebuffer* b) { return Pack().pack_simplebuffer_wstring(b, L"ab"); }},
    Form{4, [](simplebuffer* b) { return Pack().pack_simplebuffer_wstring(b, L"\u00e9"); }},
};

} // namespace

TEST(CPackSimplebuffer, EachOperationReservesExactlyTheSizeOfItsForm) {
    for (std::size_t i = 0; i < kForms.size(); ++i) {
        const CountedAllocation policy;
        Buffer buffer;
        EXPECT_EQ(kForms[i].write(buffer.get()), 1) << i;
        EXPECT_EQ(buffer->size, kForms[i].size) << i;
        EXPECT_EQ(buffer->alloc, kForms[i].size + std::max<uint64_t>(kForms[i].size, 4)) << i;
        EXPECT_EQ(CountedAllocation::allocations(), 1) << i;
    }
}

TEST(CPackSimplebuffer, WithoutMemoryNothingIsWrittenAndTheBufferStays) {
    const CountedAllocation policy;
    for (std::size_t i = 0; i < kForms.size(); ++i) {
        std::array<uint8_t, 3> foreign{1, 2, 3};
        simplebuffer buffer{foreign.size(), foreign.data(), 0};
        const simplebuffer before = buffer;
        CountedAllocation::fail(true);
        EXPECT_EQ(kForms[i].write(&buffer), 0) << i;
        EXPECT_EQ(std::memcmp(&before, &buffer, sizeof before), 0) << i;
    }
}

TEST(CPackSimplebuffer, ValuesFollowEachOtherWithoutAnEnvelope) {
    Buffer buffer;
    Pack pack;
    pack.pack_simplebuffer_int32(buffer.get(), 5);
    pack.pack_simplebuffer_array_header(buffer.get(), 2);
    pack.pack_simplebuffer_int(buffer.get(), -1);
    pack.pack_simplebuffer_string(buffer.get(), "a");
    pack.pack_simplebuffer_nil(buffer.get());
    EXPECT_EQ(buffer.bytes(), (Bytes{0xD2, 0, 0, 0, 5, 0xFF, 0xA2, 'a', 0, 0xC0}));
}

TEST(CPackSimplebuffer, AFixedInt32IsNeverShortened) {
    EXPECT_EQ(packed(&Pack::pack_simplebuffer_int32, 5), (Bytes{0xD2, 0, 0, 0, 5}));
}

TEST(CPackSimplebuffer, AnArrayHeaderAddsNoByte) {
    Buffer buffer;
    EXPECT_EQ(Pack().pack_simplebuffer_array_header(buffer.get(), 5), 0);
    EXPECT_EQ(buffer->size, 0u);
}

TEST(CPackSimplebuffer, AStringCountsItsTerminatingZero) {
    const auto text = [](const std::string& value) {
        return packed(&Pack::pack_simplebuffer_string, value);
    };
    EXPECT_EQ(text(""), (Bytes{0xA1, 0x00}));
    EXPECT_EQ(text("ab"), (Bytes{0xA3, 'a', 'b', 0x00}));
    EXPECT_EQ(text(std::string("a\0b", 3)), (Bytes{0xA4, 'a', 0x00, 'b', 0x00}));
    const std::string thirtyOne(31, 'x');
    EXPECT_EQ(text(thirtyOne), joined({{0xDA, 0x00, 0x20}, bytesOf(thirtyOne), {0x00}}));
}

TEST(CPackSimplebuffer, ARawOf65535BytesHasTheShorterHeader) {
    const auto raw = [](std::size_t length) {
        const Bytes bytes(length, 7);
        return packed(&Pack::pack_simplebuffer_raw, bytes.data(), uint64_t{length});
    };
    EXPECT_EQ(raw(65535), joined({{0xDA, 0xFF, 0xFF}, Bytes(65535, 7)}));
    EXPECT_EQ(raw(65536), joined({{0xDB, 0x00, 0x01, 0x00, 0x00}, Bytes(65536, 7)}));
    EXPECT_EQ(raw(0), (Bytes{0xA0}));
}

TEST(CPackSimplebuffer, ARawLongerThanItsHeaderCanSayIsRefused) {
    const CountedAllocation policy;
    Buffer buffer;
    Pack pack;
    for (const uint64_t length : {uint64_t{UINT32_MAX} + 1, UINT64_MAX - 4, UINT64_MAX}) {
        EXPECT_EQ(pack.pack_simplebuffer_raw(buffer.get(), "x", length), 0);
        EXPECT_EQ(pack.pack_simplebuffer_raw_header(buffer.get(), length), 0);
    }
    EXPECT_EQ(CountedAllocation::allocations(), 0);
    EXPECT_EQ(buffer->size, 0u);
}

TEST(CPackSimplebuffer, WideTextTravelsNarrow) {
    EXPECT_EQ(packedText(L""), (Bytes{0xA1, 0x00}));
    EXPECT_EQ(packedText(L"ab"), (Bytes{0xA3, 'a', 'b', 0x00}));
    EXPECT_EQ(packedText(L"\u97f3a"), (Bytes{0xA5, 0xE9, 0x9F, 0xB3, 'a', 0x00}));
    for (std::size_t length = 1; length < 70; ++length)
        EXPECT_EQ(packedText(std::wstring(length, L'q')),
                  packed(&Pack::pack_simplebuffer_string, std::string(length, 'q')));
}

TEST(CPackSimplebuffer, WideTextEndsAtItsFirstNulOrUnconvertibleCharacter) {
    EXPECT_EQ(packedText({L"ab\0cd", 5}), (Bytes{0xA3, 'a', 'b', 0x00}));
    EXPECT_EQ(packedText({L"\u00e9\0cd", 4}), (Bytes{0xA3, 0xC3, 0xA9, 0x00}));
    EXPECT_EQ(packedText(L"ab\xD800"
                         L"cd"),
              (Bytes{0xA3, 'a', 'b', 0x00}));
    EXPECT_EQ(packedText(std::wstring(50, L'\0')), (Bytes{0xA1, 0x00}));
}

TEST(CPackSimplebuffer, WideTextFollowsTheEnvironmentsLocale) {
    ::setenv("LC_ALL", "C", 1);
    EXPECT_EQ(packedText(L"ab\u00e9"), (Bytes{0xA3, 'a', 'b', 0x00}));
    ::setenv("LC_ALL", "C.UTF-8", 1);
    EXPECT_EQ(packedText(L"ab\u00e9"), (Bytes{0xA5, 'a', 'b', 0xC3, 0xA9, 0x00}));
}
