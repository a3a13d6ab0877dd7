// SPDX-License-Identifier: MIT
#pragma once

#include <vector>

namespace bench {

/** One measured quantity. All members are 0 without samples. */
struct Statistics {
    double median = 0;
    double p99 = 0;
    double minimum = 0;
    double maximum = 0;
    int samples = 0;
};

[[nodiscard]] Statistics summarize(std::vector<double> samples);

/** The sample below which `part` (0 to 1) of the sorted samples lie; 0 without samples. */
[[nodiscard]] double percentile(const std::vector<double>& sorted, double part);

/** With five digits: more would be chance, and make files larger. */
[[nodiscard]] double rounded(double figure);

} // namespace bench
