// SPDX-License-Identifier: MIT
#include "bench/media/Readers.h"

#include <chrono>
#include <fcntl.h>
#include <future>
#include <stdexcept>
#include <sys/stat.h>

extern "C" {
#include <libavformat/avformat.h>
}

#include "LibMediaPlayer/IMediaDiscoverer.h"
#include "LibMediaPlayer/InterfaceFactory.h"
#include "bench/ChildProcess.h"
#include "qnsmedia/Discoverer.h"
#include "reader/Description.h"
#include "reader/OpenMedia.h"

namespace bench {
namespace {

void require(bool isTrue, const std::string& what) {
    if (!isTrue)
        throw std::runtime_error("cannot be read: " + what);
}

class DaemonReader : public MediaReader {
public:
    explicit DaemonReader(qnsmedia::Connection& connection) : mDiscoverer(connection) {}

    void read(const std::string& path) override {
        mDiscoverer.open(path).get();
        mDiscoverer.metadata().get();
        mDiscoverer.close().get();
    }

private:
    qnsmedia::Discoverer mDiscoverer;
};

class EngineReader : public MediaReader {
public:
    void read(const std::string& path) override {
        LibMediaPlayer::MediaMetaInfo info;
        require(mpDiscoverer->open({path.begin(), path.end()}) == 0 &&
                    mpDiscoverer->metadata(info) == 0,
                path);
        mpDiscoverer->close();
    }

private:
    const std::unique_ptr<LibMediaPlayer::IMediaDiscoverer> mpDiscoverer{
        LibMediaPlayer::InterfaceFactory::createDiscoverer()};
};

class WorkerlessReader : public MediaReader {
public:
    void read(const std::string& path) override {
        probe::RegularFile file;
        std::unique_ptr<probe::MediaFile> pMedia;
        require(file.open(path) == 0 &&
                    reader::openMedia(std::move(file), probe::MediaFile::kLook, pMedia) == 0,
                path);
        mDetails = reader::readDetails(*pMedia);
    }

private:
    discoverer::Details mDetails; ///< so that they are not made for nothing
};

class LibavReader : public MediaReader {
public:
    LibavReader() { av_log_set_level(AV_LOG_QUIET); }

    void read(const std::string& path) override {
        AVFormatContext* context = nullptr;
        require(avformat_open_input(&context, path.c_str(), nullptr, nullptr) >= 0, path);
        const bool isRead = avformat_find_stream_info(context, nullptr) >= 0;
        avformat_close_input(&context);
        require(isRead, path);
    }
};

class CommandReader : public MediaReader {
public:
    explicit CommandReader(std::vector<std::string> command) : mCommand(std::move(command)) {}

    void read(const std::string& path) override {
        std::vector<std::string> command = mCommand;
        command.push_back(path);
        ChildProcess::run(command).waitForEnd();
    }

private:
    const std::vector<std::string> mCommand;
};

constexpr int kWidth = 320;

class DaemonDrawer : public PictureDrawer {
public:
    explicit DaemonDrawer(qnsmedia::Connection& connection) : mDiscoverer(connection) {}

    void draw(const std::string& path, int second, const std::string& target) override {
        mDiscoverer.open(path).get();
        mDiscoverer.makeImage(std::chrono::seconds(second), kWidth, 0, target).get();
        mDiscoverer.close().get();
    }

private:
    qnsmedia::Discoverer mDiscoverer;
};

class ThumbnailerDrawer : public PictureDrawer {
public:
    void draw(const std::string& path, int second, const std::string& target) override {
        ChildProcess::run({"ffmpegthumbnailer", "-i", path, "-o", target, "-s",
                           std::to_string(kWidth), "-t", "00:00:0" + std::to_string(second), "-c",
                           "jpeg"})
            .waitForEnd();
    }
};

} // namespace

std::unique_ptr<MediaReader> makeDaemonReader(qnsmedia::Connection& connection) {
    return std::make_unique<DaemonReader>(connection);
}

std::unique_ptr<MediaReader> makeEngineReader() {
    return std::make_unique<EngineReader>();
}

std::unique_ptr<MediaReader> makeWorkerlessReader() {
    return std::make_unique<WorkerlessReader>();
}

std::unique_ptr<MediaReader> makeLibavReader() {
    return std::make_unique<LibavReader>();
}

std::unique_ptr<MediaReader> makeCommandReader(std::vector<std::string> command) {
    return std::make_unique<CommandReader>(std::move(command));
}

std::unique_ptr<PictureDrawer> makeDaemonDrawer(qnsmedia::Connection& connection) {
    return std::make_unique<DaemonDrawer>(connection);
}

std::unique_ptr<PictureDrawer> makeThumbnailerDrawer() {
    return std::make_unique<ThumbnailerDrawer>();
}

void touch(const std::string& file) {
    ::utimensat(AT_FDCWD, file.c_str(), nullptr, 0);
}

double readSideBySide(const std::vector<std::unique_ptr<MediaReader>>& team,
                      const std::vector<std::string>& files) {
    const auto begin = std::chrono::steady_clock::now();
    std::vector<std::future<void>> working;
    for (std::size_t first = 0; first < team.size(); ++first)
        working.push_back(std::async(std::launch::async, [&, first] {
            for (std::size_t index = first; index < files.size(); index += team.size())
                team[first]->read(files[index]);
        }));
    for (std::future<void>& work : working)
        work.get();
    return std::chrono::duration<double>(std::chrono::steady_clock::now() - begin).count();
}

} // namespace bench
