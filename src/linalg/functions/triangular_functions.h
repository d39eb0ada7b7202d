#ifndef QX_LINALG_FUNCTIONS_TRIANGULAR_FUNCTIONS_H
#define QX_LINALG_FUNCTIONS_TRIANGULAR_FUNCTIONS_H

#include "linalg/matrix.h"

namespace qx {

// Principal functions of an upper triangular matrix t, in place. t has zeros below its diagonal and
// no elements far above 1; if it is real, its diagonal is not negative.

// r r = t: column by column up to a small order; larger matrices are halved, and the off-diagonal
// block solves a triangular equation (A. Bjorck and S. Hammarling, "A Schur method for the square
// root of a matrix", 1983; by halves E. Deadman, N. J. Higham and R. Ralha, "Blocked Schur
// algorithms for computing the matrix square root", 2012). What rounding errors in t, of at most
// `negligible`, leave off the diagonal between diagonal elements that are no larger counts as 0.
// ErrOutOfMemory; ErrDegenerateValue (there is no root, or its elements overflow).
template <ElementType E>
ErrorCode SquareRootOfTriangle(const MatrixView<E> &t, double negligible);

// The logarithm of a t whose diagonal has no zeros: square roots bring t near the identity, a Pade
// approximant in partial fractions gives the logarithm of the root. The number of roots and the
// degree follow from norms of powers of root - 1; the diagonal and the superdiagonal of root - 1
// are computed from those of t alone (A. H. Al-Mohy and N. J. Higham, "Improved inverse scaling and
// squaring algorithms for the matrix logarithm", 2012).
// ErrOutOfMemory; ErrDegenerateValue (elements of the roots overflow).
template <ElementType E>
ErrorCode LogarithmOfTriangle(const MatrixView<E> &t);

} // namespace qx

#endif
