// SPDX-License-Identifier: MIT
#include "bench/pack/Buffers.h"
#include "bench/pack/Compare.h"
#include "pack/CUnpack.h"

#include <string>
#include <vector>

namespace bench {
namespace {

using Pack = CPack_Simplebuffer;

/** Many values of one form after another, and where each begins. */
class Items {
public:
    template<class Write>
    explicit Items(Write write) {
        for (unsigned item = 0; item < kValues; ++item) {
            mStarts.push_back(mBuffer.get()->size);
            write(mBuffer.get(), item);
        }
    }

    [[nodiscard]] const uint8_t* at(unsigned call) {
        return mBuffer.get()->data + mStarts[call % kValues];
    }
    [[nodiscard]] std::size_t left(unsigned call) {
        return mBuffer.get()->size - mStarts[call % kValues];
    }

private:
    OurBuffer mBuffer;
    std::vector<std::size_t> mStarts;
};

template<class Write>
void compareUnpack(const Comparison& comparison, const std::string& name, Write write) {
    Items items(write);
    msgpack_unpacked value;
    msgpack_unpacked_init(&value);
    comparison.compare("unpack " + name, ours([&](unsigned call) {
                           unpack_info_t info;
                           CUnpack().unpack(info, items.at(call), items.left(call));
                           keep(info);
                       }),
                       theirs([&](unsigned call) {
                           std::size_t consumed = 0;
                           msgpack_unpack_next(&value,
                                               reinterpret_cast<const char*>(items.at(call)),
                                               items.left(call), &consumed);
                           keep(value);
                       }));
    msgpack_unpacked_destroy(&value);
}

void compareNumbers(const Comparison& comparison) {
    const auto wide = allValues<uint64_t>();
    compareUnpack(comparison, "fixuint", [&](simplebuffer* to, unsigned item) {
        Pack().pack_simplebuffer_fixuint(to, wide[item] % 128);
    });
    compareUnpack(comparison, "fixint", [&](simplebuffer* to, unsigned item) {
        Pack().pack_simplebuffer_fixint(to, static_cast<int8_t>(-1 - static_cast<int>(item % 32)));
    });
    compareUnpack(comparison, "uint8", [&](simplebuffer* to, unsigned item) {
        Pack().pack_simplebuffer_uint8(to, static_cast<uint8_t>(wide[item]));
    });
    compareUnpack(comparison, "uint16", [&](simplebuffer* to, unsigned item) {
        Pack().pack_simplebuffer_uint16(to, static_cast<uint16_t>(wide[item]));
    });
    compareUnpack(comparison, "uint32", [&](simplebuffer* to, unsigned item) {
        Pack().pack_simplebuffer_uint32(to, static_cast<uint32_t>(wide[item]));
    });
    compareUnpack(comparison, "uint64", [&](simplebuffer* to, unsigned item) {
        Pack().pack_simplebuffer_uint64(to, wide[item]);
    });
    compareUnpack(comparison, "int8", [&](simplebuffer* to, unsigned item) {
        Pack().pack_simplebuffer_int8(to, static_cast<int8_t>(wide[item]));
    });
    compareUnpack(comparison, "int16", [&](simplebuffer* to, unsigned item) {
        Pack().pack_simplebuffer_int16(to, static_cast<int16_t>(wide[item]));
    });
    compareUnpack(comparison, "int32", [&](simplebuffer* to, unsigned item) {
        Pack().pack_simplebuffer_int32(to, static_cast<int32_t>(wide[item]));
    });
    compareUnpack(comparison, "int64", [&](simplebuffer* to, unsigned item) {
        Pack().pack_simplebuffer_int64(to, static_cast<int64_t>(wide[item]));
    });
    compareUnpack(comparison, "smallest int, any size", [&](simplebuffer* to, unsigned item) {
        const auto value = static_cast<int32_t>(wide[item]);
        Pack().pack_simplebuffer_int(to, value >> (wide[item] >> 59));
    });
}

void compareOthers(const Comparison& comparison) {
    compareUnpack(comparison, "nil",
                  [](simplebuffer* to, unsigned) { Pack().pack_simplebuffer_nil(to); });
    compareUnpack(comparison, "bool", [](simplebuffer* to, unsigned item) {
        Pack().pack_simplebuffer_bool(to, item % 3 == 0);
    });
    compareUnpack(comparison, "float", [](simplebuffer* to, unsigned item) {
        Pack().pack_simplebuffer_float(to, static_cast<float>(item) / 3);
    });
    compareUnpack(comparison, "double", [](simplebuffer* to, unsigned item) {
        Pack().pack_simplebuffer_double(to, item / 3.0);
    });
    for (const std::size_t length : {5, 40, 2000})
        compareUnpack(comparison, "raw of " + std::to_string(length) + " bytes",
                      [=](simplebuffer* to, unsigned) {
                          const std::string bytes(length, 'r');
                          Pack().pack_simplebuffer_raw(to, bytes.data(), length);
                      });
}

} // namespace

void compareUnpacking(const Comparison& comparison) {
    compareOthers(comparison);
    compareNumbers(comparison);
}

} // namespace bench
