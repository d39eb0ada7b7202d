#include "linalg/products/products.h"

#include "linalg/matrix.h"
#include "linalg/products/ordered.h"

#include <algorithm>
#include <limits>
#include <type_traits>

namespace qx {

namespace {

template <ElementType E>
bool Fit(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b, const ConstMatrixView<E> &c) {
    return a.cols() == b.rows() && a.rows() == c.rows() && b.cols() == c.cols();
}

template <ElementType E>
void AddMultiple(double factor, const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                 const MatrixView<E> &c) {
    QX_EXPECTS(Fit<E>(a, b, c));
    if constexpr (E == ElementType::DBL)
        AddProductReal(a.rows(), b.cols(), a.cols(), {factor}, {a.data(), a.stride(), 1},
                       {b.data(), b.stride(), 1}, c.data(), c.stride());
    else
        AddProductComplex(a.rows(), b.cols(), a.cols(), {factor, 0.0},
                          {a.data(), a.stride(), 1, false}, {b.data(), b.stride(), 1, false},
                          c.data(), c.stride());
}

template <ElementType E>
void ClearRows(const MatrixView<E> &c) {
    const bool inOne = c.isWhole();
    for (int32_t i = 0; i < (inOne ? 1 : c.rows()); ++i)
        Fill(reinterpret_cast<DBL *>(c.row(i)),
             std::ptrdiff_t{c.cols()} * (inOne ? c.rows() : 1) * partsOf<E>, 0.0);
}

// kept: the empty sum is NaN and not zero
template <ElementType E>
void FillWithNaN(const MatrixView<E> &c) {
    Fill(reinterpret_cast<DBL *>(c.data()), static_cast<std::ptrdiff_t>(c.count()) * partsOf<E>,
         std::numeric_limits<double>::quiet_NaN());
}

} // namespace

template <ElementType E>
void MatrixProduct(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                   const MatrixView<E> &c) {
    QX_EXPECTS(Fit<E>(a, b, c) && c.isWhole());
    if (a.cols() > 0)
        OrderedProduct<E>(a, b, c);
    else
        FillWithNaN<E>(c);
}

template <ElementType E>
ErrorCode MatrixProductOfCopies(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                                const MatrixView<E> &c) {
    if (c.isEmpty() || a.cols() == 0) {
        MatrixProduct<E>(a, b, c);
        return 0;
    }
    MatrixView<E> aCopy, bCopy, cCopy;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(aCopy, a.rows(), a.cols()), Sized(bCopy, b.rows(), b.cols()),
                        Sized(cCopy, c.rows(), c.cols())))
        return failed;
    CopyMatrix<E>(a, aCopy);
    CopyMatrix<E>(b, bCopy);
    MatrixProduct<E>(aCopy, bCopy, cCopy);
    CopyMatrix<E>(cCopy, c);
    return 0;
}

template <ElementType E>
void AddProduct(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b, const MatrixView<E> &c) {
    AddMultiple<E>(1.0, a, b, c);
}

template <ElementType E>
void SubtractProduct(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                     const MatrixView<E> &c) {
    AddMultiple<E>(-1.0, a, b, c);
}

template <ElementType E>
void OrderedProduct(const ConstMatrixView<E> &a, const ConstMatrixView<E> &b,
                    const MatrixView<E> &c) {
    ClearRows<E>(c);
    AddProduct<E>(a, b, c);
}

void ProductWithConjugate(const ConstComplexMatrix &a, const ConstComplexMatrix &b,
                          const ComplexMatrix &c) {
    QX_EXPECTS(a.cols() == b.cols() && c.rows() == a.rows() && c.cols() == b.rows());
    ClearRows<ElementType::CDB>(c);
    AddProductComplex(a.rows(), b.rows(), a.cols(), {1.0, 0.0}, {a.data(), a.stride(), 1, false},
                      {b.data(), 1, b.stride(), true}, c.data(), c.stride());
}

// Four rows at a time, so that four sums are independent of each other.
template <ElementType E>
void MatrixVectorProduct(const ConstMatrixView<E> &a, ConstVectorView<E> x, VectorView<E> y) {
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

template void MatrixProduct(const ConstRealMatrix &, const ConstRealMatrix &, const RealMatrix &);
template void MatrixProduct(const ConstComplexMatrix &, const ConstComplexMatrix &,
                            const ComplexMatrix &);
template ErrorCode MatrixProductOfCopies(const ConstRealMatrix &, const ConstRealMatrix &,
                                         const RealMatrix &);
template ErrorCode MatrixProductOfCopies(const ConstComplexMatrix &, const ConstComplexMatrix &,
                                         const ComplexMatrix &);
template void AddProduct(const ConstRealMatrix &, const ConstRealMatrix &, const RealMatrix &);
template void AddProduct(const ConstComplexMatrix &, const ConstComplexMatrix &,
                         const ComplexMatrix &);
template void SubtractProduct(const ConstRealMatrix &, const ConstRealMatrix &, const RealMatrix &);
template void SubtractProduct(const ConstComplexMatrix &, const ConstComplexMatrix &,
                              const ComplexMatrix &);
template void OrderedProduct(const ConstRealMatrix &, const ConstRealMatrix &, const RealMatrix &);
template void OrderedProduct(const ConstComplexMatrix &, const ConstComplexMatrix &,
                             const ComplexMatrix &);
template void MatrixVectorProduct(const ConstRealMatrix &, ConstRealVector, RealVector);
template void MatrixVectorProduct(const ConstComplexMatrix &, ConstComplexVector, ComplexVector);

} // namespace qx
