// SPDX-License-Identifier: MIT
#include "tests/engine_double/ScriptedPlayer.h"

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

} // namespace

ScriptedPlayer::ScriptedPlayer(script::LineChannel calls, script::LineChannel orders)
    : mCalls(std::move(calls)), mNotifications(std::move(orders), toNotification) {}

ScriptedPlayer::~ScriptedPlayer() {
    call("player destroy");
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
    mNotifications.setFunction(std::move(notify));
}

int ScriptedPlayer::dumpGraph(const std::wstring& path) {
    return call("player dumpGraph " + script::quoted(path));
}

int ScriptedPlayer::repeat(LibMediaPlayer::RepeatParam& param) {
    return call(std::string("player repeat ") + (param.repeat ? "true " : "false ") +
                std::to_string(param.start) + ' ' + std::to_string(param.end));
}

std::vector<std::wstring> ScriptedPlayer::ask(std::string_view call) {
    return script::words(mCalls.ask(call));
}

int ScriptedPlayer::call(std::string_view call) {
    return script::resultIn(ask(call));
}
