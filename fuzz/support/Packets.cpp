// SPDX-License-Identifier: MIT
#include "fuzz/support/Packets.h"

#include <algorithm>
#include <cstddef>
#include <cstdint>
#include <cstring>
#include <iterator>
#include <vector>

#include "define/DiscovererMethods.h"
#include "define/ImporterMethods.h"
#include "define/ObjectIds.h"
#include "define/PlayerMethods.h"
#include "fuzz/support/Require.h"
#include "pack/CUnpack.h"
#include "ptc/Event.h"

using namespace MediaServiceDefine;

namespace fuzz {

namespace {

/** How many values a callback or notification has; those that are not here have one. */
struct Shape {
    template<typename Method>
    constexpr Shape(long callback, Method number, std::size_t count)
        : interfaceId(callback), method(static_cast<long>(number)), values(count) {}

    long interfaceId;
    long method;
    std::size_t values;
};

constexpr Shape kShapes[] = {
    {kPlayerCallBackId, PlayerCallBack::getPlayerStatus, 4},
    {kPlayerNotifyId, PlayerNotify::mediaPlayerNotify, 9},
    {kDiscovererCallBackId, DiscovererCallBack::getMetadata, 13},
    {kDiscovererCallBackId, DiscovererCallBack::getImage, 4},
    {kDiscovererCallBackId, DiscovererCallBack::getSupportedExtensions, 3},
    {kImporterCallBackId, ImporterCallBack::getImporterStatus, 4},
    {kImporterNotifyId, ImporterNotify::mediaImporterNotify, 10},
};

template<typename Method>
bool is(long interfaceId, const PTC::Event& event, long callback, Method method) {
    return interfaceId == callback && event.methodId == static_cast<long>(method);
}

std::vector<unpack_info_t> decodeAll(const void* bytes, std::size_t size) {
    std::vector<unpack_info_t> values;
    const auto* next = static_cast<const uint8_t*>(bytes);
    const uint8_t* const end = next + size;
    while (next != end) {
        unpack_info_t value{};
        const uint32_t consumed =
            CUnpack().unpack(value, next, static_cast<std::size_t>(end - next));
        require(consumed > 0);
        next += consumed;
        values.push_back(value);
    }
    return values;
}

/** Streams stand in a block of their own; its size and their number follow. */
void requireStreams(const unpack_info_t* block, int64_t most, std::size_t valuesOfEach) {
    const unpack_info_t& size = block[1];
    const unpack_info_t& count = block[2];
    require(block->type == UNPACK_RAW && size.value.unsignedInt == block->value.rawLength);
    require(count.value.signedInt >= 0 && count.value.signedInt <= most);
    const auto values = decodeAll(block->ptr, block->value.rawLength);
    require(values.size() == static_cast<std::size_t>(count.value.signedInt) * valuesOfEach);
}

void requireMetadata(const std::vector<unpack_info_t>& values) {
    constexpr std::size_t kVideoAt = 7;
    constexpr std::size_t kAudioAt = 10;
    requireStreams(&values[kVideoAt], 1, 13);
    requireStreams(&values[kAudioAt], 8, 7);
}

std::size_t valuesOf(long interfaceId, const PTC::Event& event) {
    const auto* const shape =
        std::find_if(std::begin(kShapes), std::end(kShapes), [&](const Shape& row) {
            return row.interfaceId == interfaceId && row.method == event.methodId;
        });
    return shape == std::end(kShapes) ? 1 : shape->values;
}

} // namespace

void requireDecodable(long interfaceId, const PTC::Event& event) {
    if (is(interfaceId, event, kPlayerCallBackId, PlayerCallBack::powerOffMediaPlayer)) {
        require(event.size == 4 && std::memcmp(event.data, "\0\0\0\0", 4) == 0);
        return;
    }
    const auto values = decodeAll(event.data, static_cast<std::size_t>(event.size));
    require(values.size() == valuesOf(interfaceId, event));
    if (is(interfaceId, event, kDiscovererCallBackId, DiscovererCallBack::getMetadata))
        requireMetadata(values);
}

} // namespace fuzz
