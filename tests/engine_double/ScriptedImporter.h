// SPDX-License-Identifier: MIT
#pragma once

#include <functional>
#include <memory>
#include <string>
#include <string_view>
#include <vector>

#include "LibMediaPlayer/IMediaImporter.h"
#include "tests/engine_double/LineChannel.h"
#include "tests/engine_double/ScriptedNotifications.h"

/**
 * An importer that imports nothing. With a script it reports each call as a line, such as
 * `importer import "/a b.mp4" "films"`, and waits for the answer, such as `return 0`; for status
 * `return 1 done total`. Without one, or when it has gone, every call succeeds.
 *
 * The orders on its second connection are `notify kind result "text"`, and `deliver` as
 * ScriptedNotifications says.
 *
 * The environment variable QNS_IMPORTER_DOUBLE names the script.
 */
class ScriptedImporter : public LibMediaPlayer::IMediaImporter {
public:
    /** Reported as `importer create`; null when the script answers `null`. */
    static std::unique_ptr<ScriptedImporter> create();

    /** Reported as `importer destroy`. Orders are still taken until that is answered. */
    ~ScriptedImporter() override;

    int import(const std::wstring& path, const std::wstring& folder) override;
    int cancel() override;
    int status(LibMediaPlayer::MediaImporterStatus& status) override;
    void setNotify(std::function<void(LibMediaPlayer::MediaImporterNotify&)> notify) override;
    int dumpGraph(const std::wstring& path) override;

private:
    ScriptedImporter(script::LineChannel calls, script::LineChannel orders);

    script::LineChannel mCalls;
    script::ScriptedNotifications<LibMediaPlayer::MediaImporterNotify> mNotifications;
};
