// SPDX-License-Identifier: MIT
#pragma once

#include <string>

#include "base/UniqueFd.h"

namespace qnsys {

/**
 * The way to the log daemon, which may be absent, slow, or come and go. Never waits. Not locked.
 */
class SystemLogSocket {
public:
    /** True when the log daemon has taken the line. */
    bool send(const std::string& line);

private:
    enum class Outcome { taken, busy, failed };

    bool connect();
    int connectAs(int type);
    Outcome trySend(const std::string& line);

    qns::UniqueFd mSocket;
    bool mIsStream = false; ///< lines are then told apart by a zero byte
};

} // namespace qnsys
