// SPDX-License-Identifier: MIT
#pragma once

#include <chrono>
#include <filesystem>
#include <string>
#include <string_view>
#include <vector>

#include "LibMediaPlayer/IMediaImporter.h"
#include "LibMediaPlayer/IMediaPlayer.h"
#include "base/UniqueFd.h"
#include "tests/engine_double/LineChannel.h"
#include "tests/engine_double/ScriptText.h"

/**
 * The test's end of the scripted engine. Put address() into the environment variable
 * QNS_ENGINE_DOUBLE of the process that loads the engine; each call to its player is then
 * reported here, as ScriptedPlayer describes, and blocks until it is answered:
 *
 *     EngineScript engine;
 *     ... start the process with QNS_ENGINE_DOUBLE=engine.address() ...
 *     engine.expectCall("player create null 15");
 *     engine.expectCall("player open \"/a b.mp4\" 2", "return 0");
 *     engine.notify(opened);
 *
 * The discoverers of a process have a script of their own, which the environment variable
 * QNS_DISCOVERER_DOUBLE names; their calls look as ScriptedDiscoverer describes. So has its
 * importer: QNS_IMPORTER_DOUBLE, ScriptedImporter.
 *
 * One player or importer at a time; when it has gone, the next one is waited for. Nothing here
 * waits for time to pass, only, at most kPatience, for the engine; when that is too long the test
 * fails. When the script goes, a blocked call returns 0. For one thread, which must not be the one
 * that calls the engine.
 */
class EngineScript {
public:
    static constexpr std::chrono::seconds kPatience{60};

    EngineScript();
    ~EngineScript();
    EngineScript(const EngineScript&) = delete;
    EngineScript& operator=(const EngineScript&) = delete;

    /** Path of the script's socket. */
    [[nodiscard]] const std::string& address() const { return mAddress; }

    /** The next call, which blocks until answer(). Empty when none comes. */
    [[nodiscard]] std::string nextCall();

    /** Answers the call: `return 0`, for status `return 3 position duration`; `null` for create. */
    void answer(std::string_view answer);

    /** Waits for the next call, which must be this one, and answers it. */
    void expectCall(std::string_view call, std::string_view answer = "return 0");

    /** Has the player notify, and waits until it has been taken. A player must be there. */
    void notify(const LibMediaPlayer::MediaPlayerNotify& notification);

    /** The same for several notifications at the same time, each on its own thread. */
    void notifyAtOnce(const std::vector<LibMediaPlayer::MediaPlayerNotify>& notifications);

    /** The same of an importer. */
    void notifyImport(const LibMediaPlayer::MediaImporterNotify& notification);
    void notifyImportsAtOnce(const std::vector<LibMediaPlayer::MediaImporterNotify>& notifications);

    /** The two halves of notifyAtOnce(), for a test that does something in between. */
    void startNotify(const std::vector<LibMediaPlayer::MediaPlayerNotify>& notifications);
    void awaitNotified();

private:
    template<typename Notification>
    void order(const std::vector<Notification>& notifications);
    bool acceptPlayer();
    qns::UniqueFd acceptConnection();

    std::filesystem::path mFolder;
    std::string mAddress;
    qns::UniqueFd mListener;
    script::LineChannel mCalls;
    script::LineChannel mOrders;
};
