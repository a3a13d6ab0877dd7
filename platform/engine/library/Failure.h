// SPDX-License-Identifier: MIT
#pragma once

#include <SQLiteCpp/Exception.h>
#include <string>

#include "library/Error.h"

namespace library {

/** What a failure of the database in `file` means to users. */
Error errorOf(const SQLite::Exception& exception, const std::string& file);

/** Runs what uses the database; its failures become Errors. */
template<typename Function>
auto checked(const std::string& file, Function&& function) -> decltype(function()) {
    try {
        return function();
    } catch (const SQLite::Exception& exception) {
        throw errorOf(exception, file);
    }
}

} // namespace library
