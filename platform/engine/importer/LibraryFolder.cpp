// SPDX-License-Identifier: MIT
#include "importer/LibraryFolder.h"

#include <algorithm>
#include <climits>
#include <cstdio>
#include <cstdlib>
#include <dirent.h>
#include <fcntl.h>
#include <string_view>
#include <sys/stat.h>
#include <unistd.h>
#include <utility>

#include "LibMediaPlayer/Result.h"
#include "importer/Failure.h"
#include "importer/Folders.h"

namespace importer {

using namespace LibMediaPlayer;

namespace {

constexpr char kStaging[] = ".importing";
constexpr char kWriting[] = "The file cannot be copied into the library";
constexpr char kEntering[] = "The folder of the library cannot be used";

[[noreturn]] void refuse(const std::string& folder) {
    throw Failure(kAccessDenied, "The folder leads out of the library: " + folder);
}

Folder openFolder(int parent, const std::string& name, const std::string& path, int flags) {
    qns::UniqueFd file(::openat(parent, name.c_str(), O_RDONLY | O_DIRECTORY | O_CLOEXEC | flags));
    if (!file)
        throw systemFailure(kEntering, path);
    return {std::make_shared<const qns::UniqueFd>(std::move(file)), path};
}

Folder openRoot(const std::string& path) {
    makeFolders(path);
    char real[PATH_MAX];
    if (::realpath(path.c_str(), real) == nullptr)
        throw systemFailure(kEntering, path);
    return openFolder(AT_FDCWD, real, real, 0);
}

bool isLink(const Folder& folder, const std::string& name) {
    struct stat status {};
    return ::fstatat(folder.fd(), name.c_str(), &status, AT_SYMLINK_NOFOLLOW) == 0 &&
           S_ISLNK(status.st_mode);
}

Folder enterOne(const Folder& folder, const std::string& name) {
    const std::string path = folder.path + "/" + name;
    if (::mkdirat(folder.fd(), name.c_str(), 0777) == 0)
        syncFolder(folder.fd(), folder.path);
    else if (errno != EEXIST)
        throw systemFailure(kEntering, path);
    if (isLink(folder, name))
        refuse(path);
    return openFolder(folder.fd(), name, path, O_NOFOLLOW);
}

/** Cuts a text to so many bytes, between two characters. */
std::string_view shortened(std::string_view text, std::size_t size) {
    if (text.size() <= size)
        return text;
    while (size > 0 && (static_cast<unsigned char>(text[size]) & 0xc0) == 0x80)
        --size;
    return text.substr(0, size);
}

} // namespace

bool Folder::has(const std::string& name) const {
    struct stat status {};
    return ::fstatat(fd(), name.c_str(), &status, AT_SYMLINK_NOFOLLOW) == 0;
}

StagedFile::StagedFile(const Folder& staging, std::string name)
    : mStaging(staging),
      mName(std::move(name)),
      mFile(::openat(staging.fd(), mName.c_str(), O_RDWR | O_CREAT | O_EXCL | O_CLOEXEC, 0666)) {
    struct stat status {};
    if (!mFile || ::fstat(mFile.get(), &status) != 0)
        throw systemFailure(kWriting, staging.path + "/" + mName);
    mInode = status.st_ino;
}

StagedFile::~StagedFile() {
    if (!mPublished)
        ::unlinkat(mStaging.fd(), mName.c_str(), 0);
}

void StagedFile::setModified(std::int64_t modified) {
    constexpr std::int64_t kSecond = 1'000'000'000;
    const std::int64_t seconds = modified / kSecond - (modified % kSecond < 0 ? 1 : 0);
    const timespec times[2] = {{0, UTIME_OMIT}, {seconds, modified - seconds * kSecond}};
    ::futimens(mFile.get(), times);
}

void StagedFile::publish(const Folder& folder, const std::string& name, bool replace) {
    const auto rename = [&](unsigned int flags) {
        return ::renameat2(mStaging.fd(), mName.c_str(), folder.fd(), name.c_str(), flags) == 0;
    };
    const unsigned int flags = replace ? 0 : RENAME_NOREPLACE;
    // Not every file system can promise not to replace; there, having looked must do.
    if (!rename(flags) && !(errno == EINVAL && !folder.has(name) && rename(0)))
        throw systemFailure(kWriting, folder.path + "/" + name);
    mPublished = true;
}

LibraryFolder::LibraryFolder(const std::string& path)
    : mRoot(openRoot(path)), mStaging(enterOne(mRoot, kStaging)) {}

bool LibraryFolder::isInPlace() const {
    struct stat open {};
    struct stat named {};
    return ::fstat(mRoot.fd(), &open) == 0 && ::stat(mRoot.path.c_str(), &named) == 0 &&
           open.st_dev == named.st_dev && open.st_ino == named.st_ino && mRoot.has(kStaging);
}

void LibraryFolder::sweep() {
    struct Close {
        void operator()(DIR* folder) const { ::closedir(folder); }
    };
    qns::UniqueFd copy(::openat(mStaging.fd(), ".", O_RDONLY | O_DIRECTORY | O_CLOEXEC));
    const std::unique_ptr<DIR, Close> folder(::fdopendir(copy.get()));
    if (!folder)
        return;
    (void)copy.release();
    while (const dirent* const entry = ::readdir(folder.get()))
        ::unlinkat(mStaging.fd(), entry->d_name, 0);
}

Folder LibraryFolder::enter(const std::string& relative) const {
    if (relative.empty() || relative.front() == '/')
        refuse(relative);
    Folder folder = mRoot;
    for (std::size_t start = 0; start < relative.size();) {
        const std::size_t end = std::min(relative.find('/', start), relative.size());
        const std::string name = relative.substr(start, end - start);
        start = end + 1;
        if (name.empty() || name == ".")
            continue;
        if (name == ".." || name == kStaging || name.find('\0') != std::string::npos)
            refuse(relative);
        folder = enterOne(folder, name);
    }
    return folder;
}

std::unique_ptr<StagedFile> LibraryFolder::stage() {
    return std::make_unique<StagedFile>(mStaging, std::to_string(++mStagedCount));
}

bool LibraryFolder::hasStaging(const std::string& path) {
    return ::access((path + "/" + kStaging).c_str(), F_OK) == 0;
}

std::string numberedName(const std::string& name, int number) {
    if (number == 1)
        return name;
    const std::size_t dot = name.rfind('.');
    const bool hasEnding = dot != std::string::npos && dot > 0;
    const std::string ending =
        " (" + std::to_string(number) + ")" + (hasEnding ? name.substr(dot) : std::string());
    const std::size_t room = NAME_MAX > ending.size() ? NAME_MAX - ending.size() : 1;
    return std::string(
               shortened(std::string_view(name).substr(0, hasEnding ? dot : name.size()), room)) +
           ending;
}

} // namespace importer
