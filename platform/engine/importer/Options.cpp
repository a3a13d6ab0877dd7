// SPDX-License-Identifier: MIT
#include "importer/Options.h"

#include <climits>

#include "qnsys.h"

namespace importer {

std::string dataFolder() {
    char path[PATH_MAX];
    const int length = qnsys_getenv_hv_data(path, sizeof path);
    return length > 0 ? std::string(path, static_cast<std::size_t>(length)) : std::string();
}

} // namespace importer
