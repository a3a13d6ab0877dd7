// SPDX-License-Identifier: MIT
// A library without files and daemon: what a row costs while it grows, and searching in it.
#include <algorithm>
#include <chrono>
#include <filesystem>
#include <functional>
#include <string>

#include "bench/Benches.h"
#include "bench/ScratchFolder.h"
#include "bench/scale/CurveBuilder.h"
#include "bench/scale/Scales.h"
#include "library/Database.h"

namespace bench {
namespace {

namespace fs = std::filesystem;
using Clock = std::chrono::steady_clock;

constexpr int kDefaultRounds = 3;
constexpr int kGrowthRounds = 3;
constexpr int kBatch = 128; // as many as the importer commits together

double milliseconds(const std::function<void()>& work) {
    const auto begin = Clock::now();
    work();
    return std::chrono::duration<double, std::milli>(Clock::now() - begin).count();
}

std::wstring syllable(unsigned number) {
    constexpr wchar_t kFirst[] = L"bdfglmrs";
    constexpr wchar_t kMiddle[] = L"aeio";
    constexpr wchar_t kLast[] = L"nt";
    return {kFirst[number % 8], kMiddle[number / 8 % 4], kLast[number / 32 % 2]};
}

/** A word of a vocabulary of four thousand, as titles have them. */
std::wstring word(unsigned number) {
    number = number * 2654435761U >> 20;
    return syllable(number % 64) + syllable(number / 64);
}

library::MediaRecord recordOf(int number) {
    const auto seed = static_cast<unsigned>(number);
    library::MediaRecord record;
    record.path = "/media/music/" + std::to_string(number / 10) + "/" + std::to_string(number);
    record.source = record.path;
    record.size = 5'000'000 + number;
    record.modified = number;
    record.imported = number;
    auto& info = record.info;
    info.system.mediaType = "audio/mpeg";
    info.system.tags = L"TITLE=" + word(seed) + L" " + word(seed / 3 + 7) + L" " + word(seed * 5) +
                       L"\nARTIST=" + word(seed / 50) + L" " + word(seed / 50 + 1) + L"\nALBUM=" +
                       word(seed / 10 + 3) + L"\nDATE=2001\nGENRE=Folk\nTRACKNUMBER=" +
                       std::to_wstring(number % 10) + L"\n";
    info.system.duration = 200'000'000'000;
    info.audioCount = 1;
    info.audio[0].mediaType = "audio/mpeg";
    info.audio[0].description = L"MP3 (MPEG audio layer 3)";
    return record;
}

class GrowingLibrary {
public:
    explicit GrowingLibrary(const fs::path& file) : mDatabase(file.string()) {}

    /** Returns what a row has cost, in milliseconds. */
    double growTo(int size) {
        const int begin = mSize;
        const double spent = milliseconds([&] {
            while (mSize < size)
                addBatch(std::min(size, mSize + kBatch));
        });
        return spent / (size - begin);
    }

private:
    void addBatch(int end) {
        library::Database::Transaction transaction(mDatabase);
        for (; mSize < end; ++mSize)
            mDatabase.put(recordOf(mSize));
        transaction.commit();
    }

    library::Database mDatabase;
    int mSize = 0;
};

struct Search {
    const char* name;
    const char* words;
    const char* order;
};

constexpr Search kSearches[] = {
    {"a word", "latdon", "ORDER BY rank"},  {"two words", "latdon gen*", "ORDER BY rank"},
    {"3 letters", "lat*", "ORDER BY rank"}, {"2 letters", "la*", "ORDER BY rank"},
    {"2 letters, any", "la*", ""},
};

int countRows(const SQLite::Database& database, const std::string& query) {
    SQLite::Statement rows(database, query);
    int count = 0;
    while (rows.executeStep())
        ++count;
    return count;
}

/** Appends what the search takes, so many times. */
void measureSearch(const Search& search, const fs::path& file, int times,
                   std::vector<double>& samples) {
    const SQLite::Database database(file.string());
    const std::string query = std::string("SELECT media.id, media.title FROM media_search('") +
                              search.words + "') JOIN media ON media.id = media_search.rowid " +
                              search.order + " LIMIT 50";
    for (int i = 0; i < times; ++i)
        samples.push_back(milliseconds([&] { countRows(database, query); }));
}

void measureGrowth(GrowingLibrary& library, int size, std::vector<double>& samples) {
    library.growTo(size - kGrowthRounds * 2 * kBatch);
    for (int left = kGrowthRounds - 1; left >= 0; --left)
        samples.push_back(library.growTo(size - left * 2 * kBatch));
}

void measureAll(const fs::path& file, const std::vector<int>& sizes, int rounds, Report& report) {
    GrowingLibrary library(file);
    CurveBuilder growth({"a row put into the library", "ms", "rows", sizes, {}});
    CurveBuilder searches({"search, best 50", "ms", "rows", sizes, {}});
    growth.addLine("library", Role::ours);
    for (const Search& search : kSearches)
        searches.addLine(search.name, Role::ours);
    for (std::size_t place = 0; place < sizes.size(); ++place) {
        measureGrowth(library, sizes[place], growth.samples(0, place));
        for (std::size_t i = 0; i < std::size(kSearches); ++i)
            measureSearch(kSearches[i], file, rounds * 10, searches.samples(i, place));
    }
    report.add(growth.finish());
    report.add(searches.finish());
}

} // namespace

bool measureLibraryRows(const Options& options, Report& report) {
    const ScratchFolder scratch;
    const fs::path& folder = scratch.path();
    std::vector<int> sizes = {1'000, 3'000, 10'000};
    if (!options.quick)
        sizes.insert(sizes.end(), {30'000, 100'000});
    measureAll(folder / "media.db", sizes, roundsOf(options, kDefaultRounds, 1), report);
    return true;
}

} // namespace bench
