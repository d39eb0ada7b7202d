#ifndef QX_FIT_DAMPED_STEP_H
#define QX_FIT_DAMPED_STEP_H

#include "qx/errors.h"
#include "qx/types.h"

namespace qx {

// Solves a d = g for a square a of order n after each row has been divided by a power of two near
// its largest element, so that pivots of parameters of different size can be compared. a and g
// are spoiled; pivots are n elements of work, and no memory is taken.
//
// ErrSingularMatrix.
ErrorCode SolveRowScaled(DBL *a, DBL *g, int32_t n, I32 *pivots, DBL *d);

// One damped step of a fit: a with its diagonal times 1 + lambda, solved for g, is added to the
// coefficients. a and g are spoiled.
//
// ErrNonFiniteInput (a diagonal element), ErrOutOfMemory, ErrSingularMatrix (also where a new
// coefficient is NaN).
ErrorCode AddDampedStep(DBL *a, DBL *g, int32_t n, double lambda, DBL *coefficients);

} // namespace qx

#endif
