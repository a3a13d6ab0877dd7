// SPDX-License-Identifier: MIT
#include "discoverer/FileIdentity.h"

#include <chrono>
#include <tuple>

namespace discoverer {

namespace {

constexpr std::chrono::milliseconds kLongestStep{50};

std::int64_t nanoseconds(const timespec& time) {
    return time.tv_sec * INT64_C(1'000'000'000) + time.tv_nsec;
}

struct stat statusOf(const std::string& path) {
    struct stat status {};
    if (::stat(path.c_str(), &status) != 0)
        status = {};
    return status;
}

auto fieldsOf(const FileIdentity& file) {
    return std::tie(file.device, file.inode, file.size, file.modified, file.changed);
}

} // namespace

FileIdentity::FileIdentity(const struct stat& status)
    : device(status.st_dev),
      inode(status.st_ino),
      size(status.st_size),
      modified(nanoseconds(status.st_mtim)),
      changed(nanoseconds(status.st_ctim)) {}

FileIdentity::FileIdentity(const std::string& path) : FileIdentity(statusOf(path)) {}

bool FileIdentity::isSettled() const {
    const auto age =
        std::chrono::system_clock::now().time_since_epoch() - std::chrono::nanoseconds(changed);
    return age > kLongestStep;
}

bool operator==(const FileIdentity& one, const FileIdentity& other) {
    return fieldsOf(one) == fieldsOf(other);
}

} // namespace discoverer
