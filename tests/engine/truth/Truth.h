// SPDX-License-Identifier: MIT
#pragma once

#include <filesystem>
#include <ostream>
#include <string>
#include <vector>

#include <nlohmann/json.hpp>

/** A file and what it was made with; the script that makes them says what the fields mean. */
struct TrueMedium {
    std::string name;
    nlohmann::json fields;

    [[nodiscard]] bool isRefused() const { return fields.contains("result"); }
    [[nodiscard]] bool hasVideo() const {
        return fields.value("video", nlohmann::json()) != nullptr;
    }
};

inline std::ostream& operator<<(std::ostream& stream, const TrueMedium& medium) {
    return stream << medium.name;
}

const std::vector<TrueMedium>& trueMedia();

std::filesystem::path truthPath(const std::string& name);
