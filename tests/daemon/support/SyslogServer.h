// SPDX-License-Identifier: MIT
#pragma once

#include <atomic>
#include <mutex>
#include <string>
#include <string_view>
#include <thread>
#include <vector>

#include "base/UniqueFd.h"
#include "tests/daemon/support/Lines.h"

/** Serves /dev/log, which must not be the machine's own. */
class SyslogServer {
public:
    SyslogServer();
    ~SyslogServer();
    SyslogServer(const SyslogServer&) = delete;
    SyslogServer& operator=(const SyslogServer&) = delete;

    /** From now on what is sent here waits in the socket's short queue, and then blocks. */
    void stopReading();

    /** From now on lines are read and only those with this text are kept. */
    void keepOnly(std::string text);

    /** Waits for a line that contains `text`. */
    bool waitForLine(std::string_view text, std::size_t count = 1) {
        return mLines.waitFor(text, count);
    }

    /** The lines up to now that contain `text` as they came: `<priority>date ident[pid]: name code:
     * text`. */
    [[nodiscard]] std::vector<std::string> lines(std::string_view text);

    /** The same lines without what stands before the text that the daemon wrote. */
    [[nodiscard]] std::vector<std::string> messages(std::string_view text);

private:
    void readLoop();
    void readAvailable();

    qns::UniqueFd mSocket;
    std::atomic<bool> mStopped{false};
    std::mutex mReadMutex; ///< held while reading; guards mKept
    std::string mKept;     ///< what a line must contain to be kept
    Lines mLines;
    std::thread mThread;
};
