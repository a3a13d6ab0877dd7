// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <string>
#include <string_view>
#include <vector>

#include "LibMediaPlayer/IMediaPlayer.h"
#include "tests/engine_double/LineChannel.h"
#include "tests/engine_double/ScriptedNotifications.h"

/**
 * A player that plays nothing. With a script it reports each call as a line, such as
 * `player open "/a b.mp4" 2`, and waits for the answer, such as `return 0`; for status
 * `return 3 position duration`. Without one, or when it has gone, every call succeeds.
 *
 * The orders on its second connection are `notify type result param1 param2 param3 uvalue1
 * uvalue2 value "text"`, and `deliver` as ScriptedNotifications says.
 */
class ScriptedPlayer : public LibMediaPlayer::IMediaPlayer {
public:
    /** The calls' connection first: the script takes them in this order. */
    ScriptedPlayer(script::LineChannel calls, script::LineChannel orders);

    /** Reported as `player destroy`. Orders are still taken until that is answered. */
    ~ScriptedPlayer() override;

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
    /** The words of the answer; none without a script. */
    std::vector<std::wstring> ask(std::string_view call);
    int call(std::string_view call);

    script::LineChannel mCalls;
    script::ScriptedNotifications<LibMediaPlayer::MediaPlayerNotify> mNotifications;
};
