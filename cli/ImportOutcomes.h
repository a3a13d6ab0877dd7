// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <cstdint>
#include <map>
#include <set>
#include <string>
#include <vector>

#include "cli/ImportFiles.h"
#include "qnsmedia/ImporterTypes.h"

/**
 * What has become of each file. The daemon tells all clients of all imports, gives no numbers to
 * them, and may tell of one twice and of another not at all. So only a notification that names
 * one of our files counts, and what stays open is found out file by file.
 */
class ImportOutcomes {
public:
    struct Outcome {
        bool known = false;
        int result = 0;   ///< as of qnsmedia::ImportNotification
        std::string text; ///< the path in the library, or what went wrong
    };

    /** `folder` inside the library is where the files go; empty: they stay where they are. */
    ImportOutcomes(const std::vector<ImportFile>& files, const std::string& folder);

    /** The file that is on its way into the daemon's queue: what fails there has no name. */
    void setCurrent(std::size_t index) { mCurrent = index; }
    void setNoCurrent() { mCurrent = kNone; }

    /** Whether what is told of it cannot be told apart from what is told of an earlier one. */
    [[nodiscard]] bool isAmbiguous(std::size_t index) const;

    /** From now on one file at a time is asked for: what names no other file is of the current. */
    void beginOneByOne() { mOneByOne = true; }

    /** The daemon tells something. */
    void tell(const qnsmedia::ImportNotification& notification);
    /** What is known about a file; that it failed may turn out to be wrong. */
    void settle(std::size_t index, int result, const std::string& text);

    [[nodiscard]] const Outcome& of(std::size_t index) const { return mOutcomes[index]; }
    [[nodiscard]] std::size_t knownCount() const { return mKnownCount; }
    [[nodiscard]] std::int64_t knownBytes() const { return mKnownBytes; }

private:
    static constexpr std::size_t kNone = static_cast<std::size_t>(-1);

    [[nodiscard]] std::size_t importedAs(const std::string& path);
    [[nodiscard]] std::size_t namedIn(const std::string& message) const;
    [[nodiscard]] std::string nameOf(const std::string& path) const;
    [[nodiscard]] std::size_t firstOpen(const std::string& name) const;

    const std::vector<ImportFile>& mFiles;
    const std::string mFolder; ///< without slashes around it
    std::vector<Outcome> mOutcomes;
    std::multimap<std::string, std::size_t> mByName; ///< by what it may be called in the library
    std::map<std::string, std::size_t> mByPath;
    std::size_t mCurrent = kNone;
    bool mOneByOne = false;
    std::size_t mKnownCount = 0;
    std::int64_t mKnownBytes = 0;
    std::set<std::string> mTold; ///< paths in the library that were matched
};
