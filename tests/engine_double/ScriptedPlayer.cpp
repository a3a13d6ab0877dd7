// SPDX-License-Identifier: MIT
#include "tests/engine_double/ScriptedPlayer.h"

#include <condition_variable>
#include <optional>
#include <utility>

#include "tests/engine_double/ScriptText.h"

using LibMediaPlayer::MediaPlayerNotify;

namespace {

std::optional<MediaPlayerNotify> toNotification(const std::vector<std::wstring>& words) {
    if (words.size() != 10)
        return std::nullopt;
    const auto integer = [&](std::size_t index) {
        return static_cast<int>(script::number(words[index]));
    };
    return MediaPlayerNotify{integer(1),
                             integer(2),
                             words[9],
                             integer(3),
                             integer(4),
                             integer(5),
                             script::unsignedNumber(words[6]),
                             script::unsignedNumber(words[7]),
                             script::number(words[8])};
}

/** Lets several threads pass at the same moment. */
class Gate {
public:
    void pass() {
        std::unique_lock lock(mMutex);
        mOpened.wait(lock, [this] { return mOpen; });
    }
    void open() {
        const std::lock_guard lock(mMutex);
        mOpen = true;
        mOpened.notify_all();
    }

private:
    std::mutex mMutex;
    std::condition_variable mOpened;
    bool mOpen = false;
};

} // namespace

ScriptedPlayer::ScriptedPlayer(script::LineChannel calls, script::LineChannel orders)
    : mCalls(std::move(calls)), mOrders(std::move(orders)) {
    if (mOrders.isOpen())
        mOrderThread = std::thread(&ScriptedPlayer::takeOrders, this);
}

ScriptedPlayer::~ScriptedPlayer() {
    call("player destroy");
    mOrders.shutDown();
    if (mOrderThread.joinable())
        mOrderThread.join();
}

int ScriptedPlayer::open(const std::wstring& path, int format) {
    return call("player open " + script::quoted(path) + ' ' + std::to_string(format));
}

int ScriptedPlayer::close() {
    return call("player close");
}

int ScriptedPlayer::play() {
    return call("player play");
}

int ScriptedPlayer::pause() {
    return call("player pause");
}

int ScriptedPlayer::seek(long position, int mode) {
    return call("player seek " + std::to_string(position) + ' ' + std::to_string(mode));
}

int ScriptedPlayer::status(long& position, long& duration) {
    const auto answer = ask("player status");
    position = answer.size() > 2 ? script::number(answer[2]) : 0;
    duration = answer.size() > 3 ? script::number(answer[3]) : 0;
    return answer.size() > 1 ? static_cast<int>(script::number(answer[1])) : 0;
}

void ScriptedPlayer::setNotify(std::function<void(MediaPlayerNotify&)> notify) {
    const std::lock_guard lock(mMutex);
    mNotify = std::move(notify);
}

int ScriptedPlayer::dumpGraph(const std::wstring& path) {
    return call("player dumpGraph " + script::quoted(path));
}

int ScriptedPlayer::repeat(LibMediaPlayer::RepeatParam& param) {
    return call(std::string("player repeat ") + (param.repeat ? "true " : "false ") +
                std::to_string(param.start) + ' ' + std::to_string(param.end));
}

std::vector<std::wstring> ScriptedPlayer::ask(std::string_view call) {
    if (!mCalls.isOpen())
        return {};
    mCalls.send(call);
    return script::words(mCalls.receive().value_or(""));
}

int ScriptedPlayer::call(std::string_view call) {
    const auto answer = ask(call);
    return answer.size() > 1 ? static_cast<int>(script::number(answer[1])) : 0;
}

void ScriptedPlayer::takeOrders() {
    std::vector<MediaPlayerNotify> kept;
    while (const auto line = mOrders.receive()) {
        if (const auto notification = toNotification(script::words(*line))) {
            kept.push_back(*notification);
        } else if (*line == "deliver") {
            deliver(std::exchange(kept, {}));
            mOrders.send("delivered");
        }
    }
}

void ScriptedPlayer::deliver(std::vector<MediaPlayerNotify> notifications) {
    Gate gate;
    std::vector<std::thread> threads;
    for (auto& notification : notifications)
        threads.emplace_back([&] {
            gate.pass();
            deliverOne(notification);
        });
    gate.open();
    for (auto& thread : threads)
        thread.join();
}

void ScriptedPlayer::deliverOne(MediaPlayerNotify& notification) {
    std::unique_lock lock(mMutex);
    const auto notify = mNotify;
    lock.unlock();
    if (notify)
        notify(notification);
}
