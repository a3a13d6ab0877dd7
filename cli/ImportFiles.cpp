// SPDX-License-Identifier: MIT
#include "cli/ImportFiles.h"

#include <algorithm>
#include <cctype>
#include <filesystem>
#include <system_error>
#include <utility>

#include "cli/MediaPath.h"

namespace fs = std::filesystem;

namespace {

class Finder {
public:
    explicit Finder(const std::set<std::string>& extensions) : mExtensions(extensions) {}

    void add(const std::string& path) {
        std::error_code error;
        if (fs::is_directory(path, error))
            addFolder(mediaPath(path));
        else
            addFile(mediaPath(path));
    }

    ImportFiles take() { return std::move(mFound); }

private:
    /** Symbolic links to folders are not followed: they may lead in a circle. */
    void addFolder(const fs::path& folder) {
        std::vector<fs::directory_entry> entries;
        std::error_code error;
        fs::directory_iterator entry(folder, error);
        for (; !error && entry != fs::directory_iterator(); entry.increment(error))
            entries.push_back(*entry);
        if (error)
            mFound.unreadable.push_back(folder.string() + ": " + error.message());
        std::sort(entries.begin(), entries.end());
        for (const fs::directory_entry& each : entries)
            addEntry(each);
    }

    void addEntry(const fs::directory_entry& entry) {
        std::error_code error;
        if (entry.path().filename().string().front() == '.')
            return;
        if (entry.is_directory(error) && !entry.is_symlink(error))
            addFolder(entry.path());
        else if (entry.is_regular_file(error) && isMedium(entry.path()))
            addFile(entry.path().string());
    }

    [[nodiscard]] bool isMedium(const fs::path& path) const {
        std::string extension = path.extension().string().substr(path.has_extension() ? 1 : 0);
        std::transform(extension.begin(), extension.end(), extension.begin(),
                       [](unsigned char letter) { return std::tolower(letter); });
        return mExtensions.count(extension) != 0;
    }

    void addFile(const std::string& path) {
        std::error_code error;
        const fs::path real = fs::canonical(path, error);
        const std::string name = error ? path : real.string();
        if (!mSeen.insert(name).second)
            return;
        const std::uintmax_t size = fs::file_size(path, error);
        mFound.files.push_back({path, name, error ? 0 : static_cast<std::int64_t>(size)});
    }

    const std::set<std::string>& mExtensions;
    std::set<std::string> mSeen;
    ImportFiles mFound;
};

} // namespace

ImportFiles findImportFiles(const std::vector<std::string>& paths,
                            const std::set<std::string>& extensions) {
    Finder finder(extensions);
    for (const std::string& path : paths)
        finder.add(path);
    return finder.take();
}
