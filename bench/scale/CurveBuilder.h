// SPDX-License-Identifier: MIT
#pragma once

#include <string>
#include <utility>
#include <vector>

#include "bench/Report.h"

namespace bench {

/** Gathers the samples of a curve, contender by contender and place by place, in any order. */
class CurveBuilder {
public:
    explicit CurveBuilder(Curve curve) : mCurve(std::move(curve)) {}

    /** Returns the line's number, from 0 upward. */
    std::size_t addLine(std::string who, Role role) {
        mCurve.lines.push_back({std::move(who), role, {}});
        mSamples.emplace_back(mCurve.places.size());
        return mSamples.size() - 1;
    }

    [[nodiscard]] std::vector<double>& samples(std::size_t line, std::size_t place) {
        return mSamples[line][place];
    }

    /** Once, at the end. */
    [[nodiscard]] Curve finish() {
        for (std::size_t line = 0; line < mSamples.size(); ++line)
            for (std::vector<double>& samples : mSamples[line])
                mCurve.lines[line].points.push_back(summarize(std::move(samples)));
        return std::move(mCurve);
    }

private:
    Curve mCurve;
    std::vector<std::vector<std::vector<double>>> mSamples; ///< by line, then by place
};

} // namespace bench
