// SPDX-License-Identifier: MIT
#pragma once

#include <string>

/**
 * A file's path from the root, since the daemon's working directory is another one. A URI, and an
 * empty name, stay as they are. Throws std::filesystem::filesystem_error.
 */
std::string mediaPath(const std::string& file);
