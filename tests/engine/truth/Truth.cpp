// SPDX-License-Identifier: MIT
#include "tests/engine/truth/Truth.h"

#include <fstream>

const std::vector<TrueMedium>& trueMedia() {
    static const std::vector<TrueMedium> media = [] {
        std::vector<TrueMedium> read;
        std::ifstream file(truthPath("truth.json"));
        const auto table = nlohmann::json::parse(file);
        for (const auto& [name, fields] : table.items())
            read.push_back({name, fields});
        return read;
    }();
    return media;
}

std::filesystem::path truthPath(const std::string& name) {
    return std::filesystem::path(QNS_TRUTH) / name;
}
