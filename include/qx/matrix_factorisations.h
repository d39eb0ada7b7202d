#ifndef QX_MATRIX_FACTORISATIONS_H
#define QX_MATRIX_FACTORISATIONS_H

/* Factorisations of matrices: LU, Cholesky, QR, singular values, Schur and Hessenberg forms,
   balancing, and inverses from factors.

   Matrices are stored row by row. Exports with an `err` have the function result 0; the others
   return their code. Every failure empties all outputs. */

#include "qx/types.h"

QX_BEGIN_DECLS

/** Factors the m by n matrix a in place, P a = L U, by Crout's method with partial pivoting: L,
    whose unit diagonal is not stored, is below the diagonal, and U on and above it. pivots holds m
    row numbers, counted from 0: in step k row k was exchanged with row pivots[k]. *parity is 1 for
    an odd number of exchanges, else 0. The factors of a singular matrix are returned, too.
    Codes: ErrEmptyInput (a is empty), ErrOutOfMemory (no memory), WarnSingular (U has a zero on its
    diagonal).
    NaN: a in some results. */
QX_API int32_t LU_head(QX_INOUT DBL2D a, QX_OUT I32_1D pivots, QX_OUT int32_t *parity,
                       QX_OUT ErrorCode *err);
/** As LU_head, for complex elements. */
QX_API int32_t CxLU_head(QX_INOUT CDB2D a, QX_OUT I32_1D pivots, QX_OUT int32_t *parity,
                         QX_OUT ErrorCode *err);

/** Cholesky factor L of the symmetric positive definite a = L L^T; it replaces the lower triangle
    of a in packed storage: column by column, column j with rows j to n-1. A nearly singular matrix
    is refused, too: one for which a diagonal element of L is below 1.5e-8 times the largest element
    of L.
    Codes: ErrEmptyInput (packed is empty), ErrNotSquare (the length is not of the form n(n+1)/2),
    ErrNotPositiveDefinite (a is not positive definite, or nearly singular).
    NaN: packed refused with ErrNotPositiveDefinite. */
QX_API int32_t Cholesky_head(QX_INOUT DBL1D packed, QX_OUT ErrorCode *err);
/** As Cholesky_head, for a Hermitian a = L L^H; only the real parts of its diagonal are used. */
QX_API int32_t CxCholesky_head(QX_INOUT CDB1D packed, QX_OUT ErrorCode *err);

/** Replaces a square matrix by its Cholesky factor (Cholesky_head): the lower triangle is read and
    overwritten by L, and the upper triangle is set to 0.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrNotPositiveDefinite (a is not positive definite, or nearly singular).
    NaN: a refused with ErrNotPositiveDefinite or in no result. */
QX_API int32_t FullCholesky_head(QX_INOUT DBL2D a, QX_OUT ErrorCode *err);
/** As FullCholesky_head, for a Hermitian matrix. */
QX_API int32_t CxFullCholesky_head(QX_INOUT CDB2D a, QX_OUT ErrorCode *err);

/** Replaces the packed factor of Cholesky_head by the packed lower triangle of the inverse of L
    L^T.
    Codes: ErrEmptyInput (packedFactor is empty), ErrNotSquare (the length is not of the form
    n(n+1)/2), ErrSingularMatrix (a diagonal element is 0).
    NaN: packedFactor in all results or in some results. */
QX_API int32_t Cholesky_InvMatrix_head(QX_INOUT DBL1D packedFactor, QX_OUT ErrorCode *err);
/** As Cholesky_InvMatrix_head, for L L^H. */
QX_API int32_t CxCholesky_InvMatrix_head(QX_INOUT CDB1D packedFactor, QX_OUT ErrorCode *err);

/** Replaces a symmetric positive definite matrix by its inverse. Only the lower triangle is read;
    both are written.
    Codes: ErrNotSquare (a is not square), ErrEmptyInput (a is empty), ErrOutOfMemory (no memory),
    ErrNotPositiveDefinite (a is not positive definite, or nearly singular).
    NaN: a refused with ErrNotPositiveDefinite or in no result. */
QX_API int32_t InvMatrixChoDri_head(QX_INOUT DBL2D a, QX_OUT ErrorCode *err);
/** As InvMatrixChoDri_head, for a Hermitian matrix. */
QX_API int32_t CxInvMatrixChoDri_head(QX_INOUT CDB2D a, QX_OUT ErrorCode *err);

/** As InvMatrixChoDri_head, without allocating memory: packedWork, of at least n(n+1)/2 elements,
    is the working memory. It is neither resized nor emptied.
    Codes: ErrSizeMismatch (packedWork is too short), ErrNotSquare (a is not square), ErrEmptyInput
    (a is empty), ErrNotPositiveDefinite (a is not positive definite, or nearly singular).
    NaN: a refused with ErrNotPositiveDefinite or in no result; packedWork in no result. */
QX_API int32_t PreallocInvMatrixChoDri_H(QX_INOUT DBL2D a, QX_INOUT DBL1D packedWork,
                                         QX_OUT ErrorCode *err);

/* A triangle in packed storage, column by column: `triangle` 0 lower, column j with rows j to n-1;
   1 upper, column j with rows 0 to j. */
typedef struct PackedTriangle {
    DBL1D packed;
    int32_t triangle;
} PackedTriangle;
typedef struct CxPackedTriangle {
    CDB1D packed;
    int32_t triangle;
} CxPackedTriangle;

/** Replaces a packed triangle by its inverse.
    Codes: ErrInvalidSelector (triangle is not 0 or 1), ErrEmptyInput (packed is empty),
    ErrNotSquare (the length is not of the form n(n+1)/2), ErrNonFiniteInput (an element is not
    finite), ErrSingularMatrix (a diagonal element is at most 2.2e-16 times the largest element in
    absolute value).
    NaN: a.packed refused with ErrNonFiniteInput. */
QX_API int32_t Tri_InvMatrix_head(QX_INOUT PackedTriangle *a, QX_OUT ErrorCode *err);
/** As Tri_InvMatrix_head, for complex elements. */
QX_API int32_t CxTri_InvMatrix_head(QX_INOUT CxPackedTriangle *a, QX_OUT ErrorCode *err);

/** Replaces a triangular matrix by its inverse. triangle: 0 lower; 1 upper. The other triangle is
    not read; it becomes 0.
    Codes: ErrInvalidSelector (*triangle is not 0 or 1), ErrNotSquare (a is not square),
    ErrEmptyInput (a is empty), ErrOutOfMemory (no memory), ErrNonFiniteInput (an element is not
    finite), ErrSingularMatrix (a diagonal element is at most 2.2e-16 times the largest element in
    absolute value).
    NaN: a refused with ErrNonFiniteInput or in no result. */
QX_API int32_t InvMatrixTriDri_head(QX_INOUT DBL2D a, QX_IN const int32_t *triangle,
                                    QX_OUT ErrorCode *err);
/** As InvMatrixTriDri_head, for complex elements. */
QX_API int32_t CxInvMatrixTriDri_head(QX_INOUT CDB2D a, QX_IN const int32_t *triangle,
                                      QX_OUT ErrorCode *err);

/** a = q r with q (m by m) unitary and r (m by n) upper triangular, for an m by n matrix a.
    algorithm: 0 Householder reflections; 1 modified Gram-Schmidt orthogonalisation; 2 classical
    Gram-Schmidt orthogonalisation. With reflections the diagonal of r has either sign.
    Orthogonalisation computes each projection twice; the diagonal of r is then not negative, and 0
    for a column that depends on the previous ones within m eps, for which q has another vector
    orthogonal to them. All three keep q unitary and a - q r small to a few m eps, however
    ill-conditioned a is. L. Giraud, J. Langou, M. Rozloznik, "On the loss of orthogonality in the
    Gram-Schmidt orthogonalization process", 2005.
    Codes: ErrInvalidSelector (*algorithm is not 0, 1 or 2), ErrEmptyInput (a is empty),
    ErrOutOfMemory (no memory), ErrNonFiniteInput (an element is not finite).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t qrd_head(QX_IN DBL2D a, QX_IN const int32_t *algorithm, QX_OUT DBL2D q,
                        QX_OUT DBL2D r, QX_OUT ErrorCode *err);
/** As qrd_head, for complex elements; the diagonal of r is real. */
QX_API int32_t Cxqrd_head(QX_IN CDB2D a, QX_IN const int32_t *algorithm, QX_OUT CDB2D q,
                          QX_OUT CDB2D r, QX_OUT ErrorCode *err);

/** QR factors by Householder reflections of the m by n matrix a, k = min(m, n). economy: 0 q is m
    by m and r is m by n; 1 q is m by k and r is k by n; 2 r is k by n and q is empty. If pivoting
    is 0, a = q r, and permutation is empty. Otherwise a permutation = q r, where permutation is n
    by n with a single 1 in each row and column; each step takes the longest remaining column, so
    that the diagonal of r decreases in absolute value (P. Businger and G. H. Golub, 1965). With q
    it takes twice as long as LAPACK at order 500; QRDec2026H works on blocks and is faster.
    Codes: ErrEmptyInput (a is empty), ErrInvalidSelector (economy is not 0, 1 or 2), ErrOutOfMemory
    (no memory), ErrNonFiniteInput (an element is not finite).
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode QRDecH(QX_IN DBL2D a, int32_t pivoting, int32_t economy, QX_OUT I32_2D permutation,
                        QX_OUT DBL2D q, QX_OUT DBL2D r);
/** As QRDecH, for complex elements; the diagonal of r is real. */
QX_API ErrorCode CxQRDecH(QX_IN CDB2D a, int32_t pivoting, int32_t economy,
                          QX_OUT I32_2D permutation, QX_OUT CDB2D q, QX_OUT CDB2D r);

/** As QRDecH, with blocks of reflections if min(m, n) is at least 160: with q, it takes half the
    time at order 500, or 0.8 of it for complex elements. For smaller matrices the results are those
    of QRDecH, to the bit. R. Schreiber and C. F. Van Loan, "A storage-efficient WY representation
    for products of Householder transformations", 1989. */
QX_API ErrorCode QRDec2026H(QX_IN DBL2D a, int32_t pivoting, int32_t economy,
                            QX_OUT I32_2D permutation, QX_OUT DBL2D q, QX_OUT DBL2D r);
/** As QRDec2026H, for complex elements; the diagonal of r is real. */
QX_API ErrorCode CxQRDec2026H(QX_IN CDB2D a, int32_t pivoting, int32_t economy,
                              QX_OUT I32_2D permutation, QX_OUT CDB2D q, QX_OUT CDB2D r);

/** Singular value decomposition a = u diag(s) v^T of the m by n matrix a, k = min(m, n): a becomes
    u (m by k), s has k values in descending order, and v is n by k. G. H. Golub and C. Reinsch,
    "Singular value decomposition and least squares solutions", 1970. For norms of 1 and above, the
    error of u diag(s) v^T is a few n eps times the norm. Values below 2.2e-16 count as zero
    whatever the norm, so for norms below 1 the error is up to 2.2e-16: relative to the norm it was
    measured as 2e-10 at a norm of 1e-6 and 2e-4 at 1e-12, and no digit is correct below 1e-15.
    Singular values lose digits more slowly: relative to the largest one 1e-14 at a norm of 1e-8,
    1e-6 at 1e-12 and 1e-2 at 1e-14. Scale up a matrix with a norm below 1 first, also for the other
    exports that use this decomposition; SVD2026_head does so itself. A value that overflows is
    infinite.
    Codes: ErrEmptyInput (a is empty), ErrOutOfMemory (no memory), ErrNonFiniteInput (an element is
    not finite), ErrIterationLimit (100 iterations were not enough for a value).
    NaN: a refused with ErrNonFiniteInput. */
QX_API int32_t SVD_head(QX_INOUT DBL2D a, QX_OUT DBL1D s, QX_OUT DBL2D v, QX_OUT ErrorCode *err);
/** As SVD_head, for complex elements: a = u diag(s) v^H. */
QX_API int32_t CxSVD_head(QX_INOUT CDB2D a, QX_OUT DBL1D s, QX_OUT CDB2D v, QX_OUT ErrorCode *err);

/** As SVD_head, but u is a separate output and the code is the function result; if fullSize is not
    0, u is m by m and v is n by n. */
QX_API ErrorCode SVDEx_head(QX_IN DBL2D a, int32_t fullSize, QX_OUT DBL2D u, QX_OUT DBL1D s,
                            QX_OUT DBL2D v);
/** As SVDEx_head, for complex elements: a = u diag(s) v^H. */
QX_API ErrorCode CxSVDEx_head(QX_IN CDB2D a, int32_t fullSize, QX_OUT CDB2D u, QX_OUT DBL1D s,
                              QX_OUT CDB2D v);

/** As SVD_head, for the values only, which are the same, to the bit, as with the vectors.
    SVDS2026_head scales by itself. */
QX_API int32_t SVDS_head(QX_IN DBL2D a, QX_OUT DBL1D s, QX_OUT ErrorCode *err);
/** As SVDS_head, for complex elements; CxSVDS2026_head scales by itself. */
QX_API int32_t CxSVDS_head(QX_IN CDB2D a, QX_OUT DBL1D s, QX_OUT ErrorCode *err);

/** Singular value decomposition a = u diag(s) v^T of the m by n matrix a, k = min(m, n), of any
    norm: u is m by k, s has k values in descending order, and v is n by k; if fullSize is not 0, u
    is m by m and v is n by n. The matrix is scaled by a power of two, decomposed as SVD_head does,
    and the values are scaled back; 2^j a has the same u and v, to the bit. |a - u diag(s) v^T| is
    up to 4 max(m, n) eps |a|, u and v are orthogonal within 8 max(m, n) eps, and the values are
    within max(m, n) eps s[0] of LAPACK's, from 1e-300 to 1e300 (docs/accuracy/matrix_revisions.md).
    Values much smaller than s[0] have the same absolute error. A value that overflows is infinite.
    G. H. Golub and C. Reinsch, "Singular value decomposition and least squares solutions", 1970.
    Codes: ErrEmptyInput (a is empty), ErrOutOfMemory (no memory, or the host refuses a resize),
    ErrNonFiniteInput (an element is not finite), ErrIterationLimit (100 iterations were not enough
    for a value).
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode SVD2026_head(QX_IN DBL2D a, int32_t fullSize, QX_OUT DBL2D u, QX_OUT DBL1D s,
                              QX_OUT DBL2D v);
/** As SVD2026_head, for complex elements: a = u diag(s) v^H.
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode CxSVD2026_head(QX_IN CDB2D a, int32_t fullSize, QX_OUT CDB2D u, QX_OUT DBL1D s,
                                QX_OUT CDB2D v);
/** As SVD2026_head, for the values only, which are the same, to the bit, as with the vectors.
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode SVDS2026_head(QX_IN DBL2D a, QX_OUT DBL1D s);
/** As SVDS2026_head, for complex elements.
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode CxSVDS2026_head(QX_IN CDB2D a, QX_OUT DBL1D s);

/** Replaces the square matrix a by its Hessenberg form h = q^T a q, which is zero below the first
    subdiagonal, by Householder reflections. Rows and columns low to high, counted from 1 and as
    returned by MatrixBalance_head, are reduced; a must be upper triangular outside of them.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrIndexOutOfRange (not 1 <=
    low <= high <= n), ErrOutOfMemory (no memory), ErrNonFiniteInput (an element is not finite).
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode Hessenberg_head(QX_INOUT DBL2D a, int32_t low, int32_t high, QX_OUT DBL2D q);
/** As Hessenberg_head, for complex elements: h = q^H a q. */
QX_API ErrorCode CxHessenberg_head(QX_INOUT CDB2D a, int32_t low, int32_t high, QX_OUT CDB2D q);

/** Balances the square matrix a in place. job: 0 does nothing; 1 permutes rows and columns so that
    eigenvalues are isolated in the corners; 2 multiplies rows and columns by powers of two so that
    their sums of absolute values become similar, except those whose sums or factor are outside
    2^-970 to 2^970; 3 does both. Rows and columns *low to *high, counted from 1, are the block
    between the corners. scale[i] is the factor of row and column i within the block; outside the
    block it is the number, counted from 1, of the row with which row i was exchanged. The exchanges
    were made from row n down to high + 1, then from row 1 to low - 1. B. N. Parlett and C. Reinsch,
    "Balancing a matrix for calculation of eigenvalues and eigenvectors", 1969.
    Codes: ErrEmptyInput (a is empty), ErrNotSquare (a is not square), ErrInvalidSelector (job is
    not 0 to 3), ErrOutOfMemory (no memory), ErrNonFiniteInput (an element is not finite).
    NaN: a refused with ErrNonFiniteInput. */
QX_API ErrorCode MatrixBalance_head(QX_INOUT DBL2D a, int32_t job, QX_OUT int32_t *low,
                                    QX_OUT int32_t *high, QX_OUT DBL1D scale);
/** As MatrixBalance_head, for complex elements, whose magnitude is taken as |re| + |im|. */
QX_API ErrorCode CxMatrixBalance_head(QX_INOUT CDB2D a, int32_t job, QX_OUT int32_t *low,
                                      QX_OUT int32_t *high, QX_OUT DBL1D scale);

/** Transforms eigenvectors of a matrix balanced by MatrixBalance_head, the columns of v, into those
    of the original matrix; job, low, high and scale are those of that call. job: as
    MatrixBalance_head. side: 0 right eigenvectors; 1 left eigenvectors. The vectors are not scaled
    to unit length.
    Codes: ErrEmptyInput (v or scale is empty), ErrInvalidSelector (job is not 0 to 3, or side is
    not 0 or 1), ErrSizeMismatch (scale does not have as many elements as v has rows),
    ErrIndexOutOfRange (not 1 <= low <= high <= n, or an exchange is not with a row of v),
    ErrOutOfMemory (no memory).
    NaN: scale refused with ErrIndexOutOfRange or in some results; v in some results. */
QX_API ErrorCode EigenVBack_head(int32_t job, int32_t side, int32_t low, int32_t high,
                                 QX_IN DBL1D scale, QX_INOUT DBL2D v);
/** As EigenVBack_head, for complex vectors. */
QX_API ErrorCode CxEigenVBack_head(int32_t job, int32_t side, int32_t low, int32_t high,
                                   QX_IN DBL1D scale, QX_INOUT CDB2D v);

QX_END_DECLS

#endif
