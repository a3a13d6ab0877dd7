// SPDX-License-Identifier: MIT
// A media engine that does nothing but tell when it was called, to be put in the place of the
// real one: the benchmark then measures the way of a request and not the engine.
#include <ctime>
#include <functional>
#include <utility>

#include "LibMediaPlayer/IMediaPlayer.h"
#include "LibMediaPlayer/InterfaceFactory.h"
#include "LibMediaPlayer/Result.h"

namespace LibMediaPlayer {
namespace {

long monotonicNanoseconds() {
    timespec now{};
    ::clock_gettime(CLOCK_MONOTONIC, &now);
    return now.tv_sec * 1'000'000'000L + now.tv_nsec;
}

class TimingPlayer : public IMediaPlayer {
public:
    int open(const std::wstring&, int) override {
        MediaPlayerNotify opened;
        opened.type = kNotifyOpened;
        opened.value = monotonicNanoseconds();
        if (mNotify)
            mNotify(opened);
        return kOk;
    }
    int close() override { return kOk; }
    int play() override { return kOk; }
    int pause() override { return kOk; }
    int seek(long, int) override { return kOk; }
    int status(long& position, long&) override {
        position = monotonicNanoseconds();
        return kPlaying;
    }
    void setNotify(std::function<void(MediaPlayerNotify&)> notify) override {
        mNotify = std::move(notify);
    }
    int dumpGraph(const std::wstring&) override { return kOk; }
    int repeat(RepeatParam&) override { return kOk; }

private:
    std::function<void(MediaPlayerNotify&)> mNotify;
};

} // namespace

IMediaPlayer* InterfaceFactory::createPlayer(void*, unsigned int) {
    return new TimingPlayer;
}

// Only the player is measured with it.
IMediaDiscoverer* InterfaceFactory::createDiscoverer() {
    return nullptr;
}

IMediaImporter* InterfaceFactory::createImporter() {
    return nullptr;
}

} // namespace LibMediaPlayer
