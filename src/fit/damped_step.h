#ifndef QX_FIT_DAMPED_STEP_H
#define QX_FIT_DAMPED_STEP_H

#include "frame/views.h"
#include "qx/errors.h"

namespace qx {

// Solves a d = g for a square a after each row has been divided by a power of two near
// its largest element, so that pivots of parameters of different magnitude can be compared. a and g
// are overwritten; pivots is work memory, and no memory is allocated.
//
// ErrSingularMatrix.
ErrorCode SolveRowScaled(const RealMatrix &a, RealVector g, VectorView<ElementType::I32> pivots,
                         RealVector d);

// One damped step of a fit: solves a d = g, where the diagonal of a is multiplied by 1 + lambda,
// and adds d to the coefficients. a and g are overwritten.
//
// ErrNonFiniteInput (a diagonal element), ErrOutOfMemory, ErrSingularMatrix (also if a new
// coefficient is NaN).
ErrorCode AddDampedStep(const RealMatrix &a, RealVector g, double lambda, RealVector coefficients);

} // namespace qx

#endif
