#ifndef QX_POLY_PARTIAL_FRACTIONS_H
#define QX_POLY_PARTIAL_FRACTIONS_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// Poles and residues of numerator / denominator, as documented for PartialFractionsH in
// include/qx/polynomial_arithmetic.h. The denominator has at least 2 ascending coefficients, which
// are finite and of which the last is not 0; the other arrays have one element fewer. The tolerance
// is above 0.
//
// ErrOverflow (the monic denominator is not finite); ErrIterationLimit; ErrOutOfMemory.
ErrorCode PolesAndResidues(ConstRealVector numerator, ConstRealVector denominator, double tolerance,
                           ComplexVector poles, ComplexVector residues);

} // namespace qx

#endif
