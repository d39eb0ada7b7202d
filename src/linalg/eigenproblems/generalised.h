#ifndef QX_LINALG_EIGENPROBLEMS_GENERALISED_H
#define QX_LINALG_EIGENPROBLEMS_GENERALISED_H

#include "linalg/factorisations/schur.h"
#include "linalg/lapack.h"

namespace qx {

// Eigenproblems and singular values of two matrices, through LAPACK.

// Generalised Schur form of square matrices a and b of the same order: a becomes s and b becomes t,
// with a = q s z^H and b = q t z^H, ordered by the quotients alpha / beta; a quotient with beta 0
// is infinite. q, z and `vectors`, the right eigenvectors of unit length, may be empty.
//
// ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit, ErrConditionTooHigh, ErrSolverCount.
template <ElementType E>
ErrorCode GeneralisedSchur(const MatrixView<E> &a, const MatrixView<E> &b, SchurOrder order,
                           const MatrixView<E> &q, const MatrixView<E> &z, ComplexVector alpha,
                           VectorView<E> beta, const ComplexMatrix &vectors);

// Generalised singular values of a (m by n) and b (p by n): u^H a q and v^H b q are diagonal
// matrices of alpha and of beta times the same triangle (0 r). a and b are overwritten with
// LAPACK's results, which contain r. alpha and beta have n elements, of which the first k + l
// count. ErrNonFiniteInput, ErrOutOfMemory, ErrIterationLimit.
template <ElementType E>
ErrorCode GeneralisedSingular(const MatrixView<E> &a, const MatrixView<E> &b,
                              GeneralisedRanks *ranks, RealVector alpha, RealVector beta,
                              const MatrixView<E> &u, const MatrixView<E> &v,
                              const MatrixView<E> &q);

} // namespace qx

#endif
