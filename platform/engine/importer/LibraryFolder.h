// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <string>
#include <sys/types.h>

#include "base/UniqueFd.h"

namespace importer {

/** A folder of the library, open. */
struct Folder {
    std::shared_ptr<const qns::UniqueFd> file;
    std::string path; ///< without links

    [[nodiscard]] int fd() const { return file->get(); }
    [[nodiscard]] bool has(const std::string& name) const;
};

/** A copy under a temporary name. It goes with this object unless it was published. */
class StagedFile {
public:
    /** Makes the file. Throws Failure. */
    StagedFile(const Folder& staging, std::string name);
    ~StagedFile();
    StagedFile(const StagedFile&) = delete;
    StagedFile& operator=(const StagedFile&) = delete;

    [[nodiscard]] int file() const { return mFile.get(); }
    [[nodiscard]] ino_t inode() const { return mInode; }

    /** Sets the time of last modification, nanoseconds since 1970. */
    void setModified(std::int64_t modified);

    /** Gives the file its final name, taking another file's place only if asked to. */
    void publish(const Folder& folder, const std::string& name, bool replace);

private:
    const Folder mStaging;
    const std::string mName;
    qns::UniqueFd mFile;
    ino_t mInode = 0;
    bool mPublished = false;
};

/**
 * The folder that holds the library's files. Everything in it is reached through open folders,
 * one name after another and never through a symbolic link, so that no text leads out of it.
 */
class LibraryFolder {
public:
    /** Makes the folder if need be. Throws Failure. */
    explicit LibraryFolder(const std::string& path);

    /** False when the folder has been removed, or another one put in its place. */
    [[nodiscard]] bool isInPlace() const;

    /** Removes what interrupted copies have left. */
    void sweep();

    /** Opens, and makes if need be, a folder below. Throws Failure when the text leads outside. */
    [[nodiscard]] Folder enter(const std::string& relative) const;

    [[nodiscard]] std::unique_ptr<StagedFile> stage();

    /** True when `path` has a folder for copies that may have been interrupted. */
    static bool hasStaging(const std::string& path);

private:
    Folder mRoot;
    Folder mStaging;
    unsigned long mStagedCount = 0;
};

/** The number-th name for a file that would like to be called `name`: "a.mp4", "a (2).mp4" ... */
std::string numberedName(const std::string& name, int number);

} // namespace importer
