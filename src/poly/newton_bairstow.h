#ifndef QX_POLY_NEWTON_BAIRSTOW_H
#define QX_POLY_NEWTON_BAIRSTOW_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Coefficients ascend: coef[0] is the constant term.

// k coef[k], one value less than coefficients.
void PolyDerivative(ConstRealVector coef, RealVector derivative);

struct RootLimits {
    int32_t iterations;
    double tolerance;
};

// Newton steps from a guess: the point with the smallest residual seen.
double NewtonRoot(ConstRealVector coef, ConstRealVector derivative, double guess,
                  const RootLimits &limits);

// Improves guesses in pairs by Bairstow's method, each pair by itself on the whole polynomial: a
// quadratic factor x^2 - r x - s is changed until its remainder settles. The roots of real pairs
// come first, then those of conjugate pairs. A guess without a partner comes last and stays as it
// is, as all do with fewer than 4 coefficients. `roots` has as many places as there are guesses and
// does not overlap them. ErrOutOfMemory.
ErrorCode BairstowRoots(ConstRealVector coef, ConstComplexVector guesses, const RootLimits &limits,
                        ComplexVector roots);

} // namespace qx

#endif
