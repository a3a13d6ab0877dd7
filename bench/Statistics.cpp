// SPDX-License-Identifier: MIT
#include "bench/Statistics.h"

#include <algorithm>
#include <cmath>
#include <cstddef>
#include <cstdio>
#include <cstdlib>

namespace bench {

double percentile(const std::vector<double>& sorted, double part) {
    if (sorted.empty())
        return 0;
    const auto last = static_cast<double>(sorted.size() - 1);
    return sorted[static_cast<std::size_t>(std::lround(last * part))];
}

Statistics summarize(std::vector<double> samples) {
    if (samples.empty())
        return {};
    std::sort(samples.begin(), samples.end());
    return {percentile(samples, 0.5), percentile(samples, 0.99), samples.front(), samples.back(),
            static_cast<int>(samples.size())};
}

double rounded(double figure) {
    char text[32];
    std::snprintf(text, sizeof text, "%.5g", figure);
    return std::strtod(text, nullptr);
}

} // namespace bench
