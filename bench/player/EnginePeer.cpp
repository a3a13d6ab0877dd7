// SPDX-License-Identifier: MIT
#include "bench/player/PlayerPeer.h"

#include <condition_variable>
#include <deque>
#include <mutex>
#include <stdexcept>

#include "LibMediaPlayer/IMediaPlayer.h"
#include "LibMediaPlayer/InterfaceFactory.h"
#include "LibMediaPlayer/Result.h"

namespace bench {
namespace {

using Clock = std::chrono::steady_clock;
using namespace LibMediaPlayer;

constexpr std::chrono::seconds kPatience{20};

/** The media engine, called as the daemon calls it. */
class EnginePeer : public PlayerPeer {
public:
    EnginePeer() : mpPlayer(InterfaceFactory::createPlayer(nullptr, kPlayVideo | kPlayAudio)) {
        mpPlayer->setNotify([this](const MediaPlayerNotify& notification) { add(notification); });
    }

    Milliseconds open(const std::string& path) override {
        const std::wstring wide(path.begin(), path.end());
        return timed(kNotifyOpened, [&] { return mpPlayer->open(wide, kDisplay60Hz); });
    }

    Milliseconds seek(Position position, bool isExact) override {
        return timed(kNotifySeekDone, [&] {
            return mpPlayer->seek(position.count(), isExact ? kSeekAccurate : kSeekKeyFrame);
        });
    }

    Milliseconds close() override {
        const auto begin = Clock::now();
        mpPlayer->close();
        return Clock::now() - begin;
    }

    std::vector<Milliseconds> loop(Position start, Position end, int rounds) override {
        RepeatParam param{true, start.count(), end.count()};
        require(mpPlayer->repeat(param));
        seek(start, true);
        require(mpPlayer->play());
        std::vector<Milliseconds> times;
        auto last = await(kNotifyLoop);
        while (times.size() < static_cast<std::size_t>(rounds)) {
            const auto now = await(kNotifyLoop);
            times.emplace_back(now - last);
            last = now;
        }
        return times;
    }

private:
    struct Event {
        int type;
        int result;
        Clock::time_point moment;
    };

    static void require(int result) {
        if (result != kOk)
            throw std::runtime_error("the engine refused, result " + std::to_string(result));
    }

    template<typename Order>
    Milliseconds timed(int answer, Order order) {
        const auto begin = Clock::now();
        require(order());
        return await(answer) - begin;
    }

    void add(const MediaPlayerNotify& notification) {
        const std::lock_guard lock(mMutex);
        mEvents.push_back({notification.type, notification.result, Clock::now()});
        mArrived.notify_one();
    }

    /** When the next event of that type came; those before it are passed over. */
    Clock::time_point await(int type) {
        std::unique_lock lock(mMutex);
        for (;;) {
            if (!mArrived.wait_for(lock, kPatience, [&] { return !mEvents.empty(); }))
                throw std::runtime_error("the engine does not answer");
            const Event event = mEvents.front();
            mEvents.pop_front();
            require(event.result);
            if (event.type == type)
                return event.moment;
        }
    }

    std::mutex mMutex; ///< guards mEvents
    std::condition_variable mArrived;
    std::deque<Event> mEvents;
    std::unique_ptr<IMediaPlayer> mpPlayer; ///< last: its notifications use the others
};

} // namespace

std::unique_ptr<PlayerPeer> makeEnginePeer() {
    return std::make_unique<EnginePeer>();
}

} // namespace bench
