// SPDX-License-Identifier: MIT
#include "cli/ImportOutcomes.h"

#include <cctype>
#include <filesystem>
#include <utility>

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

/** "song (2).mp3" is what becomes of "song.mp3" where that name is taken. */
bool isNumbered(const std::string& name, const std::string& original) {
    const std::filesystem::path path(original);
    const std::string begin = path.stem().string() + " (";
    const std::string end = ")" + path.extension().string();
    if (name.size() <= begin.size() + end.size() || name.compare(0, begin.size(), begin) != 0 ||
        !endsWith(name, end))
        return false;
    for (std::size_t at = begin.size(); at < name.size() - end.size(); ++at)
        if (std::isdigit(static_cast<unsigned char>(name[at])) == 0)
            return false;
    return true;
}

} // namespace

ImportOutcomes::ImportOutcomes(const std::vector<ImportFile>& files, const std::string& folder)
    : mFiles(files), mFolder(normalFolder(folder)), mOutcomes(files.size()) {}

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
    while (mFirstOpen < mOutcomes.size() && mOutcomes[mFirstOpen].known)
        ++mFirstOpen;
}

/** A path that is told again is the same import; and of several that fit it is the oldest. */
std::size_t ImportOutcomes::importedAs(const std::string& path) {
    if (mTold.count(path) != 0)
        return kNone;
    for (std::size_t index = mFirstOpen; index < mFiles.size(); ++index) {
        if (mOutcomes[index].known || !fits(mFiles[index], path))
            continue;
        mTold.insert(path);
        return index;
    }
    return kNone;
}

bool ImportOutcomes::fits(const ImportFile& file, const std::string& path) const {
    if (mFolder.empty())
        return path == file.real;
    if (!endsWith(path.substr(0, path.rfind('/')), "/" + mFolder))
        return false;
    const std::string name = lastName(path);
    const std::string original = lastName(file.real);
    return name == original || isNumbered(name, original);
}

std::size_t ImportOutcomes::namedIn(const std::string& message) const {
    const auto names = [&](const std::string& path) {
        return message.find(": " + path + " (") != std::string::npos ||
               endsWith(message, ": " + path);
    };
    for (std::size_t index = mFirstOpen; index < mFiles.size(); ++index)
        if (!mOutcomes[index].known && (names(mFiles[index].path) || names(mFiles[index].real)))
            return index;
    return kNone;
}
