#ifndef QX_LINALG_KERNELS_H
#define QX_LINALG_KERNELS_H

#include "frame/views.h"
#include "frame/widths.h"
#include "qx/types.h"

#include <cstddef>

namespace qx {

// The inner loops of the factorisations, on row-major blocks whose rows are `stride` elements
// apart. The order of arithmetic of each element is the same at every width.

// y[j] += sum over i of x[i] a[i][j], i ascending.
QX_BY_WIDTH_TO_8(void, AddTransposedProductReal,
                 (const DBL *a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const DBL *x,
                  DBL *y))
QX_BY_WIDTH_TO_8(void, AddTransposedProductComplex,
                 (const CDB *a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const CDB *x,
                  CDB *y))

// a[i][j] += x[i] y[j].
QX_BY_WIDTH_TO_8(void, AddOuterProductReal,
                 (DBL * a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const DBL *x,
                  const DBL *y))
QX_BY_WIDTH_TO_8(void, AddOuterProductComplex,
                 (CDB * a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const CDB *x,
                  const CDB *y))

// Column by column, a -= v (v^H a) / kappa: product[j] = the sum over i of conj(v[i]) a[i][j], i
// ascending, and a[i][j] += v[i] (-(product[j] / kappa)).
QX_BY_WIDTH_TO_8(void, ReflectFromLeftReal,
                 (DBL * a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const DBL *v,
                  double kappa))
QX_BY_WIDTH_TO_8(void, ReflectFromLeftComplex,
                 (CDB * a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const CDB *v,
                  CDB kappa))

// a[i][j] -= x[i] y[j], where x is a column of the matrix of a, so its elements are also `stride`
// apart.
QX_BY_WIDTH_TO_8(void, SubtractOuterProductComplex,
                 (CDB * a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const CDB *x,
                  const CDB *y))

// row[j] -= conj(x) above[j] for `terms` rows above each other, one by one, x being the first element
// of each. The second row stands `step` elements behind the first, each further one `change` less
// behind the one before.
QX_BY_WIDTH_TO_8(void, SubtractRowsAboveReal,
                 (DBL * row, int32_t cols, const DBL *above, std::ptrdiff_t step,
                  std::ptrdiff_t change, int32_t terms))
QX_BY_WIDTH_TO_8(void, SubtractRowsAboveComplex,
                 (CDB * row, int32_t cols, const CDB *above, std::ptrdiff_t step,
                  std::ptrdiff_t change, int32_t terms))

// row[j] /= divisor. Returns the largest |row[j]| of the quotients, or 0; NaN does not count.
QX_BY_WIDTH_TO_8(double, DivideRow, (DBL * row, int32_t cols, double divisor))

// y[i] = sum over j of a[i][j] x[j]. Real rows use eight partial sums, element j in sum j mod 8,
// which are then added pairwise; the last (cols mod 8) terms follow. Complex rows use two.
QX_BY_WIDTH_TO_8(void, RowProductsReal,
                 (const DBL *a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const DBL *x,
                  DBL *y))
QX_BY_WIDTH_TO_8(void, RowProductsComplex,
                 (const CDB *a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const CDB *x,
                  CDB *y))

// Rows p and q become c p + s q and c q - s p.
struct Rotation {
    int32_t p, q;
    double c, s;
};
// Applies the rotations one after the other, on rows of `width` doubles.
QX_BY_WIDTH_TO_8(void, RotateRows,
                 (DBL * a, std::ptrdiff_t stride, int32_t width, const Rotation *rotations,
                  int32_t count))

// Rows p and q become c p + s q and c q - conj(s) p.
QX_BY_WIDTH_TO_8(void, RotateComplexRows, (CDB * p, CDB *q, int32_t width, double c, CDB s))

// Subtracts w[i] p from each of rows first, first + 1 and, if size is 3, first + 2, where p = u[0]
// row0 + u[1] row1 + u[2] row2.
struct SmallReflection {
    int32_t first, size;
    double u[3], w[3];
};
// Applies the reflections one after the other, on rows of `width` doubles.
QX_BY_WIDTH_TO_8(void, ReflectRows,
                 (DBL * a, std::ptrdiff_t stride, int32_t width, const SmallReflection *reflections,
                  int32_t count))
// Applies one reflection to columns, in the first `rows` rows.
QX_BY_WIDTH_TO_8(void, ReflectColumns,
                 (DBL * a, std::ptrdiff_t stride, int32_t rows, const SmallReflection *reflection))

// A sweep of the double-shift QR iteration over the rows from `top` to `last` of a Hessenberg matrix,
// of which only the eigenvalues are wanted: the bulge starts at row `first`, where the shifted
// product has the first column (column[0], column[1], column[2]). Elements below the subdiagonal
// are not cleared.
QX_BY_WIDTH_TO_8(void, ChaseBulge,
                 (DBL * h, std::ptrdiff_t stride, int32_t top, int32_t first, int32_t last,
                  const double *column))

// The first three kernels for either element. x and y have as many elements as a has rows or
// columns.
template <ElementType E>
void AddTransposedProduct(const ConstMatrixView<E> &a, ConstVectorView<E> x, VectorView<E> y) {
    QX_EXPECTS(x.size() == a.rows() && y.size() == a.cols());
    if constexpr (E == ElementType::DBL)
        AddTransposedProductReal(a.data(), a.stride(), a.rows(), a.cols(), x.data(), y.data());
    else
        AddTransposedProductComplex(a.data(), a.stride(), a.rows(), a.cols(), x.data(), y.data());
}
template <ElementType E>
void AddOuterProduct(const MatrixView<E> &a, ConstVectorView<E> x, ConstVectorView<E> y) {
    QX_EXPECTS(x.size() == a.rows() && y.size() == a.cols());
    if constexpr (E == ElementType::DBL)
        AddOuterProductReal(a.data(), a.stride(), a.rows(), a.cols(), x.data(), y.data());
    else
        AddOuterProductComplex(a.data(), a.stride(), a.rows(), a.cols(), x.data(), y.data());
}
template <ElementType E>
void RowProducts(const ConstMatrixView<E> &a, ConstVectorView<E> x, VectorView<E> y) {
    QX_EXPECTS(x.size() == a.cols() && y.size() == a.rows());
    if constexpr (E == ElementType::DBL)
        RowProductsReal(a.data(), a.stride(), a.rows(), a.cols(), x.data(), y.data());
    else
        RowProductsComplex(a.data(), a.stride(), a.rows(), a.cols(), x.data(), y.data());
}

} // namespace qx

#endif
