#ifndef QX_LINALG_PRODUCTS_PRODUCTS_H
#define QX_LINALG_PRODUCTS_PRODUCTS_H

#include "frame/views.h"
#include "qx/errors.h"

namespace qx {

// c = a b through BLAS, for matrices without gaps between their rows; where a has no columns, c is
// NaN. Small products run term by term in ascending order and give the same bits on every
// processor; a product counts as small by its number of terms alone. ErrOutOfMemory.
template <ElementType E>
ErrorCode MatrixProduct(ConstMatrixView<E> a, ConstMatrixView<E> b, MatrixView<E> c);
// The same on copies of the operands in fresh blocks.
template <ElementType E>
ErrorCode MatrixProductOfCopies(ConstMatrixView<E> a, ConstMatrixView<E> b, MatrixView<E> c);

// c += a b and c -= a b with the order of arithmetic of the plain triple loop: to every c[i][j] the
// terms a[i][p] b[p][j] are added one by one, p ascending. c shares no element with them. No BLAS,
// half as fast where matrices are large, and the same bits on every processor.
template <ElementType E>
void AddProduct(ConstMatrixView<E> a, ConstMatrixView<E> b, MatrixView<E> c);
template <ElementType E>
void SubtractProduct(ConstMatrixView<E> a, ConstMatrixView<E> b, MatrixView<E> c);
// c = a b in this order.
template <ElementType E>
void OrderedProduct(ConstMatrixView<E> a, ConstMatrixView<E> b, MatrixView<E> c);

// c = a b^H through BLAS. ErrOutOfMemory.
ErrorCode ProductWithConjugate(ConstComplexMatrix a, ConstComplexMatrix b, ComplexMatrix c);

// y = a x: one sum per row, its terms added in ascending order. A matrix without columns writes
// nothing.
template <ElementType E>
void MatrixVectorProduct(ConstMatrixView<E> a, ConstVectorView<E> x, VectorView<E> y);

} // namespace qx

#endif
