#ifndef QX_LINALG_FACTORISATIONS_QR_H
#define QX_LINALG_FACTORISATIONS_QR_H

#include "linalg/matrix.h"

namespace qx {

// The factors that QR routines form from an m by n matrix, with k = min(m, n): all of q (m by m)
// and r (m by n), the economical q (m by k) and r (k by n), or r (k by n) alone.
enum QRForm : int32_t { qrFull = 0, qrEconomical = 1, qrOnlyR = 2 };

// a = q r by Householder reflections; q is unitary and r upper triangular with a real diagonal of
// either sign. a is not changed. q may be empty with qrOnlyR.
// ErrNonFiniteInput, ErrOutOfMemory.
template <ElementType E>
ErrorCode QRDecompose(const ConstMatrixView<E> &a, QRForm form, const MatrixView<E> &q,
                      const MatrixView<E> &r);

// The same for the matrix whose column j is column pivots[j] of a. Each step takes the column that
// is longest below the finished rows (P. Businger and G. H. Golub, "Linear least squares solutions
// by Householder transformations", 1965), so the diagonal of r decreases in absolute value.
template <ElementType E>
ErrorCode QRDecomposePivoted(const ConstMatrixView<E> &a, QRForm form, IndexVector pivots,
                             const MatrixView<E> &q, const MatrixView<E> &r);

// The same by blocks of reflections (R. Schreiber and C. F. Van Loan, "A storage-efficient WY
// representation for products of Householder transformations", 1989) where min(m, n) is at least
// fewestBlocked, and as above otherwise. If pivots is empty, the columns keep their order. Results
// that overflow are infinite or NaN.
constexpr int32_t fewestBlocked = 160;
template <ElementType E>
ErrorCode QRDecomposeBlocked(const ConstMatrixView<E> &a, QRForm form, IndexVector pivots,
                             const MatrixView<E> &q, const MatrixView<E> &r);

// Full q and r by Gram-Schmidt orthogonalisation, with each projection made twice, so that q is
// unitary to a small multiple of m eps even if the columns are nearly dependent (L. Giraud, J.
// Langou, M. Rozloznik, "On the loss of orthogonality in the Gram-Schmidt orthogonalization
// process", 2005). The diagonal of r is not negative; it is 0 for a column that depends on those
// before it within m eps, for which q has a vector orthogonal to them instead.
// ErrNonFiniteInput, ErrOutOfMemory.
enum class GramSchmidt { Modified, Classical };
template <ElementType E>
ErrorCode QRByGramSchmidt(const ConstMatrixView<E> &a, GramSchmidt order, const MatrixView<E> &q,
                          const MatrixView<E> &r);

} // namespace qx

#endif
