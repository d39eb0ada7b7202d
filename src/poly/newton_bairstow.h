#ifndef QX_POLY_NEWTON_BAIRSTOW_H
#define QX_POLY_NEWTON_BAIRSTOW_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Coefficients ascend: coef[0] is the constant term.

// derivative[k - 1] = k coef[k], with one element fewer than `coef`.
void PolyDerivative(ConstRealVector coef, RealVector derivative);

struct RootLimits {
    int32_t iterations;
    double tolerance;
};

// Takes Newton steps from a guess and returns the point with the smallest residual seen.
double NewtonRoot(ConstRealVector coef, ConstRealVector derivative, double guess,
                  const RootLimits &limits);

// Improves guesses in pairs by Bairstow's method, each pair separately on the whole polynomial: a
// quadratic factor x^2 - r x - s is iterated until it settles. The roots of real pairs come first,
// then those of conjugate pairs. A guess without a partner comes last and is left as it is; with
// fewer than 4 coefficients all guesses are. `roots` has as many elements as there are guesses and
// does not overlap them. ErrOutOfMemory.
ErrorCode BairstowRoots(ConstRealVector coef, ConstComplexVector guesses, const RootLimits &limits,
                        ComplexVector roots);

} // namespace qx

#endif
