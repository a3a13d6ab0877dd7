// SPDX-License-Identifier: MIT
#pragma once

#include <string_view>
#include <system_error>

/** Standard output cannot be written. */
class OutputFailed : public std::system_error {
public:
    using std::system_error::system_error;
};

/** Writes to standard output at once. Throws OutputFailed; SIGPIPE must be ignored. */
void show(std::string_view text);
