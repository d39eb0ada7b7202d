#ifndef QX_LINALG_BLAS_BLAS_H
#define QX_LINALG_BLAS_BLAS_H

#include "frame/widths.h"
#include "qx/types.h"

#include <cstddef>
#include <cstdint>

namespace qx {

// x becomes c x + s y and y becomes c y - s x, element by element.
QX_BY_WIDTH_TO_8(void, RotateReal, (std::ptrdiff_t n, DBL *x, DBL *y, double c, double s))

} // namespace qx

// The routines of BLAS, and one of LAPACK, that replace those in LAPACK's source, under the names
// by which compiled Fortran calls them. They do what the reference BLAS of LAPACK 3.11 documents:
// beta = 0 does not read the result, vectors with a negative increment start at their last element.
// Matrices are stored column by column; the trailing arguments are the lengths of the strings.
// Sizes and selectors are not checked. The order of arithmetic is that of linalg/README.md, "BLAS",
// and depends on sizes alone.
//
// Elements may be at any address that LAPACK itself accepts; their types let the compiler assume no
// alignment.
extern "C" {

// c = alpha op(a) op(b) + beta c.
void dgemm_(const char *transA, const char *transB, const int32_t *m, const int32_t *n,
            const int32_t *k, const DBL *alpha, const DBL *a, const int32_t *lda, const DBL *b,
            const int32_t *ldb, const DBL *beta, DBL *c, const int32_t *ldc, std::size_t,
            std::size_t);
void zgemm_(const char *transA, const char *transB, const int32_t *m, const int32_t *n,
            const int32_t *k, const CDB *alpha, const CDB *a, const int32_t *lda, const CDB *b,
            const int32_t *ldb, const CDB *beta, CDB *c, const int32_t *ldc, std::size_t,
            std::size_t);

// y = alpha op(a) x + beta y, where a is m by n.
void dgemv_(const char *trans, const int32_t *m, const int32_t *n, const DBL *alpha, const DBL *a,
            const int32_t *lda, const DBL *x, const int32_t *incx, const DBL *beta, DBL *y,
            const int32_t *incy, std::size_t);
void zgemv_(const char *trans, const int32_t *m, const int32_t *n, const CDB *alpha, const CDB *a,
            const int32_t *lda, const CDB *x, const int32_t *incx, const CDB *beta, CDB *y,
            const int32_t *incy, std::size_t);

// y = alpha a x + beta y, where a is symmetric or Hermitian of order n and one triangle of it is
// read.
void dsymv_(const char *uplo, const int32_t *n, const DBL *alpha, const DBL *a, const int32_t *lda,
            const DBL *x, const int32_t *incx, const DBL *beta, DBL *y, const int32_t *incy,
            std::size_t);
void zhemv_(const char *uplo, const int32_t *n, const CDB *alpha, const CDB *a, const int32_t *lda,
            const CDB *x, const int32_t *incx, const CDB *beta, CDB *y, const int32_t *incy,
            std::size_t);

// a += alpha x y^T, and with zgerc alpha x y^H.
void dger_(const int32_t *m, const int32_t *n, const DBL *alpha, const DBL *x, const int32_t *incx,
           const DBL *y, const int32_t *incy, DBL *a, const int32_t *lda);
void zgeru_(const int32_t *m, const int32_t *n, const CDB *alpha, const CDB *x, const int32_t *incx,
            const CDB *y, const int32_t *incy, CDB *a, const int32_t *lda);
void zgerc_(const int32_t *m, const int32_t *n, const CDB *alpha, const CDB *x, const int32_t *incx,
            const CDB *y, const int32_t *incy, CDB *a, const int32_t *lda);

// One triangle of c = alpha a b^T + alpha b a^T + beta c, where a and b are n by k; with a trans other
// than 'N' the products are a^T b and b^T a. For zher2k, c = alpha a b^H + conj(alpha) b a^H + beta c with
// real beta.
void dsyr2k_(const char *uplo, const char *trans, const int32_t *n, const int32_t *k,
             const DBL *alpha, const DBL *a, const int32_t *lda, const DBL *b, const int32_t *ldb,
             const DBL *beta, DBL *c, const int32_t *ldc, std::size_t, std::size_t);
void zher2k_(const char *uplo, const char *trans, const int32_t *n, const int32_t *k,
             const CDB *alpha, const CDB *a, const int32_t *lda, const CDB *b, const int32_t *ldb,
             const DBL *beta, CDB *c, const int32_t *ldc, std::size_t, std::size_t);

// b = alpha op(a) b or, on the right side, alpha b op(a), where a is triangular and b m by n.
void dtrmm_(const char *side, const char *uplo, const char *trans, const char *diag,
            const int32_t *m, const int32_t *n, const DBL *alpha, const DBL *a, const int32_t *lda,
            DBL *b, const int32_t *ldb, std::size_t, std::size_t, std::size_t, std::size_t);
void ztrmm_(const char *side, const char *uplo, const char *trans, const char *diag,
            const int32_t *m, const int32_t *n, const CDB *alpha, const CDB *a, const int32_t *lda,
            CDB *b, const int32_t *ldb, std::size_t, std::size_t, std::size_t, std::size_t);
// The same with the inverse of op(a).
void dtrsm_(const char *side, const char *uplo, const char *trans, const char *diag,
            const int32_t *m, const int32_t *n, const DBL *alpha, const DBL *a, const int32_t *lda,
            DBL *b, const int32_t *ldb, std::size_t, std::size_t, std::size_t, std::size_t);
void ztrsm_(const char *side, const char *uplo, const char *trans, const char *diag,
            const int32_t *m, const int32_t *n, const CDB *alpha, const CDB *a, const int32_t *lda,
            CDB *b, const int32_t *ldb, std::size_t, std::size_t, std::size_t, std::size_t);

// y += alpha x.
void daxpy_(const int32_t *n, const DBL *alpha, const DBL *x, const int32_t *incx, DBL *y,
            const int32_t *incy);
void zaxpy_(const int32_t *n, const CDB *alpha, const CDB *x, const int32_t *incx, CDB *y,
            const int32_t *incy);

// x becomes c x + s y and y becomes c y - s x; with zrot c y - conj(s) x.
void drot_(const int32_t *n, DBL *x, const int32_t *incx, DBL *y, const int32_t *incy, const DBL *c,
           const DBL *s);
void zdrot_(const int32_t *n, CDB *x, const int32_t *incx, CDB *y, const int32_t *incy,
            const DBL *c, const DBL *s);
void zrot_(const int32_t *n, CDB *x, const int32_t *incx, CDB *y, const int32_t *incy, const DBL *c,
           const CDB *s);
}

#endif
