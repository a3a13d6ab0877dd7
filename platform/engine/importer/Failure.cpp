// SPDX-License-Identifier: MIT
#include "importer/Failure.h"

#include <system_error>

#include "handle/SystemResult.h"

namespace importer {

Failure systemFailure(const std::string& what, const std::string& path, int error) {
    return {handle::resultOfErrno(error),
            what + ": " + path + " (" + std::generic_category().message(error) + ")"};
}

} // namespace importer
