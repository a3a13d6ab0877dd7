// SPDX-License-Identifier: MIT
#pragma once

#include <nlohmann/json_fwd.hpp>

namespace bench {

/**
 * When and where something is measured: date, commit, machine, kernel, and the versions of all
 * that takes part. Names no host, user or folder.
 */
[[nodiscard]] nlohmann::ordered_json describeEnvironment();

} // namespace bench
