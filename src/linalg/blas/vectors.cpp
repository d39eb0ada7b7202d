#include "linalg/blas/arguments.h"
#include "linalg/blas/blas.h"
#include "linalg/kernels.h"

#include <algorithm>

namespace qx::blas {

namespace {

constexpr auto Real = ElementType::DBL, Complex = ElementType::CDB;

// The number of elements of a vector that are copied at once, and of columns that are passed in one
// call.
constexpr std::ptrdiff_t chunkRows = 512;
constexpr std::ptrdiff_t chunkCols = 64;

// The rows from i on of a matrix's columns from j on; the rows of the view are the columns of the
// matrix.
template <ElementType E>
ConstMatrixView<E> Columns(const ElementOf<E> *a, std::ptrdiff_t lda, std::ptrdiff_t i,
                           std::ptrdiff_t rows, std::ptrdiff_t j, std::ptrdiff_t cols) {
    return {a + i + j * lda, static_cast<int32_t>(cols), static_cast<int32_t>(rows), lda};
}

// y += alpha a x, column by column.
template <ElementType E>
void AddByColumns(std::ptrdiff_t m, std::ptrdiff_t n, typename ScalarOf<E>::type alpha,
                  const ElementOf<E> *a, std::ptrdiff_t lda, const Strided<E> &x,
                  const Strided<E> &y) {
    ElementOf<E> factors[chunkCols], copy[chunkRows];
    for (std::ptrdiff_t i = 0; i < m; i += chunkRows) {
        const std::ptrdiff_t rows = std::min(chunkRows, m - i);
        ElementOf<E> *const sums = y.step == 1 ? y.data + i : copy;
        if (y.step != 1)
            for (std::ptrdiff_t r = 0; r < rows; ++r)
                copy[r] = y[i + r];
        for (std::ptrdiff_t j = 0; j < n; j += chunkCols) {
            const std::ptrdiff_t cols = std::min(chunkCols, n - j);
            for (std::ptrdiff_t c = 0; c < cols; ++c)
                factors[c] = alpha * x[j + c];
            AddTransposedProduct<E>(Columns<E>(a, lda, i, rows, j, cols), {factors, cols},
                                    {sums, rows});
        }
        if (y.step != 1)
            for (std::ptrdiff_t r = 0; r < rows; ++r)
                y[i + r] = copy[r];
    }
}

// y += alpha a^T x, or a^H x: for each column the sum of the sums over chunks of its rows.
template <ElementType E>
void AddByRows(std::ptrdiff_t m, std::ptrdiff_t n, typename ScalarOf<E>::type alpha,
               const ElementOf<E> *a, std::ptrdiff_t lda, bool conjugated, const Strided<E> &x,
               const Strided<E> &y) {
    ElementOf<E> copy[chunkRows], part[chunkCols], sums[chunkCols];
    const bool copied = x.step != 1 || conjugated;
    for (std::ptrdiff_t j = 0; j < n; j += chunkCols) {
        const std::ptrdiff_t cols = std::min(chunkCols, n - j);
        for (std::ptrdiff_t i = 0; i < m; i += chunkRows) {
            const std::ptrdiff_t rows = std::min(chunkRows, m - i);
            for (std::ptrdiff_t r = 0; copied && r < rows; ++r)
                copy[r] = conjugated ? Conj(x[i + r]) : x[i + r];
            RowProducts<E>(Columns<E>(a, lda, i, rows, j, cols), {copied ? copy : x.data + i, rows},
                           {part, cols});
            for (std::ptrdiff_t c = 0; c < cols; ++c)
                sums[c] = i == 0 ? part[c] : sums[c] + part[c];
        }
        for (std::ptrdiff_t c = 0; c < cols; ++c)
            y[j + c] = y[j + c] + alpha * (conjugated ? Conj(sums[c]) : sums[c]);
    }
}

template <ElementType E>
void MatrixVector(const char *trans, std::ptrdiff_t m, std::ptrdiff_t n,
                  typename ScalarOf<E>::type alpha, const ElementOf<E> *a, std::ptrdiff_t lda,
                  const ElementOf<E> *x, std::ptrdiff_t incx, typename ScalarOf<E>::type beta,
                  ElementOf<E> *y, std::ptrdiff_t incy) {
    if (m <= 0 || n <= 0)
        return;
    const bool plain = Is(trans, 'N');
    const Strided<E> from(x, plain ? n : m, incx), to(y, plain ? m : n, incy);
    Scale<E>(to, plain ? m : n, beta);
    if (IsReal(alpha, 0.0))
        return;
    if (plain)
        AddByColumns<E>(m, n, alpha, a, lda, from, to);
    else
        AddByRows<E>(m, n, alpha, a, lda, E == Complex && Is(trans, 'C'), from, to);
}

// Fills a symmetric or Hermitian matrix, of which one triangle is given.
template <ElementType E>
void FillFromTriangle(bool isLower, std::ptrdiff_t n, const ElementOf<E> *a, std::ptrdiff_t lda,
                      ElementOf<E> *whole) {
    for (std::ptrdiff_t j = 0; j < n; ++j) {
        whole[j + j * n] = ScalarOf<E>::Of(RealPart(a[j + j * lda]));
        for (std::ptrdiff_t i = j + 1; i < n; ++i) {
            const ElementOf<E> &given = isLower ? a[i + j * lda] : a[j + i * lda];
            whole[i + j * n] = isLower ? given : ElementOf<E>(Conj(given));
            whole[j + i * n] = isLower ? ElementOf<E>(Conj(given)) : given;
        }
    }
}

// y += alpha a x, where a is symmetric or Hermitian and one triangle of it is read: tile by tile down the
// columns; each tile is multiplied with the part of x for its columns, and its transpose with the part
// for its rows.
template <ElementType E>
void SymmetricMatrixVector(const char *uplo, std::ptrdiff_t n, typename ScalarOf<E>::type alpha,
                           const ElementOf<E> *a, std::ptrdiff_t lda, const ElementOf<E> *x,
                           std::ptrdiff_t incx, typename ScalarOf<E>::type beta, ElementOf<E> *y,
                           std::ptrdiff_t incy) {
    if (n <= 0)
        return;
    const Strided<E> from(x, n, incx), to(y, n, incy);
    Scale<E>(to, n, beta);
    if (IsReal(alpha, 0.0))
        return;
    constexpr std::ptrdiff_t tile = chunkCols;
    const bool isLower = Is(uplo, 'L');
    ElementOf<E> whole[tile * tile];
    for (std::ptrdiff_t j = 0; j < n; j += tile) {
        const std::ptrdiff_t cols = std::min(tile, n - j);
        for (std::ptrdiff_t i = isLower ? j : 0; i < (isLower ? n : j + cols); i += tile) {
            const std::ptrdiff_t rows = std::min(tile, n - i);
            const ElementOf<E> *const part = a + i + j * lda;
            if (i == j) {
                FillFromTriangle<E>(isLower, cols, part, lda, whole);
                AddByColumns<E>(cols, cols, alpha, whole, cols, from.from(j), to.from(j));
            } else {
                AddByColumns<E>(rows, cols, alpha, part, lda, from.from(j), to.from(i));
                AddByRows<E>(rows, cols, alpha, part, lda, E == Complex, from.from(i), to.from(j));
            }
        }
    }
}

template <ElementType E>
void AddOuter(std::ptrdiff_t m, std::ptrdiff_t n, typename ScalarOf<E>::type alpha,
              const ElementOf<E> *x, std::ptrdiff_t incx, const ElementOf<E> *y,
              std::ptrdiff_t incy, bool conjugated, ElementOf<E> *a, std::ptrdiff_t lda) {
    if (m <= 0 || n <= 0 || IsReal(alpha, 0.0))
        return;
    const Strided<E> left(x, m, incx), right(y, n, incy);
    ElementOf<E> factors[chunkCols], copy[chunkRows];
    for (std::ptrdiff_t i = 0; i < m; i += chunkRows) {
        const std::ptrdiff_t rows = std::min(chunkRows, m - i);
        for (std::ptrdiff_t r = 0; left.step != 1 && r < rows; ++r)
            copy[r] = left[i + r];
        for (std::ptrdiff_t j = 0; j < n; j += chunkCols) {
            const std::ptrdiff_t cols = std::min(chunkCols, n - j);
            for (std::ptrdiff_t c = 0; c < cols; ++c)
                factors[c] = alpha * (conjugated ? Conj(right[j + c]) : right[j + c]);
            AddOuterProduct<E>(
                {a + i + j * lda, static_cast<int32_t>(cols), static_cast<int32_t>(rows), lda},
                {factors, cols}, {left.step == 1 ? left.data + i : copy, rows});
        }
    }
}

template <ElementType E>
void AddMultiple(std::ptrdiff_t n, typename ScalarOf<E>::type alpha, const ElementOf<E> *x,
                 std::ptrdiff_t incx, ElementOf<E> *y, std::ptrdiff_t incy) {
    if (n <= 0 || IsReal(alpha, 0.0))
        return;
    if (incx == 1 && incy == 1) {
        const auto count = static_cast<int32_t>(n);
        const ElementOf<E> factor = alpha;
        return AddOuterProduct<E>({y, 1, count}, {&factor, 1}, {x, n});
    }
    const Strided<E> from(x, n, incx), to(y, n, incy);
    for (std::ptrdiff_t i = 0; i < n; ++i)
        to[i] = to[i] + alpha * from[i];
}

// The elements and s may be real or complex.
template <ElementType E, class Sine>
void Rotate(std::ptrdiff_t n, ElementOf<E> *x, std::ptrdiff_t incx, ElementOf<E> *y,
            std::ptrdiff_t incy, double c, Sine s) {
    const Strided<E> p(x, n, incx), q(y, n, incy);
    for (std::ptrdiff_t i = 0; i < n; ++i) {
        const typename ScalarOf<E>::type u = p[i], v = q[i];
        p[i] = u * c + v * s;
        q[i] = v * c - u * Conj(s);
    }
}

} // namespace

} // namespace qx::blas

using qx::blas::AddMultiple, qx::blas::AddOuter, qx::blas::Complex, qx::blas::MatrixVector,
    qx::blas::Real, qx::blas::Rotate, qx::blas::SymmetricMatrixVector;

void dgemv_(const char *trans, const int32_t *m, const int32_t *n, const DBL *alpha, const DBL *a,
            const int32_t *lda, const DBL *x, const int32_t *incx, const DBL *beta, DBL *y,
            const int32_t *incy, std::size_t) {
    MatrixVector<Real>(trans, *m, *n, *alpha, a, *lda, x, *incx, *beta, y, *incy);
}
void zgemv_(const char *trans, const int32_t *m, const int32_t *n, const CDB *alpha, const CDB *a,
            const int32_t *lda, const CDB *x, const int32_t *incx, const CDB *beta, CDB *y,
            const int32_t *incy, std::size_t) {
    MatrixVector<Complex>(trans, *m, *n, *alpha, a, *lda, x, *incx, *beta, y, *incy);
}

void dsymv_(const char *uplo, const int32_t *n, const DBL *alpha, const DBL *a, const int32_t *lda,
            const DBL *x, const int32_t *incx, const DBL *beta, DBL *y, const int32_t *incy,
            std::size_t) {
    SymmetricMatrixVector<Real>(uplo, *n, *alpha, a, *lda, x, *incx, *beta, y, *incy);
}
void zhemv_(const char *uplo, const int32_t *n, const CDB *alpha, const CDB *a, const int32_t *lda,
            const CDB *x, const int32_t *incx, const CDB *beta, CDB *y, const int32_t *incy,
            std::size_t) {
    SymmetricMatrixVector<Complex>(uplo, *n, *alpha, a, *lda, x, *incx, *beta, y, *incy);
}

void dger_(const int32_t *m, const int32_t *n, const DBL *alpha, const DBL *x, const int32_t *incx,
           const DBL *y, const int32_t *incy, DBL *a, const int32_t *lda) {
    AddOuter<Real>(*m, *n, *alpha, x, *incx, y, *incy, false, a, *lda);
}
void zgeru_(const int32_t *m, const int32_t *n, const CDB *alpha, const CDB *x, const int32_t *incx,
            const CDB *y, const int32_t *incy, CDB *a, const int32_t *lda) {
    AddOuter<Complex>(*m, *n, *alpha, x, *incx, y, *incy, false, a, *lda);
}
void zgerc_(const int32_t *m, const int32_t *n, const CDB *alpha, const CDB *x, const int32_t *incx,
            const CDB *y, const int32_t *incy, CDB *a, const int32_t *lda) {
    AddOuter<Complex>(*m, *n, *alpha, x, *incx, y, *incy, true, a, *lda);
}

void daxpy_(const int32_t *n, const DBL *alpha, const DBL *x, const int32_t *incx, DBL *y,
            const int32_t *incy) {
    AddMultiple<Real>(*n, *alpha, x, *incx, y, *incy);
}
void zaxpy_(const int32_t *n, const CDB *alpha, const CDB *x, const int32_t *incx, CDB *y,
            const int32_t *incy) {
    AddMultiple<Complex>(*n, *alpha, x, *incx, y, *incy);
}

void drot_(const int32_t *n, DBL *x, const int32_t *incx, DBL *y, const int32_t *incy, const DBL *c,
           const DBL *s) {
    if (*incx == 1 && *incy == 1)
        qx::RotateReal(*n, x, y, *c, *s);
    else
        Rotate<Real>(*n, x, *incx, y, *incy, *c, double{*s});
}
void zdrot_(const int32_t *n, CDB *x, const int32_t *incx, CDB *y, const int32_t *incy,
            const DBL *c, const DBL *s) {
    if (*incx == 1 && *incy == 1)
        qx::RotateReal(2 * std::ptrdiff_t{*n}, &x->re, &y->re, *c, *s);
    else
        Rotate<Complex>(*n, x, *incx, y, *incy, *c, double{*s});
}
void zrot_(const int32_t *n, CDB *x, const int32_t *incx, CDB *y, const int32_t *incy, const DBL *c,
           const CDB *s) {
    if (*incx == 1 && *incy == 1)
        qx::RotateComplexRows(x, y, *n, *c, *s);
    else
        Rotate<Complex>(*n, x, *incx, y, *incy, *c, *s);
}
