// SPDX-License-Identifier: MIT
#include "cli/ImportProgress.h"

#include <algorithm>

#include "cli/HumanSize.h"
#include "cli/HumanTime.h"

namespace {

constexpr std::size_t kBarWidth = 20;

/** Too early for a rate that means anything. */
constexpr std::chrono::milliseconds kSettling{500};

double shareDone(const ImportProgress& progress) {
    if (progress.bytesInAll <= 0)
        return progress.filesInAll == 0
                   ? 1
                   : static_cast<double>(progress.files) / static_cast<double>(progress.filesInAll);
    const double share =
        static_cast<double>(progress.bytes) / static_cast<double>(progress.bytesInAll);
    return std::clamp(share, 0.0, 1.0);
}

std::string bar(double share) {
    const auto full = static_cast<std::size_t>(share * kBarWidth);
    return "[" + std::string(full, '#') + std::string(kBarWidth - full, '.') + "] ";
}

/** The time left without tenths, which would only flicker. */
std::string leftText(double seconds) {
    const std::chrono::seconds left(static_cast<long>(std::min(seconds, 1e7)));
    const std::string text = humanTime(left);
    return text.substr(0, text.rfind('.'));
}

} // namespace

std::string progressText(const ImportProgress& progress) {
    const double share = shareDone(progress);
    std::string text = bar(share) + std::to_string(progress.files) + "/" +
                       std::to_string(progress.filesInAll) + " files, " +
                       humanSize(progress.bytes) + " of " + humanSize(progress.bytesInAll);
    if (progress.elapsed < kSettling || share <= 0)
        return text;
    const double seconds = std::chrono::duration<double>(progress.elapsed).count();
    text += ", " +
            humanSize(static_cast<std::int64_t>(static_cast<double>(progress.bytes) / seconds)) +
            "/s, " + leftText(seconds / share - seconds) + " left";
    return text;
}
