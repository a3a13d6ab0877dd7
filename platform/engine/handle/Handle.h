// SPDX-License-Identifier: MIT
#pragma once

#include <utility>

/**
 * Owners of what C libraries hand out. A traits struct says how one type is released and, where
 * it is counted, referenced; a new type costs a few lines.
 */
namespace handle {

/** How a reference comes into a handle. */
struct Adopt {}; ///< the caller's reference becomes the handle's
struct Ref {};   ///< the handle takes a reference of its own
struct Sink {};  ///< a floating reference becomes the handle's

inline constexpr Adopt kAdopt;
inline constexpr Ref kRef;
inline constexpr Sink kSink;

/** Owns one object alone. Traits: Pointer, release(). */
template<typename Traits>
class UniqueHandle {
public:
    using Pointer = typename Traits::Pointer;

    UniqueHandle() noexcept = default;
    UniqueHandle(Adopt, Pointer object) noexcept : mpObject(object) {}
    ~UniqueHandle() { reset(); }

    UniqueHandle(UniqueHandle&& other) noexcept : mpObject(other.release()) {}
    UniqueHandle& operator=(UniqueHandle&& other) noexcept {
        UniqueHandle(std::move(other)).swap(*this);
        return *this;
    }
    UniqueHandle(const UniqueHandle&) = delete;
    UniqueHandle& operator=(const UniqueHandle&) = delete;

    [[nodiscard]] Pointer get() const noexcept { return mpObject; }
    [[nodiscard]] Pointer release() noexcept { return std::exchange(mpObject, nullptr); }
    Pointer operator->() const noexcept { return mpObject; }
    explicit operator bool() const noexcept { return mpObject != nullptr; }
    void swap(UniqueHandle& other) noexcept { std::swap(mpObject, other.mpObject); }

    void reset() noexcept {
        if (mpObject)
            Traits::release(release());
    }

    /** For a C function that stores a new object through an out-parameter. */
    [[nodiscard]] Pointer* out() noexcept {
        reset();
        return &mpObject;
    }

private:
    Pointer mpObject = nullptr;
};

/** Holds one reference; copies hold one each. Traits: Pointer, ref(), release(), maybe sink(). */
template<typename Traits>
class SharedHandle {
public:
    using Pointer = typename Traits::Pointer;

    SharedHandle() noexcept = default;
    SharedHandle(Adopt, Pointer object) noexcept : mpObject(object) {}
    SharedHandle(Ref, Pointer object) noexcept : mpObject(object) {
        if (mpObject)
            Traits::ref(mpObject);
    }
    SharedHandle(Sink, Pointer object) noexcept : mpObject(object) {
        if (mpObject)
            Traits::sink(mpObject);
    }
    ~SharedHandle() { reset(); }

    SharedHandle(const SharedHandle& other) noexcept : SharedHandle(kRef, other.mpObject) {}
    SharedHandle(SharedHandle&& other) noexcept
        : mpObject(std::exchange(other.mpObject, nullptr)) {}
    SharedHandle& operator=(SharedHandle other) noexcept {
        std::swap(mpObject, other.mpObject);
        return *this;
    }

    [[nodiscard]] Pointer get() const noexcept { return mpObject; }
    Pointer operator->() const noexcept { return mpObject; }
    explicit operator bool() const noexcept { return mpObject != nullptr; }

    void reset() noexcept {
        if (mpObject)
            Traits::release(std::exchange(mpObject, nullptr));
    }

private:
    Pointer mpObject = nullptr;
};

} // namespace handle
