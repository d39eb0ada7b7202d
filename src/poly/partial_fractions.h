#ifndef QX_POLY_PARTIAL_FRACTIONS_H
#define QX_POLY_PARTIAL_FRACTIONS_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Poles and residues of numerator / denominator, as PartialFractionsH of
// include/qx/polynomial_arithmetic.h has them. The denominator has at least 2 ascending
// coefficients, finite and the last one other than 0, all others have one less; the tolerance is
// above 0.
//
// ErrOverflow (the monic denominator is not finite); ErrIterationLimit; ErrOutOfMemory.
ErrorCode PolesAndResidues(ConstRealVector numerator, ConstRealVector denominator, double tolerance,
                           ComplexVector poles, ComplexVector residues);

} // namespace qx

#endif
