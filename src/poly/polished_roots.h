#ifndef QX_POLY_POLISHED_ROOTS_H
#define QX_POLY_POLISHED_ROOTS_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Coefficients ascend: coef[0] is the constant term.

// Horner's rule at `count` points; a polynomial without coefficients is 0.
void PolyEvaluateReal(const DBL *x, int32_t count, const DBL *coef, int32_t n, DBL *out);

// k coef[k], n - 1 values.
void PolyDerivative(const DBL *coef, int32_t n, DBL *derivative);

// Newton steps from a guess: *root is the point with the smallest residual seen.
void NewtonRoot(const DBL *coef, int32_t n, double guess, int32_t maxIterations, double tolerance,
                DBL *root, const DBL *derivative);

// Improves guesses in pairs by Bairstow's method, each pair by itself on the whole polynomial: a
// quadratic factor x^2 - r x - s is changed until its remainder settles. The roots of real pairs
// come first, then those of conjugate pairs. A guess without a partner comes last and stays as it
// is, as all do with fewer than 4 coefficients. `roots` does not overlap the guesses.
// ErrOutOfMemory.
ErrorCode BairstowRoots(const DBL *coef, int32_t n, const CDB *guesses, int32_t guessCount,
                        int32_t maxIterations, double tolerance, CDB *roots, int32_t *rootCount);

} // namespace qx

#endif
