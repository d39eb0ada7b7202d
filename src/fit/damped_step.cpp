#include "fit/damped_step.h"

#include "frame/scratch.h"
#include "linalg/systems/lu.h"

#include <cmath>

namespace qx {

ErrorCode SolveRowScaled(DBL *a, DBL *g, int32_t n, I32 *pivots, DBL *d) {
    for (std::ptrdiff_t i = 0; i < n; ++i) {
        DBL *const row = a + i * n;
        double largest = 0.0;
        for (int32_t j = 0; j < n; ++j)
            largest = std::fabs(row[j]) > largest ? std::fabs(row[j]) : largest;
        if (largest == 0.0 || !std::isfinite(largest))
            continue;
        int exponent;
        std::frexp(largest, &exponent);
        for (int32_t j = 0; j < n; ++j)
            row[j] = std::ldexp(row[j], -exponent);
        g[i] = std::ldexp(g[i], -exponent);
    }
    int32_t parity;
    if (LUDecompose(a, n, n, pivots, &parity) != 0)
        return ErrSingularMatrix;
    return LUSolve(a, pivots, g, n, 1, d);
}

ErrorCode AddDampedStep(DBL *a, DBL *g, int32_t n, double lambda, DBL *coefficients) {
    for (std::ptrdiff_t i = 0; i < n; ++i) {
        DBL *const diagonal = a + i * n + i;
        *diagonal *= 1.0 + lambda;
        if (!std::isfinite(*diagonal))
            return ErrNonFiniteInput;
    }
    Scratch<ElementType::DBL> step;
    Scratch<ElementType::I32> pivots;
    if (const ErrorCode failed = step.allocate(n))
        return failed;
    if (const ErrorCode failed = pivots.allocate(n))
        return failed;
    if (const ErrorCode failed = SolveRowScaled(a, g, n, pivots.data(), step.data()))
        return failed;
    for (int32_t i = 0; i < n; ++i) {
        coefficients[i] += step[i];
        if (coefficients[i] != coefficients[i])
            return ErrSingularMatrix;
    }
    return 0;
}

} // namespace qx
