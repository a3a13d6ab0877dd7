// SPDX-License-Identifier: MIT
#include "cli/LibraryText.h"

#include <array>
#include <cstdio>
#include <ctime>

#include "cli/HumanSize.h"
#include "cli/HumanTime.h"
#include "cli/InfoText.h"

namespace {

std::string dateText(std::int64_t seconds) {
    const auto time = static_cast<std::time_t>(seconds);
    std::tm fields{};
    std::array<char, 64> text{};
    if (::localtime_r(&time, &fields) == nullptr)
        return std::to_string(seconds);
    return {text.data(), std::strftime(text.data(), text.size(), "%Y-%m-%d %H:%M:%S", &fields)};
}

} // namespace

std::string libraryLine(const LibraryRow& row) {
    const std::string duration =
        row.duration.count() > 0 ? humanTime(row.duration) : std::string("-");
    std::array<char, 64> begin{};
    std::snprintf(begin.data(), begin.size(), "%6lld  %9s  ", static_cast<long long>(row.id),
                  duration.c_str());
    std::string text = begin.data();
    if (!row.artist.empty())
        text += row.artist + " - ";
    text += row.title.empty() ? row.path.substr(row.path.rfind('/') + 1) : row.title;
    if (!row.album.empty())
        text += " (" + row.album + ")";
    return text + '\n';
}

std::string libraryText(const LibraryRow& row, const qnsmedia::Metadata& metadata) {
    std::string text = row.path + '\n';
    text += "  id          " + std::to_string(row.id) + '\n';
    if (row.source != row.path)
        text += "  copied from " + row.source + '\n';
    text += "  size        " + humanSize(row.size) + '\n';
    text += "  imported    " + dateText(row.imported) + '\n';
    return text + infoText(metadata);
}

nlohmann::ordered_json libraryJson(const LibraryRow& row) {
    return {{"id", row.id},       {"path", row.path},         {"source", row.source},
            {"size", row.size},   {"imported", row.imported}, {"duration_ns", row.duration.count()},
            {"title", row.title}, {"artist", row.artist},     {"album", row.album}};
}
