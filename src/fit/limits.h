#ifndef QX_FIT_LIMITS_H
#define QX_FIT_LIMITS_H

#include <algorithm>
#include <cstdint>
#include <limits>

namespace qx {

// The largest limit of steps: the count can still exceed it by one.
constexpr int32_t mostIterations = std::numeric_limits<int32_t>::max() - 1;

inline double ToleranceOrDefault(double tolerance) { return tolerance <= 0.0 ? 0.0001 : tolerance; }

// When the iteration of a fit ends: when a step changes the quantity that it minimises by no more
// than `tolerance` times that quantity, when this is at most `floor`, or after about `iterations`
// steps (none if negative). A tolerance of 0 or below means 0.0001, and such a floor means 1e-12.
struct FitLimits {
    double tolerance = 0.0, floor = 0.0;
    int32_t iterations = 0;
    FitLimits settled() const {
        return {ToleranceOrDefault(tolerance), floor <= 0.0 ? 1e-12 : floor,
                std::min(iterations, mostIterations)};
    }
};

} // namespace qx

#endif
