// SPDX-License-Identifier: MIT
#include "bench/player/PlayerPeer.h"

#include <clocale>
#include <mpv/client.h>
#include <stdexcept>

namespace bench {
namespace {

using Clock = std::chrono::steady_clock;

constexpr double kPatience = 20; // seconds

/** What makes it a quiet library; the outputs take time as a device does, but need none. */
constexpr const char* kOptions[][2] = {
    {"vo", "null"},          {"ao", "null"},     {"pause", "yes"},          {"idle", "yes"},
    {"keep-open", "yes"},    {"terminal", "no"}, {"config", "no"},          {"load-scripts", "no"},
    {"audio-display", "no"}, {"hwdec", "no"},    {"resume-playback", "no"},
};

void require(int status) {
    if (status < 0)
        throw std::runtime_error(std::string("libmpv: ") + mpv_error_string(status));
}

std::string secondsText(Position position) {
    return std::to_string(std::chrono::duration<double>(position).count());
}

class MpvPeer : public PlayerPeer {
public:
    MpvPeer() {
        std::setlocale(LC_NUMERIC, "C"); // it refuses any other
        mpPlayer.reset(mpv_create());
        for (const auto& [name, value] : kOptions)
            require(mpv_set_option_string(mpPlayer.get(), name, value));
        require(mpv_initialize(mpPlayer.get()));
    }

    Milliseconds open(const std::string& path) override {
        set("ab-loop-a", "no");
        set("ab-loop-b", "no");
        set("pause", "yes");
        return timed(MPV_EVENT_PLAYBACK_RESTART, {"loadfile", path.c_str(), nullptr});
    }

    Milliseconds seek(Position position, bool isExact) override {
        const std::string seconds = secondsText(position);
        return timed(
            MPV_EVENT_PLAYBACK_RESTART,
            {"seek", seconds.c_str(), isExact ? "absolute+exact" : "absolute+keyframes", nullptr});
    }

    Milliseconds close() override { return timed(MPV_EVENT_IDLE, {"stop", nullptr}); }

    std::vector<Milliseconds> loop(Position start, Position end, int rounds) override {
        // Set later it would not take effect before the next seek.
        set("ab-loop-a", secondsText(start).c_str());
        set("ab-loop-b", secondsText(end).c_str());
        seek(start, true);
        set("pause", "no");
        std::vector<Milliseconds> times;
        auto last = await(MPV_EVENT_PLAYBACK_RESTART);
        while (times.size() < static_cast<std::size_t>(rounds)) {
            const auto now = await(MPV_EVENT_PLAYBACK_RESTART);
            times.emplace_back(now - last);
            last = now;
        }
        return times;
    }

private:
    struct Destroyer {
        void operator()(mpv_handle* player) const { mpv_terminate_destroy(player); }
    };

    void set(const char* property, const char* value) {
        require(mpv_set_property_string(mpPlayer.get(), property, value));
    }

    Milliseconds timed(mpv_event_id answer, std::vector<const char*> command) {
        const auto begin = Clock::now();
        require(mpv_command(mpPlayer.get(), command.data()));
        return await(answer) - begin;
    }

    /** When the next event of that kind came; those before it are passed over. */
    Clock::time_point await(mpv_event_id id) {
        for (;;) {
            const mpv_event* const event = mpv_wait_event(mpPlayer.get(), kPatience);
            if (event->event_id == MPV_EVENT_NONE)
                throw std::runtime_error("libmpv does not answer");
            if (event->event_id == id)
                return Clock::now();
        }
    }

    std::unique_ptr<mpv_handle, Destroyer> mpPlayer;
};

} // namespace

std::unique_ptr<PlayerPeer> makeMpvPeer() {
    return std::make_unique<MpvPeer>();
}

} // namespace bench
