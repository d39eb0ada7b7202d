#ifndef QX_LINALG_PRODUCTS_PRODUCTS_H
#define QX_LINALG_PRODUCTS_PRODUCTS_H

#include "frame/views.h"
#include "qx/errors.h"

namespace qx {

// c = a b, in the order of arithmetic of AddProduct; if a has no columns, c is NaN.
template <ElementType E>
void MatrixProduct(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                   const MatrixView<E> &c);
// The same on copies of the operands in fresh blocks. ErrOutOfMemory.
template <ElementType E>
ErrorCode MatrixProductOfCopies(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                                const MatrixView<E> &c);

// c += a b and c -= a b with the order of arithmetic of the plain triple loop: to every c[i][j] the
// terms a[i][p] b[p][j] are added one by one, p ascending. c shares no element with them.
template <ElementType E>
void AddProduct(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b, const MatrixView<E> &c);
template <ElementType E>
void SubtractProduct(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                     const MatrixView<E> &c);
// c = a b in this order; 0 if there are no terms.
template <ElementType E>
void OrderedProduct(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                    const MatrixView<E> &c);

// c = a b^H in this order.
void ProductWithConjugate(const ConstComplexMatrix &a, const ConstComplexMatrix &b,
                          const ComplexMatrix &c);

// y = a x: one sum per row, its terms added in ascending order. Nothing is written if a has no
// columns.
template <ElementType E>
void MatrixVectorProduct(const ConstMatrixView<E> &a, ConstVectorView<E> x, VectorView<E> y);

} // namespace qx

#endif
