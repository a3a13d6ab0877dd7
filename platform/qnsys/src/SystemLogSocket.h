// SPDX-License-Identifier: MIT
#pragma once

#include <string_view>

#include "base/UniqueFd.h"

namespace qnsys {

/**
 * The way to the log daemon, which may be absent, slow, or come and go. Never waits. Not locked.
 */
class SystemLogSocket {
public:
    /** True when the log daemon has taken the line. */
    bool send(std::string_view line);

private:
    bool connect();
    bool trySend(std::string_view line);

    qns::UniqueFd mSocket;
};

} // namespace qnsys
