// SPDX-License-Identifier: MIT
#include "player/Engine.h"

#include <utility>

#include "gst/Library.h"
#include "handle/Barrier.h"
#include "player/Session.h"

namespace engine {

namespace {

/** A tear-down takes milliseconds; one that takes so long never ends. */
constexpr std::chrono::seconds kStopPatience{3};

} // namespace

std::shared_ptr<Engine> Engine::start(std::shared_ptr<Front> front, PlayerOptions options) {
    const std::shared_ptr<Engine> engine(new Engine(std::move(front), options));
    engine->mThread = std::thread([engine] { engine->run(); });
    return engine;
}

Engine::Engine(std::shared_ptr<Front> front, PlayerOptions options)
    : mpFront(std::move(front)), mOptions(options) {}

Engine::~Engine() = default;

void Engine::stop() {
    post(QuitOrder{});
    if (mEnd.wait_for(kStopPatience) == std::future_status::ready)
        mThread.join();
    else
        abandon();
}

std::deque<Item> Engine::abandon() {
    mQuit = true;
    std::deque<Item> left = mpMailbox->drain();
    post(QuitOrder{});
    mThread.detach();
    return left;
}

void Engine::run() {
    gst::initialise();
    while (!mQuit) {
        const TimePoint deadline = mpSession ? mpSession->deadline() : kNever;
        handle::guarded([&] {
            if (auto item = mpMailbox->take(deadline))
                handle(*item);
            else
                mpSession->onDeadline();
        });
    }
    mpSession.reset();
    mEnded.set_value();
}

void Engine::handle(Item& item) {
    std::visit([this](auto& content) { on(content); }, item);
}

void Engine::on(OpenOrder& order) {
    order.ticket->setTaken();
    mpSession.reset();
    if (mpFront->outlet.isCurrent(order.ticket->session())) {
        mpSession = std::make_unique<Session>(*mpFront, mOptions, mpMailbox, order.ticket);
        mpSession->open();
    }
}

void Engine::on(CloseOrder&) {
    mpSession.reset();
}

void Engine::on(QuitOrder&) {
    mQuit = true;
}

void Engine::on(BusEvent& event) {
    if (mpSession && mpSession->owns(event.pipeline))
        mpSession->onMessage(event.message.get());
}

void Engine::on(SinkEvent& event) {
    if (mpSession && mpSession->owns(event.pipeline))
        mpSession->onSinkEvent(event);
}

template<typename Order>
void Engine::on(Order& order) {
    if (mpSession)
        mpSession->take(order);
}

} // namespace engine
