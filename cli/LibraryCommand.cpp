// SPDX-License-Identifier: MIT
#include <cstdio>
#include <functional>

#include "cli/Commands.h"
#include "cli/ExitCode.h"
#include "cli/InfoText.h"
#include "cli/LibraryReader.h"
#include "cli/LibraryText.h"
#include "cli/MediaPath.h"
#include "cli/Output.h"

namespace {

using Query = std::function<void(LibraryReader& reader, const LibraryReader::Visitor& visit)>;

std::string dump(const nlohmann::ordered_json& value) {
    return value.dump(-1, ' ', false, nlohmann::json::error_handler_t::replace);
}

/** An array with one object a line, written as it is read. */
void showArray(LibraryReader& reader, const Query& query,
               const std::function<nlohmann::ordered_json(const LibraryRow&)>& object) {
    const char* separator = "[";
    query(reader, [&](const LibraryRow& row) {
        show(separator + ("\n  " + dump(object(row))));
        separator = ",";
    });
    show(*separator == '[' ? "[]\n" : "\n]\n");
}

int showRows(const std::string& database, bool json, const Query& query) {
    LibraryReader reader(database);
    if (json)
        showArray(reader, query, libraryJson);
    else
        query(reader, [](const LibraryRow& row) { show(libraryLine(row)); });
    return kDone;
}

nlohmann::ordered_json wholeJson(LibraryReader& reader, const LibraryRow& row) {
    nlohmann::ordered_json object = libraryJson(row);
    object.update(infoJson(reader.metadata(row)));
    return object;
}

/** As it was written, else as a file from here. */
std::optional<LibraryRow> findRow(LibraryReader& reader, const std::string& key) {
    std::optional<LibraryRow> row = reader.find(key);
    return row ? row : reader.find(mediaPath(key));
}

} // namespace

int libraryListCommand(const std::string& database, bool json) {
    return showRows(database, json,
                    [](LibraryReader& reader, const auto& visit) { reader.list(visit); });
}

int librarySearchCommand(const std::string& database, const std::vector<std::string>& words,
                         bool json) {
    std::string text;
    for (const std::string& word : words)
        text += word + ' ';
    return showRows(database, json,
                    [&](LibraryReader& reader, const auto& visit) { reader.search(text, visit); });
}

int libraryShowCommand(const std::string& database, const std::string& key, bool json) {
    LibraryReader reader(database);
    const std::optional<LibraryRow> row = findRow(reader, key);
    if (!row) {
        std::fprintf(stderr, "qnsmedia: not in the library: %s\n", key.c_str());
        return kFailed;
    }
    show(json ? dump(wholeJson(reader, *row)) + '\n' : libraryText(*row, reader.metadata(*row)));
    return kDone;
}

int libraryExportCommand(const std::string& database) {
    LibraryReader reader(database);
    showArray(
        reader, [](LibraryReader& from, const auto& visit) { from.list(visit); },
        [&](const LibraryRow& row) { return wholeJson(reader, row); });
    return kDone;
}
