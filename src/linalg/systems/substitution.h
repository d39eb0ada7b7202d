#ifndef QX_LINALG_SYSTEMS_SUBSTITUTION_H
#define QX_LINALG_SYSTEMS_SUBSTITUTION_H

#include "frame/views.h"
#include "frame/widths.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// The factors that a triangular solve reads.
enum class Factors {
    lu,          // square, row by row: unit lower triangle, then the upper one
    lowerPacked, // see Triangle (linalg/matrix.h)
    upperPacked,
    cholesky // the packed lower triangle, then its conjugate transpose
};

// Solves in place for all right sides, the columns of x, which has no gaps between its rows. The
// order of arithmetic is that of a single right side:
//   lu      for each row, the sum of the products in ascending order is subtracted from the element
//   packed  the multiples of each unknown are subtracted from all later elements when it is known
// No pivot is tested. ErrOutOfMemory, for more than one right side.
template <ElementType E>
ErrorCode Substitute(Factors factors, ConstVectorView<E> a, const MatrixView<E> &x);

// The same with memory for the strips of columns that are substituted together: n times
// `stripWidth` doubles, or none for a single right side.
inline constexpr int32_t stripWidth = 32;
QX_BY_WIDTH_TO_8(void, SubstituteStrips,
                 (Factors factors, const DBL *a, std::ptrdiff_t n, std::ptrdiff_t rightSides,
                  DBL *x, DBL *strip))
QX_BY_WIDTH_TO_8(void, CxSubstituteStrips,
                 (Factors factors, const CDB *a, std::ptrdiff_t n, std::ptrdiff_t rightSides,
                  CDB *x, DBL *strip))

} // namespace qx

#endif
