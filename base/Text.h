// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <string_view>

namespace qns {

/**
 * Converts between wide text (UCS-4, as all text inside the services) and multibyte text in
 * the environment's locale (as all text on the wire, in logs and in file names).
 *
 * Both directions stop at the first NUL and at the first character that does not convert, and
 * return what was converted up to there. They follow the environment (LC_ALL, LC_CTYPE, LANG):
 * a change made with setenv(3) takes effect at the next call. The first conversion also sets the
 * process's own locale from the environment; later ones leave it alone.
 *
 * Any thread may call them, but, as with getenv(3), not while another changes the environment.
 */
std::string narrow(std::wstring_view text);
std::wstring widen(std::string_view text);

} // namespace qns
