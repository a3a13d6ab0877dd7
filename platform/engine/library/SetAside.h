// SPDX-License-Identifier: MIT
#pragma once

#include <string>

namespace library {

/**
 * Gives a damaged database, with what belongs to it, the name FILE.damaged-DATE-TIME, so that a
 * new one can begin and nothing is lost. Returns that name; throws Error.
 */
std::string setAside(const std::string& file);

} // namespace library
