#include "fit/damped_step.h"

#include "frame/scratch.h"
#include "linalg/systems/lu.h"

#include <cmath>

namespace qx {

ErrorCode SolveRowScaled(const RealMatrix &matrix, RealVector right,
                         VectorView<ElementType::I32> order, RealVector solution) {
    const int32_t n = matrix.rows();
    DBL *const a = matrix.data(), *const g = right.data(), *const d = solution.data();
    I32 *const pivots = order.data();
    for (int32_t i = 0; i < n; ++i) {
        DBL *const row = matrix.row(i);
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
    if (LUDecompose<ElementType::DBL>({a, n, n}, {pivots, n}, &parity) != 0)
        return ErrSingularMatrix;
    return LUSolve<ElementType::DBL>({a, n, n}, {pivots, n}, {g, n, 1}, {d, n, 1});
}

ErrorCode AddDampedStep(const RealMatrix &a, RealVector g, double lambda, RealVector coefficients) {
    for (int32_t i = 0; i < a.rows(); ++i) {
        a(i, i) *= 1.0 + lambda;
        if (!std::isfinite(a(i, i)))
            return ErrNonFiniteInput;
    }
    RealVector step;
    VectorView<ElementType::I32> pivots;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(step, a.rows()), Sized(pivots, a.rows())))
        return failed;
    if (const ErrorCode failed = SolveRowScaled(a, g, pivots, step))
        return failed;
    for (int32_t i = 0; i < a.rows(); ++i) {
        coefficients[i] += step[i];
        if (coefficients[i] != coefficients[i])
            return ErrSingularMatrix;
    }
    return 0;
}

} // namespace qx
