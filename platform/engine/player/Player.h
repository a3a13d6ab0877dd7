// SPDX-License-Identifier: MIT
#pragma once

#include <memory>
#include <mutex>

#include "LibMediaPlayer/IMediaPlayer.h"
#include "player/Engine.h"
#include "player/Front.h"
#include "player/Options.h"
#include "player/Watchdog.h"

namespace engine {

/** The player as its callers see it: every operation becomes an order to the engine's thread. */
class Player final : public LibMediaPlayer::IMediaPlayer {
public:
    Player(void* window, unsigned int flags);
    ~Player() override;
    Player(const Player&) = delete;
    Player& operator=(const Player&) = delete;

    int open(const std::wstring& path, int format) override;
    int close() override;
    int play() override;
    int pause() override;
    int seek(long position, int mode) override;
    int status(long& position, long& duration) override;
    void setNotify(std::function<void(LibMediaPlayer::MediaPlayerNotify&)> notify) override;
    int dumpGraph(const std::wstring& path) override;
    int repeat(LibMediaPlayer::RepeatParam& param) override;

private:
    template<typename Order>
    void post(Order order);
    [[nodiscard]] bool isOpen() const;
    void onOverdue(const std::shared_ptr<OpenTicket>& ticket, Watchdog::Overdue overdue);
    void replaceEngine(bool keepOrders);

    const PlayerOptions mOptions;
    const std::shared_ptr<Front> mpFront = std::make_shared<Front>();
    LibMediaPlayer::RepeatParam mNextLoop; ///< ordered before there was a medium; the caller's
    std::mutex mMutex;                     ///< guards mpEngine
    std::shared_ptr<Engine> mpEngine;
    Watchdog mWatchdog; ///< last, so that it ends first
};

} // namespace engine
