// SPDX-License-Identifier: MIT
#include "cli/ImportOutcomes.h"

#include <algorithm>
#include <filesystem>

#include "qnsmedia/Error.h"

namespace {

std::string lastName(const std::string& path) {
    return path.substr(path.rfind('/') + 1);
}

bool endsWith(const std::string& text, const std::string& end) {
    return text.size() >= end.size() &&
           text.compare(text.size() - end.size(), std::string::npos, end) == 0;
}

std::string normalFolder(const std::string& folder) {
    const std::string normal = std::filesystem::path(folder).lexically_normal().string();
    const std::size_t begin = normal.find_first_not_of('/');
    const std::size_t end = normal.find_last_not_of('/');
    return begin == std::string::npos ? "" : normal.substr(begin, end + 1 - begin);
}

/** "song.mp3" for "song (2).mp3", which it becomes where the name is taken; else the name. */
std::string withoutNumber(const std::string& name) {
    const std::filesystem::path path(name);
    const std::string stem = path.stem().string();
    const std::size_t begin = stem.rfind(" (");
    if (begin == std::string::npos || begin + 3 >= stem.size() || stem.back() != ')' ||
        stem.find_first_not_of("0123456789", begin + 2) != stem.size() - 1)
        return name;
    return stem.substr(0, begin) + path.extension().string();
}

} // namespace

ImportOutcomes::ImportOutcomes(const std::vector<ImportFile>& files, const std::string& folder)
    : mFiles(files), mFolder(normalFolder(folder)), mOutcomes(files.size()) {
    for (std::size_t index = 0; index < files.size(); ++index) {
        const ImportFile& file = files[index];
        mByName.emplace(nameOf(file.real), index);
        mByPath.emplace(file.path, index);
        mByPath.emplace(file.real, index);
    }
}

/** What an engine says of another client's file ends here, too: nothing of ours is named. */
void ImportOutcomes::tell(const qnsmedia::ImportNotification& notification) {
    if (notification.kind != qnsmedia::ImportNotificationKind::finished)
        return;
    std::size_t index = mCurrent;
    if (notification.result == 0)
        index = importedAs(notification.text);
    else if (!notification.text.empty())
        index = namedIn(notification.text);
    if (index != kNone)
        settle(index, notification.result,
               notification.text.empty() ? qnsmedia::resultText(notification.result)
                                         : notification.text);
}

void ImportOutcomes::settle(std::size_t index, int result, const std::string& text) {
    Outcome& outcome = mOutcomes[index];
    if (!outcome.known) {
        ++mKnownCount;
        mKnownBytes += mFiles[index].size;
    } else if (outcome.result == 0) {
        return;
    }
    outcome = {true, result, text};
}

/** What a file and what becomes of it have in common. */
std::string ImportOutcomes::nameOf(const std::string& path) const {
    return mFolder.empty() ? path : withoutNumber(lastName(path));
}

bool ImportOutcomes::isAmbiguous(std::size_t index) const {
    return mByName.find(nameOf(mFiles[index].real))->second != index;
}

/** A path that is told again is the same import. */
std::size_t ImportOutcomes::importedAs(const std::string& path) {
    const bool isThere =
        mFolder.empty() || endsWith(path.substr(0, path.rfind('/')), "/" + mFolder);
    if (!isThere || mTold.count(path) != 0)
        return kNone;
    std::size_t index = firstOpen(nameOf(path));
    if (mOneByOne)
        index =
            mCurrent != kNone && nameOf(mFiles[mCurrent].real) == nameOf(path) ? mCurrent : kNone;
    if (index != kNone)
        mTold.insert(path);
    return index;
}

std::size_t ImportOutcomes::firstOpen(const std::string& name) const {
    const auto [begin, end] = mByName.equal_range(name);
    for (auto each = begin; each != end; ++each)
        if (const Outcome& outcome = mOutcomes[each->second]; !outcome.known || outcome.result != 0)
            return each->second;
    return kNone;
}

/** Messages end with the path, or with the path and a reason in brackets. */
std::size_t ImportOutcomes::namedIn(const std::string& message) const {
    for (std::size_t at = 0; (at = message.find(": ", at)) != std::string::npos; at += 2) {
        const std::string rest = message.substr(at + 2);
        for (std::size_t end = rest.size(); end != std::string::npos && end > 0;
             end = rest.rfind(" (", end - 1))
            if (const auto file = mByPath.find(rest.substr(0, end)); file != mByPath.end())
                return file->second;
    }
    return mOneByOne ? mCurrent : kNone;
}
