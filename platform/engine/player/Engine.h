// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <deque>
#include <future>
#include <memory>
#include <thread>
#include <utility>

#include "player/Front.h"
#include "player/Items.h"
#include "player/Options.h"

namespace engine {

class Session;

/**
 * The thread that owns a player's pipeline: it carries out orders and takes the pipeline's
 * events, in the order of one mailbox, and delivers the notifications. With nothing open it
 * sleeps for good.
 *
 * A library that hangs takes this thread with it. The engine is then abandoned: the thread has
 * its share of the object, and ends should it ever come back.
 */
class Engine : public std::enable_shared_from_this<Engine> {
public:
    static std::shared_ptr<Engine> start(std::shared_ptr<Front> front, PlayerOptions options);
    ~Engine();
    Engine(const Engine&) = delete;
    Engine& operator=(const Engine&) = delete;

    template<typename Content>
    void post(Content&& content) {
        mpMailbox->post(std::forward<Content>(content));
    }

    /** Closes, and waits for the thread's end; one that hangs is abandoned. */
    void stop();

    /** Lets go of a thread that hangs. Returns what it has not taken up. */
    std::deque<Item> abandon();

private:
    Engine(std::shared_ptr<Front> front, PlayerOptions options);

    void run();
    void handle(Item& item);

    void on(OpenOrder& order);
    void on(CloseOrder&);
    void on(QuitOrder&);
    void on(BusEvent& event);
    void on(SinkEvent& event);
    template<typename Order>
    void on(Order& order);

    const std::shared_ptr<Front> mpFront;
    const PlayerOptions mOptions;
    const std::shared_ptr<EngineMailbox> mpMailbox = std::make_shared<EngineMailbox>();
    std::atomic<bool> mQuit{false};
    std::unique_ptr<Session> mpSession; ///< only the thread's
    std::promise<void> mEnded;
    std::future<void> mEnd = mEnded.get_future();
    std::thread mThread;
};

} // namespace engine
