#ifndef QX_LINALG_KERNELS_H
#define QX_LINALG_KERNELS_H

#include "frame/views.h"
#include "frame/widths.h"
#include "qx/types.h"

#include <cstddef>

namespace qx {

// The inner loops of the factorisations, on row-major blocks whose rows stand `stride` elements
// apart. Every element has one order of arithmetic, whatever the width.

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

// a[i][j] -= x[i] y[j], x being a column of a's matrix, whose elements stand `stride` apart, too.
QX_BY_WIDTH_TO_8(void, SubtractOuterProductComplex,
                 (CDB * a, std::ptrdiff_t stride, int32_t rows, int32_t cols, const CDB *x,
                  const CDB *y))

// y[i] = sum over j of a[i][j] x[j]. Real sums run in eight partial sums, element j in sum j mod
// 8, which are then added pairwise, and the last (cols mod 8) terms follow; complex ones in two.
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
// The rotations one after the other, on rows of `width` doubles.
QX_BY_WIDTH_TO_8(void, RotateRows,
                 (DBL * a, std::ptrdiff_t stride, int32_t width, const Rotation *rotations,
                  int32_t count))

// Rows p and q become c p + s q and c q - conj(s) p.
QX_BY_WIDTH_TO_8(void, RotateComplexRows, (CDB * p, CDB *q, int32_t width, double c, CDB s))

// Rows first, first + 1 and, where size is 3, first + 2 each lose w[i] p, where p = u[0] row0 +
// u[1] row1 + u[2] row2.
struct SmallReflection {
    int32_t first, size;
    double u[3], w[3];
};
// The reflections one after the other, on rows of `width` doubles.
QX_BY_WIDTH_TO_8(void, ReflectRows,
                 (DBL * a, std::ptrdiff_t stride, int32_t width, const SmallReflection *reflections,
                  int32_t count))
// The same on columns, of the first `rows` rows.
QX_BY_WIDTH_TO_8(void, ReflectColumns,
                 (DBL * a, std::ptrdiff_t stride, int32_t rows, const SmallReflection *reflection))

// The first three for either element. x and y have as many elements as a has rows or columns.
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
