// SPDX-License-Identifier: MIT
#include "tests/engine_double/EngineScript.h"

#include <cstdlib>
#include <future>
#include <memory>
#include <mutex>
#include <set>
#include <thread>

#include <gmock/gmock.h>

#include "LibMediaPlayer/InterfaceFactory.h"

using LibMediaPlayer::IMediaPlayer;
using LibMediaPlayer::InterfaceFactory;
using LibMediaPlayer::MediaPlayerNotify;

namespace {

std::unique_ptr<IMediaPlayer> createPlayer() {
    return std::unique_ptr<IMediaPlayer>(InterfaceFactory::createPlayer(nullptr, 15));
}

/** A call to the engine, on a thread of its own because it blocks. */
template<typename Call>
auto start(Call call) {
    return std::async(std::launch::async, call);
}

class ScriptedEngine : public testing::Test {
protected:
    ScriptedEngine() { ::setenv("QNS_ENGINE_DOUBLE", mEngine.address().c_str(), 1); }
    ~ScriptedEngine() override { ::unsetenv("QNS_ENGINE_DOUBLE"); }

    std::unique_ptr<IMediaPlayer> createScriptedPlayer() {
        auto created = start(createPlayer);
        mEngine.expectCall("player create null 15");
        return created.get();
    }

    void destroy(std::unique_ptr<IMediaPlayer> player) {
        auto destroyed = start([&] { player.reset(); });
        mEngine.expectCall("player destroy");
        destroyed.get();
    }

    EngineScript mEngine;
};

} // namespace

TEST(QuietEngine, EveryCallSucceedsWithoutAScript) {
    ::unsetenv("QNS_ENGINE_DOUBLE");
    const auto player = createPlayer();
    long position = 5;
    long duration = 5;
    LibMediaPlayer::RepeatParam repeat;
    EXPECT_EQ(player->open(L"/a", 2), 0);
    EXPECT_EQ(player->play(), 0);
    EXPECT_EQ(player->pause(), 0);
    EXPECT_EQ(player->seek(7, 0), 0);
    EXPECT_EQ(player->status(position, duration), 0);
    EXPECT_EQ(player->repeat(repeat), 0);
    EXPECT_EQ(player->dumpGraph(L""), 0);
    EXPECT_EQ(player->close(), 0);
    EXPECT_EQ(position, 0);
    EXPECT_EQ(duration, 0);
}

TEST(QuietEngine, AVariableThatNamesNoSocketIsNoScript) {
    ::setenv("QNS_ENGINE_DOUBLE", "/nonexistent/socket", 1);
    const auto player = createPlayer();
    ASSERT_NE(player, nullptr);
    EXPECT_EQ(player->play(), 0);
    ::unsetenv("QNS_ENGINE_DOUBLE");
}

TEST(ScriptText, WhatIsQuotedIsReadAgain) {
    const std::wstring text = L"a \"b\" \\ \n\t\u00fc\U0001F3B5\xDC80 %s";
    EXPECT_EQ(script::words("x  " + script::quoted(text) + " -7"),
              (std::vector<std::wstring>{L"x", text, L"-7"}));
    EXPECT_EQ(script::quoted(L"\u00fc"), "\"\\x{fc}\"");
    EXPECT_EQ(script::words("\"\""), std::vector<std::wstring>{L""});
}

TEST(ScriptText, BrokenQuotingEndsWithTheLine) {
    EXPECT_EQ(script::words("\"a"), std::vector<std::wstring>{L"a"});
    EXPECT_EQ(script::words("\\"), std::vector<std::wstring>{L"\\"});
    EXPECT_EQ(script::words("\\x{41"), std::vector<std::wstring>{L"A"});
}

TEST_F(ScriptedEngine, ReportsEachCallAndReturnsWhatItIsTold) {
    auto player = createScriptedPlayer();
    const auto expect = [&](auto call, const char* line, const char* answer, int result) {
        auto called = start(call);
        mEngine.expectCall(line, answer);
        EXPECT_EQ(called.get(), result) << line;
    };
    LibMediaPlayer::RepeatParam repeat{true, 10, -1};
    expect([&] { return player->open(L"/a b\u00fc.mp4", 2); }, R"(player open "/a b\x{fc}.mp4" 2)",
           "return 3", 3);
    expect([&] { return player->close(); }, "player close", "return -1", -1);
    expect([&] { return player->play(); }, "player play", "return 0", 0);
    expect([&] { return player->pause(); }, "player pause", "return 9", 9);
    expect([&] { return player->seek(-5, 2); }, "player seek -5 2", "return 0", 0);
    expect([&] { return player->repeat(repeat); }, "player repeat true 10 -1", "return 1", 1);
    expect([&] { return player->dumpGraph(L""); }, "player dumpGraph \"\"", "return 2", 2);
    destroy(std::move(player));
}

TEST_F(ScriptedEngine, StatusBringsPositionAndDuration) {
    auto player = createScriptedPlayer();
    long position = 0;
    long duration = 0;
    auto called = start([&] { return player->status(position, duration); });
    mEngine.expectCall("player status", "return 3 9223372036854775807 -1");
    EXPECT_EQ(called.get(), 3);
    EXPECT_EQ(position, 9223372036854775807);
    EXPECT_EQ(duration, -1);
    destroy(std::move(player));
}

TEST_F(ScriptedEngine, CanRefuseToCreateAPlayer) {
    auto created = start(createPlayer);
    mEngine.expectCall("player create null 15", "null");
    EXPECT_EQ(created.get(), nullptr);
    destroy(createScriptedPlayer());
}

TEST_F(ScriptedEngine, ServesOnePlayerAfterTheOther) {
    destroy(createScriptedPlayer());
    destroy(createScriptedPlayer());
}

TEST_F(ScriptedEngine, CallsReturnWhenTheScriptHasGone) {
    auto script = std::make_unique<EngineScript>();
    ::setenv("QNS_ENGINE_DOUBLE", script->address().c_str(), 1);
    auto created = start(createPlayer);
    script->expectCall("player create null 15");
    const auto player = created.get();
    auto called = start([&] { return player->play(); });
    EXPECT_EQ(script->nextCall(), "player play");
    script.reset();
    EXPECT_EQ(called.get(), 0);
    EXPECT_EQ(player->pause(), 0);
}

TEST_F(ScriptedEngine, ANotificationArrivesWithAllItsFields) {
    auto player = createScriptedPlayer();
    MediaPlayerNotify seen;
    player->setNotify([&](MediaPlayerNotify& notify) { seen = notify; });
    mEngine.notify({1, -2, L"a \u00fc", 3, -4, 5, 18446744073709551615U, 7, -8});
    EXPECT_EQ(seen.type, 1);
    EXPECT_EQ(seen.result, -2);
    EXPECT_EQ(seen.text, L"a \u00fc");
    EXPECT_EQ(seen.param1, 3);
    EXPECT_EQ(seen.param2, -4);
    EXPECT_EQ(seen.param3, 5);
    EXPECT_EQ(seen.uvalue1, 18446744073709551615U);
    EXPECT_EQ(seen.uvalue2, 7U);
    EXPECT_EQ(seen.value, -8);
    destroy(std::move(player));
}

TEST_F(ScriptedEngine, SeveralNotificationsComeAtOnceOnDifferentThreads) {
    auto player = createScriptedPlayer();
    std::mutex mutex;
    std::set<int> types;
    std::set<std::thread::id> threads;
    player->setNotify([&](MediaPlayerNotify& notify) {
        const std::lock_guard lock(mutex);
        types.insert(notify.type);
        threads.insert(std::this_thread::get_id());
    });
    std::vector<MediaPlayerNotify> notifications(8);
    for (int i = 0; i < 8; ++i)
        notifications[static_cast<std::size_t>(i)].type = i;
    mEngine.notifyAtOnce(notifications);
    EXPECT_EQ(types.size(), 8U);
    EXPECT_EQ(threads.size(), 8U);
    destroy(std::move(player));
}

TEST_F(ScriptedEngine, NotifiesWhileACallAndTheDestructionAreBlocked) {
    auto player = createScriptedPlayer();
    int count = 0;
    player->setNotify([&](MediaPlayerNotify&) { ++count; });
    auto called = start([&] { return player->close(); });
    EXPECT_EQ(mEngine.nextCall(), "player close");
    mEngine.notify({});
    mEngine.answer("return 0");
    called.get();
    auto destroyed = start([&] { player.reset(); });
    EXPECT_EQ(mEngine.nextCall(), "player destroy");
    mEngine.notify({});
    mEngine.answer("return 0");
    destroyed.get();
    EXPECT_EQ(count, 2);
}
