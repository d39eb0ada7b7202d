#ifndef QX_FIT_DAMPED_STEP_H
#define QX_FIT_DAMPED_STEP_H

#include "frame/views.h"
#include "qx/errors.h"

namespace qx {

// Solves a d = g for a square a after each row has been divided by a power of two near
// its largest element, so that pivots of parameters of different size can be compared. a and g
// are spoiled; pivots are work, and no memory is taken.
//
// ErrSingularMatrix.
ErrorCode SolveRowScaled(const RealMatrix &a, RealVector g, VectorView<ElementType::I32> pivots,
                         RealVector d);

// One damped step of a fit: a with its diagonal times 1 + lambda, solved for g, is added to the
// coefficients. a and g are spoiled.
//
// ErrNonFiniteInput (a diagonal element), ErrOutOfMemory, ErrSingularMatrix (also where a new
// coefficient is NaN).
ErrorCode AddDampedStep(const RealMatrix &a, RealVector g, double lambda, RealVector coefficients);

} // namespace qx

#endif
