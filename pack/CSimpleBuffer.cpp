// SPDX-License-Identifier: MIT
#include "pack/CSimpleBuffer.h"

#include <algorithm>
#include <cstdlib>
#include <cstring>
#include <utility>

uint64_t CSimpleBuffer::s_minimum_allocate_unit = 4;
CSimpleBuffer::AllocateFunction CSimpleBuffer::s_allocate_function = std::malloc;
CSimpleBuffer::FreeFunction CSimpleBuffer::s_free_function = std::free;

void CSimpleBuffer::simplebuffer_system_init(uint64_t minimumAllocateUnit,
                                             AllocateFunction allocate, FreeFunction free) {
    s_minimum_allocate_unit = minimumAllocateUnit;
    s_allocate_function = allocate;
    s_free_function = free;
}

uint8_t* CSimpleBuffer::grow(simplebuffer* buffer, uint64_t count) {
    uint64_t needed = 0;
    uint64_t capacity = 0;
    if (__builtin_add_overflow(buffer->size, count, &needed) ||
        __builtin_add_overflow(needed, std::max(count, s_minimum_allocate_unit), &capacity))
        return nullptr;
    auto* const data = static_cast<uint8_t*>(s_allocate_function(capacity));
    if (data == nullptr)
        return nullptr;
    if (buffer->size != 0)
        std::memcpy(data, buffer->data, buffer->size);
    if (buffer->alloc != 0)
        s_free_function(buffer->data);
    buffer->data = data;
    buffer->alloc = capacity;
    return data + std::exchange(buffer->size, needed);
}

int CSimpleBuffer::simplebuffer_write(simplebuffer* buffer, const void* source, uint64_t count) {
    uint8_t* const destination = simplebuffer_checksize(buffer, count);
    if (destination == nullptr)
        return 0;
    if (count != 0)
        std::memcpy(destination, source, count);
    return 1;
}

void CSimpleBuffer::simplebuffer_init(simplebuffer* buffer, void* data, uint64_t size) {
    *buffer = simplebuffer{size, static_cast<uint8_t*>(data), 0};
}

uint8_t* CSimpleBuffer::simplebuffer_release(simplebuffer* buffer) {
    uint8_t* const data = buffer->data;
    simplebuffer_init(buffer, nullptr, 0);
    return data;
}

void CSimpleBuffer::simplebuffer_destroy(simplebuffer* buffer) {
    if (buffer->alloc != 0)
        s_free_function(buffer->data);
    simplebuffer_init(buffer, nullptr, 0);
}
