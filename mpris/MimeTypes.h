// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <vector>

namespace mpris {

/** By the endings of names; each type once, in the order of the endings. */
std::vector<std::string> mimeTypesOf(const std::vector<std::string>& extensions);

} // namespace mpris
