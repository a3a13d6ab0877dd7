// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <condition_variable>
#include <deque>
#include <filesystem>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "LibMediaPlayer/IMediaPlayer.h"
#include "LibMediaPlayer/Result.h"

using Seconds = std::chrono::duration<double>;

/** What instrumented code takes longer for. */
#if defined(__SANITIZE_ADDRESS__) || defined(__SANITIZE_THREAD__)
inline constexpr double kSlowness = 5;
#else
inline constexpr double kSlowness = 1;
#endif

/** An engine's player, and what it has notified. */
class TestPlayer {
public:
    using Notification = LibMediaPlayer::MediaPlayerNotify;

    /** What must come, comes within this; longer than any answer may take. */
    static constexpr std::chrono::seconds kPatience{20};

    struct Status {
        LibMediaPlayer::PlayerState state;
        Seconds position;
        Seconds duration;
    };

    TestPlayer();
    ~TestPlayer();
    TestPlayer(const TestPlayer&) = delete;
    TestPlayer& operator=(const TestPlayer&) = delete;

    LibMediaPlayer::IMediaPlayer* operator->() const { return mpPlayer.get(); }

    /** Opens and waits for the answer. */
    Notification open(const std::filesystem::path& path, int format = LibMediaPlayer::kDisplay60Hz);
    Notification openText(const std::wstring& text);

    /** Orders, and the notification that says it is done. */
    void play();
    void pause();
    Notification seek(Seconds position, int mode = LibMediaPlayer::kSeekAccurate);

    [[nodiscard]] Status status() const;

    /** The next notification of that type; those before it are passed over. */
    Notification await(int type);

    /** The same for a change to that state. */
    Notification awaitState(LibMediaPlayer::PlayerState state);

    /** Waits until the status says so. */
    void awaitPosition(Seconds position) const;

    /** How many have come in all, and of one type among those not yet passed over. */
    [[nodiscard]] std::size_t notifiedCount() const;
    [[nodiscard]] std::size_t pendingCount(int type) const;

    /** Milliseconds that each of the calls took that open(), play() ... have made. */
    [[nodiscard]] double medianCallTime() const;

private:
    void forget();
    template<typename Call>
    void timed(Call&& call);
    template<typename Predicate>
    Notification awaitMatching(Predicate&& matches, const std::string& what);

    mutable std::mutex mMutex; ///< guards the next four
    std::condition_variable mArrived;
    std::deque<Notification> mNotifications;
    std::size_t mCount = 0;
    std::vector<double> mCallTimes;
    std::unique_ptr<LibMediaPlayer::IMediaPlayer> mpPlayer;
};

constexpr Seconds operator""_s(long double seconds) {
    return Seconds(static_cast<double>(seconds));
}

/** Seconds of a notification's value. */
inline Seconds valueOf(const TestPlayer::Notification& notification) {
    return std::chrono::nanoseconds(notification.value);
}

inline long toNanoseconds(Seconds seconds) {
    return std::chrono::duration_cast<std::chrono::nanoseconds>(seconds).count();
}
