// SPDX-License-Identifier: MIT
#pragma once

/** What the log lines of the process entry have in common; see log/Logging.h. */
namespace host {

/** Of old the host of all services logs under the player's name. */
constexpr const wchar_t* kLogModule = L"MediaPlayerService";
constexpr int kLogCode = 101;
constexpr int kLogInformational = 6;
constexpr int kLogError = 3;

} // namespace host
