// SPDX-License-Identifier: MIT
#include "tests/daemon/support/Lines.h"

#include <algorithm>
#include <iterator>
#include <utility>

#include "tests/daemon/support/Patience.h"

namespace {

bool contains(const std::string& line, std::string_view text) {
    return line.find(text) != std::string::npos;
}

} // namespace

void Lines::add(std::string line) {
    const std::lock_guard lock(mMutex);
    mLines.push_back(std::move(line));
    mChanged.notify_all();
}

void Lines::close() {
    const std::lock_guard lock(mMutex);
    mClosed = true;
    mChanged.notify_all();
}

bool Lines::waitFor(std::string_view text, std::size_t wanted) {
    std::unique_lock lock(mMutex);
    mChanged.wait_until(lock, patience::deadline(),
                        [&] { return mClosed || count(text) >= wanted; });
    return count(text) >= wanted;
}

bool Lines::waitForEnd() {
    std::unique_lock lock(mMutex);
    return mChanged.wait_until(lock, patience::deadline(), [this] { return mClosed; });
}

std::vector<std::string> Lines::all() const {
    const std::lock_guard lock(mMutex);
    return mLines;
}

std::vector<std::string> Lines::with(std::string_view text) const {
    std::vector<std::string> found;
    const auto lines = all();
    std::copy_if(lines.begin(), lines.end(), std::back_inserter(found),
                 [&](const std::string& line) { return contains(line, text); });
    return found;
}

std::string Lines::joined() const {
    std::string text;
    for (const auto& line : all())
        text += line + '\n';
    return text;
}

std::size_t Lines::count(std::string_view text) const {
    return static_cast<std::size_t>(
        std::count_if(mLines.begin(), mLines.end(),
                      [&](const std::string& line) { return contains(line, text); }));
}
