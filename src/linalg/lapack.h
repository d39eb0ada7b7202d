#ifndef QX_LINALG_LAPACK_H
#define QX_LINALG_LAPACK_H

#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// The ranks of a generalised singular value decomposition.
struct GeneralisedRanks {
    int32_t k, l;
};

// The routines of LAPACK that the library calls, overloaded by element. No other file includes
// LAPACK's header. The BLAS below it comes from LAPACK's own source, except for the costly
// routines, which are ours (blas/). LAPACK's matrices are stored column by column without gaps,
// hence plain pointers and sizes: see CopyTransposed.

namespace lapack {

// Each returns LAPACK's info: 0, a value that the driver documents, or noMemory.
constexpr int32_t noMemory = -1000;
// The code for a negative info.
inline ErrorCode CodeOf(int32_t info) { return info == noMemory ? ErrOutOfMemory : ErrInternal; }

// Solves with a band matrix; `band` has 2 lower + upper + 1 rows per column.
int32_t SolveBand(int32_t n, int32_t lower, int32_t upper, int32_t rightSides, DBL *band,
                  int32_t *pivots, DBL *b);
int32_t SolveBand(int32_t n, int32_t lower, int32_t upper, int32_t rightSides, CDB *band,
                  int32_t *pivots, CDB *b);

// Factors a tridiagonal matrix, and solves with its factors.
int32_t FactorTridiagonal(int32_t n, DBL *lower, DBL *diagonal, DBL *upper, DBL *upper2,
                          I32 *pivots);
int32_t SolveTridiagonal(bool transposed, int32_t n, int32_t rightSides, const DBL *lower,
                         const DBL *diagonal, const DBL *upper, const DBL *upper2,
                         const I32 *pivots, DBL *b);

// The functions below allocate their own scratch memory for LAPACK's work arrays. All matrices are
// Aligned (linalg/aligned.h), and of order n where no other size is named.

// Schur form of t: t becomes triangular, or for real elements quasi-triangular, w holds its
// eigenvalues and z its Schur vectors; with z null these are not computed. An info above 0: no
// convergence.
int32_t Schur(int32_t n, DBL *t, CDB *w, DBL *z);
int32_t Schur(int32_t n, CDB *t, CDB *w, CDB *z);
// Moves the block at row `from` of a Schur form to row `to`, rows counted from 0.
int32_t MoveInSchur(int32_t n, DBL *t, DBL *z, int32_t from, int32_t to);
int32_t MoveInSchur(int32_t n, CDB *t, CDB *z, int32_t from, int32_t to);

// Eigenvalues of a, which is lost: w; if z is not null, it receives the right eigenvectors of unit
// length, for real elements in the layout of GeneralisedVectors. An info above 0: no convergence.
int32_t Eigen(int32_t n, DBL *a, CDB *w, DBL *z);
int32_t Eigen(int32_t n, CDB *a, CDB *w, CDB *z);

// Eigenvalues w, ascending, of the symmetric or Hermitian matrix whose lower triangle a
// holds; with vectors, its columns become orthonormal eigenvectors, otherwise a is lost. An info
// above 0: no convergence.
int32_t SymmetricEigen(int32_t n, DBL *a, DBL *w, bool withVectors);
int32_t SymmetricEigen(int32_t n, CDB *a, DBL *w, bool withVectors);

// QR factors of a (m by n), with columns in their order, or exchanged by pivots, which count from 1.
// FormQ replaces the reflections in q by the first `columns` columns of the matrix q.
int32_t FactorQR(int32_t m, int32_t n, DBL *a, DBL *tau);
int32_t FactorQR(int32_t m, int32_t n, CDB *a, CDB *tau);
int32_t FactorPivotedQR(int32_t m, int32_t n, DBL *a, I32 *pivots, DBL *tau);
int32_t FactorPivotedQR(int32_t m, int32_t n, CDB *a, I32 *pivots, CDB *tau);
int32_t FormQ(int32_t m, int32_t columns, int32_t reflections, DBL *q, const DBL *tau);
int32_t FormQ(int32_t m, int32_t columns, int32_t reflections, CDB *q, const CDB *tau);

// Generalised Schur form of s and t, which become (quasi-)triangular: the eigenvalues are
// alpha[i] / beta[i], and q and z the left and the right Schur vectors.
int32_t GeneralisedSchur(int32_t n, DBL *s, DBL *t, CDB *alpha, DBL *beta, DBL *q, DBL *z);
int32_t GeneralisedSchur(int32_t n, CDB *s, CDB *t, CDB *alpha, CDB *beta, CDB *q, CDB *z);
int32_t MoveInGeneralisedSchur(int32_t n, DBL *s, DBL *t, DBL *q, DBL *z, int32_t from, int32_t to);
int32_t MoveInGeneralisedSchur(int32_t n, CDB *s, CDB *t, CDB *q, CDB *z, int32_t from, int32_t to);
// The right Schur vectors z become the right eigenvectors; the two columns of a pair are the real
// and the imaginary part of its first vector.
int32_t GeneralisedVectors(int32_t n, const DBL *s, const DBL *t, DBL *z);
int32_t GeneralisedVectors(int32_t n, const CDB *s, const CDB *t, CDB *z);

// Generalised singular values of a (m by n) and b (p by n), as LAPACK's xGGSVD3 documents them.
int32_t GeneralisedSingular(int32_t m, int32_t n, int32_t p, DBL *a, DBL *b,
                            GeneralisedRanks *ranks, DBL *alpha, DBL *beta, DBL *u, DBL *v, DBL *q);
int32_t GeneralisedSingular(int32_t m, int32_t n, int32_t p, CDB *a, CDB *b,
                            GeneralisedRanks *ranks, DBL *alpha, DBL *beta, CDB *u, CDB *v, CDB *q);

} // namespace lapack

} // namespace qx

#endif
