// SPDX-License-Identifier: MIT
#include "fuzz/support/Engine.h"

#include <utility>

#include "LibMediaPlayer/InterfaceFactory.h"
#include "LibMediaPlayer/Result.h"
#include "fuzz/support/Require.h"
#include "ptc/EventPacket.h"

using namespace LibMediaPlayer;

namespace fuzz {

namespace {

/** Every text of a request has come in one packet. */
int answerTo(const std::wstring& path) {
    require(path.size() <= static_cast<std::size_t>(PTC::kMaxPayloadSize));
    return engine().result;
}

class Player : public IMediaPlayer {
public:
    ~Player() override { engine().notifyPlayer = nullptr; }

    int open(const std::wstring& path, int format) override {
        require(format == kDisplay60Hz || format == kDisplay50Hz);
        require(!path.empty());
        return answerTo(path);
    }
    int close() override { return engine().result; }
    int play() override { return engine().result; }
    int pause() override { return engine().result; }
    int seek(long, int) override { return engine().result; }
    int status(long& position, long& duration) override {
        position = engine().position;
        duration = engine().duration;
        return engine().result;
    }
    void setNotify(std::function<void(MediaPlayerNotify&)> notify) override {
        engine().notifyPlayer = std::move(notify);
    }
    int dumpGraph(const std::wstring& path) override { return answerTo(path); }
    int repeat(RepeatParam&) override { return engine().result; }
};

class Discoverer : public IMediaDiscoverer {
public:
    int open(const std::wstring& path) override { return answerTo(path); }
    int close() override { return engine().result; }
    int metadata(MediaMetaInfo& info) override {
        info = engine().info;
        return engine().result;
    }
    int reserved5() override { return engine().result; }
    int makeImage(int64_t position, int32_t, int32_t, const std::wstring& path) override {
        require(position <= std::max<int64_t>(engine().info.system.duration, 1));
        return answerTo(path) != 0 || position % 2 != 0 ? kNotAvailable : kOk;
    }
    int reserved7() override { return engine().result; }
    int supportedExtensions(SupportedExtensions& extensions) override {
        extensions = engine().extensions;
        return engine().result;
    }
};

class Importer : public IMediaImporter {
public:
    ~Importer() override { engine().notifyImporter = nullptr; }

    int import(const std::wstring& path, const std::wstring& folder) override {
        answerTo(folder);
        return answerTo(path);
    }
    int cancel() override { return engine().result; }
    int status(MediaImporterStatus& status) override {
        status = {engine().position, engine().duration};
        return engine().result;
    }
    void setNotify(std::function<void(MediaImporterNotify&)> notify) override {
        engine().notifyImporter = std::move(notify);
    }
    int dumpGraph(const std::wstring& path) override { return answerTo(path); }
};

} // namespace

Engine& engine() {
    static Engine instance;
    return instance;
}

} // namespace fuzz

namespace LibMediaPlayer {

IMediaPlayer* InterfaceFactory::createPlayer(void*, unsigned int) {
    return new fuzz::Player;
}

IMediaDiscoverer* InterfaceFactory::createDiscoverer() {
    return new fuzz::Discoverer;
}

IMediaImporter* InterfaceFactory::createImporter() {
    return new fuzz::Importer;
}

} // namespace LibMediaPlayer
