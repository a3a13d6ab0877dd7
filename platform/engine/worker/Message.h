// SPDX-License-Identifier: MIT
#pragma once

#include <array>
#include <cstdint>
#include <cstring>
#include <optional>
#include <string>
#include <string_view>
#include <type_traits>
#include <utility>

namespace worker {

/**
 * Values one after another in memory's own form, for another process of the same build. A record
 * is what a function `fields(message, record)` names, which serves writing and reading alike.
 */
class MessageWriter {
public:
    template<typename... Values>
    void operator()(Values&... values) {
        (write(values), ...);
    }

    [[nodiscard]] const std::string& bytes() const { return mBytes; }

private:
    template<typename Value>
    void write(Value& value) {
        if constexpr (std::is_arithmetic_v<Value> || std::is_enum_v<Value>)
            append(&value, sizeof value);
        else
            fields(*this, value);
    }
    template<typename Character>
    void write(std::basic_string<Character>& text) {
        auto length = static_cast<std::uint32_t>(text.size());
        write(length);
        append(text.data(), length * sizeof(Character));
    }
    template<typename Value>
    void write(std::optional<Value>& value) {
        bool isThere = value.has_value();
        write(isThere);
        if (isThere)
            write(*value);
    }
    template<typename Value, std::size_t size>
    void write(std::array<Value, size>& values) {
        for (Value& value : values)
            write(value);
    }

    void append(const void* data, std::size_t size) {
        mBytes.append(static_cast<const char*>(data), size);
    }

    std::string mBytes;
};

/** The other end. Whatever the bytes, nothing is read but them, and what is wrong is noticed. */
class MessageReader {
public:
    explicit MessageReader(std::string_view bytes) : mBytes(bytes) {}

    template<typename... Values>
    void operator()(Values&... values) {
        (read(values), ...);
    }

    /** All values were there, and are what they can be. */
    [[nodiscard]] bool isGood() const { return mGood; }
    void reject() { mGood = false; }

private:
    template<typename Value>
    void read(Value& value) {
        if constexpr (std::is_same_v<Value, bool>) {
            unsigned char byte = 0;
            read(byte);
            value = byte != 0;
        } else if constexpr (std::is_arithmetic_v<Value> || std::is_enum_v<Value>) {
            take(&value, sizeof value);
        } else {
            fields(*this, value);
        }
    }
    template<typename Character>
    void read(std::basic_string<Character>& text) {
        std::uint32_t length = 0;
        read(length);
        if (length > mBytes.size() / sizeof(Character))
            return reject();
        text.resize(length);
        take(text.data(), length * sizeof(Character));
        if constexpr (std::is_same_v<Character, wchar_t>)
            checkCharacters(text);
    }
    template<typename Value>
    void read(std::optional<Value>& value) {
        bool isThere = false;
        read(isThere);
        value.reset();
        if (!isThere || !mGood)
            return;
        Value inner;
        read(inner);
        value = std::move(inner);
    }
    template<typename Value, std::size_t size>
    void read(std::array<Value, size>& values) {
        for (Value& value : values)
            read(value);
    }

    void checkCharacters(const std::wstring& text) {
        constexpr std::uint32_t kLast = 0x10ffff;
        for (const wchar_t character : text) {
            if (static_cast<std::uint32_t>(character) > kLast)
                reject();
        }
    }

    void take(void* data, std::size_t size) {
        if (size > mBytes.size())
            return reject();
        std::memcpy(data, mBytes.data(), size);
        mBytes.remove_prefix(size);
    }

    std::string_view mBytes;
    bool mGood = true;
};

} // namespace worker
