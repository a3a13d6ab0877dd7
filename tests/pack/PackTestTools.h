// SPDX-License-Identifier: MIT
#pragma once

#include "pack/CPack_Simplebuffer.h"
#include "pack/CSimpleBuffer.h"

#include <cstdint>
#include <cstdlib>
#include <initializer_list>
#include <memory>
#include <string_view>
#include <vector>

using Bytes = std::vector<uint8_t>;

inline Bytes bytesOf(std::string_view text) {
    return {text.begin(), text.end()};
}

inline Bytes joined(std::initializer_list<Bytes> parts) {
    Bytes all;
    for (const Bytes& part : parts)
        all.insert(all.end(), part.begin(), part.end());
    return all;
}

/** An empty simplebuffer that is destroyed at the end of the scope. */
class Buffer {
public:
    Buffer() { CSimpleBuffer().simplebuffer_init(&mBuffer, nullptr, 0); }
    ~Buffer() { CSimpleBuffer().simplebuffer_destroy(&mBuffer); }
    Buffer(const Buffer&) = delete;
    Buffer& operator=(const Buffer&) = delete;

    simplebuffer* get() { return &mBuffer; }
    simplebuffer* operator->() { return &mBuffer; }
    [[nodiscard]] Bytes bytes() const { return {mBuffer.data, mBuffer.data + mBuffer.size}; }

private:
    simplebuffer mBuffer;
};

/** What one operation of CPack_Simplebuffer writes to an empty buffer. */
template<class Operation, class... Arguments>
Bytes packed(Operation operation, const Arguments&... arguments) {
    Buffer buffer;
    CPack_Simplebuffer pack;
    if ((pack.*operation)(buffer.get(), arguments...) != 1)
        return {};
    return buffer.bytes();
}

/** A heap block of exactly these bytes, so that a sanitizer sees any read beyond them. */
class ExactBlock {
public:
    explicit ExactBlock(const Bytes& bytes) : mSize(bytes.size()), mpData(new uint8_t[mSize]) {
        for (std::size_t i = 0; i < mSize; ++i)
            mpData[i] = bytes[i];
    }
    [[nodiscard]] const uint8_t* data() const { return mpData.get(); }
    [[nodiscard]] std::size_t size() const { return mSize; }

private:
    std::size_t mSize;
    std::unique_ptr<uint8_t[]> mpData;
};

/** The allocation policy for one scope: unit 4, counted, and failing when told to. */
class CountedAllocation {
public:
    CountedAllocation() {
        sAllocations = sFrees = 0;
        sFails = false;
        CSimpleBuffer().simplebuffer_system_init(4, allocate, release);
    }
    ~CountedAllocation() { CSimpleBuffer().simplebuffer_system_init(4, std::malloc, std::free); }
    CountedAllocation(const CountedAllocation&) = delete;
    CountedAllocation& operator=(const CountedAllocation&) = delete;

    static void fail(bool fails) { sFails = fails; }
    [[nodiscard]] static int allocations() { return sAllocations; }
    [[nodiscard]] static int frees() { return sFrees; }

private:
    static void* allocate(unsigned long size) {
        if (sFails)
            return nullptr;
        ++sAllocations;
        return std::malloc(size);
    }
    static void release(void* memory) {
        ++sFrees;
        std::free(memory);
    }

    inline static int sAllocations = 0;
    inline static int sFrees = 0;
    inline static bool sFails = false;
};
