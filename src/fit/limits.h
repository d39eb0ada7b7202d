#ifndef QX_FIT_LIMITS_H
#define QX_FIT_LIMITS_H

#include <algorithm>
#include <cstdint>
#include <limits>

namespace qx {

// The largest limit of steps that counts: one step beyond it can still be counted.
constexpr int32_t mostIterations = std::numeric_limits<int32_t>::max() - 1;

inline double ToleranceOrDefault(double tolerance) { return tolerance <= 0.0 ? 0.0001 : tolerance; }

// When the iteration of a fit ends: a step changes what it lowers by no more than `tolerance` of
// itself, or that is at most `floor`; or after about `iterations` steps, of which a negative count
// allows none. 0 or below select 0.0001 and 1e-12.
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
