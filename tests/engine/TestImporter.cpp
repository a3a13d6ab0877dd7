// SPDX-License-Identifier: MIT
#include "tests/engine/TestImporter.h"

#include <algorithm>
#include <array>
#include <cstdio>
#include <cstdlib>
#include <fstream>
#include <gtest/gtest.h>
#include <sstream>
#include <utility>

#include "importer/Importer.h"
#include "text/Text.h"

namespace fs = std::filesystem;
using namespace LibMediaPlayer;

namespace {

constexpr std::chrono::seconds kPatience{30};

} // namespace

TestFolder::TestFolder() {
    std::string pattern = (fs::canonical(fs::temp_directory_path()) / "import-XXXXXX").string();
    if (::mkdtemp(pattern.data()) == nullptr)
        throw std::runtime_error("no temporary folder");
    mPath = pattern;
}

TestFolder::~TestFolder() {
    std::error_code error;
    fs::remove_all(mPath, error);
}

void writeFile(const fs::path& path, const std::string& content) {
    fs::create_directories(path.parent_path());
    std::ofstream(path, std::ios::binary) << content;
}

std::string readFile(const fs::path& path) {
    std::ifstream file(path, std::ios::binary);
    std::ostringstream content;
    content << file.rdbuf();
    return content.str();
}

std::vector<std::string> listFolder(const fs::path& folder) {
    std::vector<std::string> names;
    for (const fs::directory_entry& entry : fs::recursive_directory_iterator(folder))
        names.push_back(fs::relative(entry.path(), folder).string() +
                        (entry.is_directory() ? "/" : ""));
    std::sort(names.begin(), names.end());
    return names;
}

std::string askDatabase(const fs::path& database, const std::string& query) {
    const std::string command = "sqlite3 '" + database.string() + "' \"" + query + "\" 2>&1";
    const std::unique_ptr<std::FILE, int (*)(std::FILE*)> pipe(::popen(command.c_str(), "re"),
                                                               ::pclose);
    std::string answer;
    std::array<char, 4096> part{};
    while (const std::size_t size = std::fread(part.data(), 1, part.size(), pipe.get()))
        answer.append(part.data(), size);
    if (!answer.empty() && answer.back() == '\n')
        answer.pop_back();
    return answer;
}

importer::Probe anyMedium(const std::wstring& tags) {
    return [tags](const std::string&) {
        importer::Probed probed;
        probed.info.system.mediaType = "video/test";
        probed.info.system.tags = tags;
        return probed;
    };
}

std::wstring wide(const fs::path& path) {
    return engine::toWide(path.string());
}

TestImporter::TestImporter(const fs::path& data, importer::Probe probe, Handler onNotify,
                           importer::DrawThumbnail drawThumbnail) {
    importer::Options options;
    options.dataFolder = data.string();
    options.probe = std::move(probe);
    options.drawThumbnail = std::move(drawThumbnail);
    options.progressInterval = std::chrono::milliseconds(0);
    mpImporter = std::make_unique<importer::Importer>(std::move(options));
    mpImporter->setNotify([this, onNotify = std::move(onNotify)](Notification& notification) {
        if (onNotify)
            onNotify(notification);
        {
            const std::lock_guard lock(mMutex);
            mNotifications.push_back(notification);
        }
        mArrived.notify_all();
    });
}

TestImporter::~TestImporter() {
    destroy();
}

void TestImporter::destroy() {
    mpImporter.reset();
}

void TestImporter::queue(const fs::path& file, const std::string& folder) {
    ASSERT_EQ(mpImporter->import(wide(file), wide(folder)), kOk);
}

TestImporter::Notification TestImporter::import(const fs::path& file, const std::string& folder) {
    queue(file, folder);
    return awaitFinished();
}

TestImporter::Notification TestImporter::awaitFinished() {
    std::unique_lock lock(mMutex);
    Notification answer{0, -2, L"no answer"};
    mArrived.wait_for(lock, kPatience, [&] {
        while (mSeen < mNotifications.size()) {
            const Notification& next = mNotifications[mSeen++];
            if (next.kind != kImportFinished)
                continue;
            answer = next;
            return true;
        }
        return false;
    });
    return answer;
}

std::vector<TestImporter::Notification> TestImporter::notifications() const {
    const std::lock_guard lock(mMutex);
    return mNotifications;
}
