#include "linalg/products/products.h"

#include "linalg/lapack.h"
#include "linalg/matrix.h"
#include "linalg/products/ordered.h"

#include <algorithm>
#include <limits>
#include <type_traits>

namespace qx {

namespace {

// Up to here the ordered product is as fast as BLAS.
constexpr int64_t smallProduct = 32 * 32 * 32;

// Large products run in bands, so that a band of a and of the result stays in the caches.
constexpr int32_t band = 1530;

template <ElementType E>
bool Fit(ConstMatrixView<E> a, ConstMatrixView<E> b, ConstMatrixView<E> c) {
    return a.cols() == b.rows() && a.rows() == c.rows() && b.cols() == c.cols();
}

template <ElementType E>
ErrorCode Multiply(ConstMatrixView<E> a, ConstMatrixView<E> b, MatrixView<E> c) {
    const int32_t m = a.rows(), k = a.cols(), n = b.cols();
    if (int64_t{m} * n * k <= smallProduct) {
        OrderedProduct<E>(a, b, c);
        return 0;
    }
    const bool inBands = E == ElementType::DBL && m > band && k > 256 && n > 2;
    const int32_t step = inBands ? band : m;
    for (int32_t i = 0; i < m; i += step) {
        const int32_t rows = std::min(step, m - i);
        if (const ErrorCode failed =
                blas::Product(a.block(i, 0, rows, k), b, c.block(i, 0, rows, n)))
            return failed;
    }
    return 0;
}

// kept: the empty sum is NaN and not zero
template <ElementType E>
void FillWithNaN(MatrixView<E> c) {
    Fill(reinterpret_cast<DBL *>(c.data()), static_cast<std::ptrdiff_t>(c.count()) * partsOf<E>,
         std::numeric_limits<double>::quiet_NaN());
}

} // namespace

template <ElementType E>
ErrorCode MatrixProduct(ConstMatrixView<E> a, ConstMatrixView<E> b, MatrixView<E> c) {
    QX_EXPECTS(Fit<E>(a, b, c) && a.isWhole() && b.isWhole() && c.isWhole());
    if (c.isEmpty())
        return 0;
    if (a.cols() > 0)
        return Multiply<E>(a, b, c);
    FillWithNaN<E>(c);
    return 0;
}

template <ElementType E>
ErrorCode MatrixProductOfCopies(ConstMatrixView<E> a, ConstMatrixView<E> b, MatrixView<E> c) {
    if (c.isEmpty() || a.cols() == 0)
        return MatrixProduct<E>(a, b, c);
    MatrixView<E> aCopy, bCopy, cCopy;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(aCopy, a.rows(), a.cols()), Sized(bCopy, b.rows(), b.cols()),
                        Sized(cCopy, c.rows(), c.cols())))
        return failed;
    CopyMatrix<E>(a, aCopy);
    CopyMatrix<E>(b, bCopy);
    if (const ErrorCode failed = MatrixProduct<E>(aCopy, bCopy, cCopy))
        return failed;
    CopyMatrix<E>(cCopy, c);
    return 0;
}

template <ElementType E>
void AddProduct(ConstMatrixView<E> a, ConstMatrixView<E> b, MatrixView<E> c) {
    QX_EXPECTS(Fit<E>(a, b, c));
    if constexpr (E == ElementType::DBL)
        AddProductReal(a.rows(), b.cols(), a.cols(), a.data(), a.stride(), b.data(), b.stride(),
                       c.data(), c.stride());
    else
        AddProductComplex(a.rows(), b.cols(), a.cols(), a.data(), a.stride(), b.data(), b.stride(),
                          c.data(), c.stride());
}

template <ElementType E>
void SubtractProduct(ConstMatrixView<E> a, ConstMatrixView<E> b, MatrixView<E> c) {
    QX_EXPECTS(Fit<E>(a, b, c));
    if constexpr (E == ElementType::DBL)
        SubtractProductReal(a.rows(), b.cols(), a.cols(), a.data(), a.stride(), b.data(),
                            b.stride(), c.data(), c.stride());
    else
        SubtractProductComplex(a.rows(), b.cols(), a.cols(), a.data(), a.stride(), b.data(),
                               b.stride(), c.data(), c.stride());
}

template <ElementType E>
void OrderedProduct(ConstMatrixView<E> a, ConstMatrixView<E> b, MatrixView<E> c) {
    for (int32_t i = 0; i < c.rows(); ++i)
        Fill(reinterpret_cast<DBL *>(c.row(i)), std::ptrdiff_t{c.cols()} * partsOf<E>, 0.0);
    AddProduct<E>(a, b, c);
}

ErrorCode ProductWithConjugate(ConstComplexMatrix a, ConstComplexMatrix b, ComplexMatrix c) {
    QX_EXPECTS(a.cols() > 0 && a.cols() == b.cols() && !c.isEmpty());
    return blas::ProductWithConjugate(a, b, c);
}

// Four rows at a time: four sums that do not wait for each other.
template <ElementType E>
void MatrixVectorProduct(ConstMatrixView<E> a, ConstVectorView<E> x, VectorView<E> y) {
    QX_EXPECTS(a.cols() == x.size() && a.rows() == y.size());
    if (a.isEmpty())
        return;
    typedef typename ScalarOf<E>::type Scalar;
    const std::ptrdiff_t n = a.cols(), stride = a.stride();
    const auto dot = [=]<int Rows>(std::integral_constant<int, Rows>, int32_t first) {
        Scalar sum[Rows];
        for (int r = 0; r < Rows; ++r)
            sum[r] = ScalarOf<E>::Of(0.0);
        const ElementOf<E> *const row = a.row(first);
        for (std::ptrdiff_t j = 0; j < n; ++j)
            for (int r = 0; r < Rows; ++r)
                sum[r] = sum[r] + row[r * stride + j] * x[j];
        for (int r = 0; r < Rows; ++r)
            y[first + r] = sum[r];
    };
    int32_t i = 0;
    for (; i + 4 <= a.rows(); i += 4)
        dot(std::integral_constant<int, 4>(), i);
    for (; i < a.rows(); ++i)
        dot(std::integral_constant<int, 1>(), i);
}

template ErrorCode MatrixProduct(ConstRealMatrix, ConstRealMatrix, RealMatrix);
template ErrorCode MatrixProduct(ConstComplexMatrix, ConstComplexMatrix, ComplexMatrix);
template ErrorCode MatrixProductOfCopies(ConstRealMatrix, ConstRealMatrix, RealMatrix);
template ErrorCode MatrixProductOfCopies(ConstComplexMatrix, ConstComplexMatrix, ComplexMatrix);
template void AddProduct(ConstRealMatrix, ConstRealMatrix, RealMatrix);
template void AddProduct(ConstComplexMatrix, ConstComplexMatrix, ComplexMatrix);
template void SubtractProduct(ConstRealMatrix, ConstRealMatrix, RealMatrix);
template void SubtractProduct(ConstComplexMatrix, ConstComplexMatrix, ComplexMatrix);
template void OrderedProduct(ConstRealMatrix, ConstRealMatrix, RealMatrix);
template void OrderedProduct(ConstComplexMatrix, ConstComplexMatrix, ComplexMatrix);
template void MatrixVectorProduct(ConstRealMatrix, ConstRealVector, RealVector);
template void MatrixVectorProduct(ConstComplexMatrix, ConstComplexVector, ComplexVector);

} // namespace qx
