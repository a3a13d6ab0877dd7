// SPDX-License-Identifier: MIT
#pragma once

#include <cstdint>

/**
 * A growable run of bytes. `alloc` is the capacity; 0 means that `data` is not owned (foreign
 * memory, or none), and the first write that needs room moves the contents to owned memory.
 * Belongs to the one thread that fills it.
 */
struct simplebuffer {
    uint64_t size;
    uint8_t* data;
    uint64_t alloc;
};

/** Stateless operations on a caller's simplebuffer. The allocation policy is process-wide. */
class CSimpleBuffer {
public:
    using AllocateFunction = void* (*)(unsigned long size);
    using FreeFunction = void (*)(void* memory);

    /** Sets the policy. Call before the first write, while no other thread runs. */
    void simplebuffer_system_init(uint64_t minimumAllocateUnit, AllocateFunction allocate,
                                  FreeFunction free);

    /**
     * Extends the buffer by `count` bytes and returns where they start, or null (and changes
     * nothing) when memory is out. Growing adds `count` twice, or the minimum unit if larger.
     */
    uint8_t* simplebuffer_checksize(simplebuffer* buffer, uint64_t count) {
        uint64_t needed = 0;
        const bool overflows = __builtin_add_overflow(buffer->size, count, &needed);
        if (overflows || buffer->alloc < needed)
            return grow(buffer, count);
        uint8_t* const end = buffer->data + buffer->size;
        buffer->size = needed;
        return end;
    }

    /**
     * Appends `count` bytes. 1 on success; 0, with nothing changed, when memory is out (and for
     * no bytes at all to a buffer that has no memory yet).
     */
    int simplebuffer_write(simplebuffer* buffer, const void* source, uint64_t count);

    /** Makes the buffer empty (null, 0) or lets it borrow `size` bytes of foreign memory. */
    void simplebuffer_init(simplebuffer* buffer, void* data, uint64_t size);

    /** Empties the buffer and hands its memory to the caller. */
    [[nodiscard]] uint8_t* simplebuffer_release(simplebuffer* buffer);

    /** Frees owned memory and empties the buffer. */
    void simplebuffer_destroy(simplebuffer* buffer);

private:
    static uint8_t* grow(simplebuffer* buffer, uint64_t count);

    static uint64_t s_minimum_allocate_unit;
    static AllocateFunction s_allocate_function;
    static FreeFunction s_free_function;
};
