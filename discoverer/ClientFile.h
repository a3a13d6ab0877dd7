// SPDX-License-Identifier: MIT
#pragma once

#include <cstddef>
#include <string>

namespace qns {

/**
 * Writes a file at a path that a client has named, replacing what was there. Never waits: not for
 * a pipe's reader either. What cannot be written is left out; nobody is told.
 */
void writeClientFile(const std::wstring& path, const void* bytes, std::size_t size);

} // namespace qns
