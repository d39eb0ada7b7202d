#ifndef QX_POLY_PARTIAL_FRACTIONS_H
#define QX_POLY_PARTIAL_FRACTIONS_H

#include "qx/errors.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// Poles and residues of numerator / denominator, as PartialFractionsH of
// include/qx/polynomial_arithmetic.h has them. The denominator has n >= 2 ascending coefficients,
// finite and the last one other than 0, the numerator n - 1; poles and residues have n - 1 places.
//
// ErrOverflow (the monic denominator is not finite); ErrIterationLimit; ErrOutOfMemory.
ErrorCode PolesAndResidues(const DBL *numerator, const DBL *denominator, int32_t n,
                           double tolerance, CDB *poles, CDB *residues);

} // namespace qx

#endif
