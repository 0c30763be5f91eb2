#include "ProgressWidth.h"

#include <algorithm>
#include <cmath>
#include <cstdint>

namespace orvex::tree {

int ProgressWidth(int total, int count) {
    count = std::max(count, 0);
    if (total >= 1) {
        const std::int64_t width = std::int64_t{count} * kProgressTrack / total;
        return static_cast<int>(std::min<std::int64_t>(width, kProgressTrack));
    }
    // This form stays finite for every count: e^(-0.4 c) only shrinks towards 0, where the width reaches
    // the track, and the cap below keeps the last pixel for the end report.
    const double e2m1 = std::exp(2.0) - 1.0;
    const double fraction = 1.0 - 0.5 * std::log1p(e2m1 * std::exp(-0.4 * count));
    const double width = std::floor(kProgressTrack * fraction);
    return static_cast<int>(std::clamp(width, 0.0, double{kProgressTrack - 1}));
}

} // namespace orvex::tree
