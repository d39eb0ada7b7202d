#include "linalg/properties/special.h"

#include "linalg/eigenproblems/general.h"

namespace qx {

namespace {

// Sets each element to at(i, j).
template <ElementType E, class At>
void FillEach(const MatrixView<E> &out, At at) {
    for (int32_t i = 0; i < out.rows(); ++i)
        for (int32_t j = 0; j < out.cols(); ++j)
            out(i, j) = at(i, j);
}

// p (t - root), ascending, for a polynomial of the given degree.
void MultiplyByFactor(CDB *p, int32_t degree, CDB root) {
    p[degree + 1] = p[degree];
    for (int32_t k = degree; k > 0; --k)
        p[k] = p[k - 1] - root * p[k];
    p[0] = -(root * p[0]);
}

// r(lag).
template <ElementType E>
typename ScalarOf<E>::type Correlation(ConstVectorView<E> x, ConstVectorView<E> y, int32_t lag,
                                       CorrelationScale scale) {
    const auto n = static_cast<int32_t>(x.size());
    const int32_t first = lag < 0 ? -lag : 0, end = lag < 0 ? n : n - lag;
    auto sum = ScalarOf<E>::Of(0.0);
    for (int32_t i = first; i < end; ++i)
        sum = sum + x[i + lag] * Conj(y[i]);
    if (scale == unscaled)
        return sum;
    return sum / static_cast<double>(scale == unbiased ? end - first : n);
}

} // namespace

template <ElementType E>
void FillDiagonal(ConstVectorView<E> x, const MatrixView<E> &out) {
    FillEach<E>(out, [x](auto i, auto j) { return i == j ? x[i] : ScalarOf<E>::Of(0.0); });
}

template <ElementType E>
void FillToeplitz(ConstVectorView<E> x, ConstVectorView<E> y, const MatrixView<E> &out) {
    FillEach<E>(out, [x, y](auto i, auto j) { return j > i ? y[j - i] : x[i - j]; });
}

template <ElementType E>
void FillVandermonde(ConstVectorView<E> x, const MatrixView<E> &out) {
    for (int32_t i = 0; i < out.rows(); ++i) {
        auto power = ScalarOf<E>::Of(1.0);
        for (int32_t j = out.cols() - 1; j >= 0; --j) {
            out(i, j) = power;
            power = power * x[i];
        }
    }
}

template <ElementType E>
void FillCompanion(ConstVectorView<E> x, const MatrixView<E> &out) {
    FillEach<E>(out, [x](auto i, auto j) {
        if (i == 0)
            return static_cast<typename ScalarOf<E>::type>(-x[j + 1] / x[0]);
        return ScalarOf<E>::Of(i == j + 1 ? 1.0 : 0.0);
    });
}

void FillWithEigenvalues(ConstRealVector values, const RealMatrix &out) {
    double sum = 0.0;
    for (const DBL &value : values)
        sum += value;
    const double weight = 2.0 / static_cast<double>(values.size());
    const double shared = weight * (weight * sum);
    FillEach<ElementType::DBL>(out, [=](auto i, auto j) {
        const double element = shared - weight * (values[i] + values[j]);
        return i == j ? values[i] + element : element;
    });
}

template <ElementType E>
ErrorCode CharacteristicPolynomial(const ConstMatrixView<E> &a, VectorView<E> polynomial) {
    const int32_t n = a.rows();
    QX_EXPECTS(a.isSquare() && n > 0 && polynomial.size() == std::ptrdiff_t{n} + 1);
    ComplexVector p, values;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(p, int64_t{n} + 1), Sized(values, n)))
        return failed;
    if (const ErrorCode failed = EigenGeneral<E>(a, values))
        return failed;
    p[0] = {1.0, 0.0};
    for (int32_t k = 0; k < n; ++k)
        MultiplyByFactor(p.data(), k, values[k]);
    for (const CDB &coefficient : p)
        if (!std::isfinite(coefficient.re) || !std::isfinite(coefficient.im))
            return ErrOverflow;
    for (int32_t k = 0; k <= n; ++k) {
        if constexpr (E == ElementType::DBL)
            polynomial[k] = p[k].re;
        else
            polynomial[k] = p[k];
    }
    return 0;
}

template <ElementType E>
ErrorCode CorrelationMatrix(ConstVectorView<E> x, ConstVectorView<E> y, CorrelationScale scale,
                            const MatrixView<E> &out) {
    QX_EXPECTS(x.size() == y.size() && out.isSquare() && out.rows() <= x.size());
    VectorView<E> column, row;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(column, out.rows()), Sized(row, out.rows())))
        return failed;
    for (int32_t lag = 0; lag < out.rows(); ++lag) {
        column[lag] = Correlation<E>(x, y, lag, scale);
        row[lag] = Correlation<E>(x, y, -lag, scale);
    }
    FillToeplitz<E>(column, row, out);
    return 0;
}

template void FillDiagonal(ConstRealVector, const RealMatrix &);
template void FillDiagonal(ConstComplexVector, const ComplexMatrix &);
template void FillToeplitz(ConstRealVector, ConstRealVector, const RealMatrix &);
template void FillToeplitz(ConstComplexVector, ConstComplexVector, const ComplexMatrix &);
template void FillVandermonde(ConstRealVector, const RealMatrix &);
template void FillVandermonde(ConstComplexVector, const ComplexMatrix &);
template void FillCompanion(ConstRealVector, const RealMatrix &);
template void FillCompanion(ConstComplexVector, const ComplexMatrix &);
template ErrorCode CharacteristicPolynomial(const ConstRealMatrix &, RealVector);
template ErrorCode CharacteristicPolynomial(const ConstComplexMatrix &, ComplexVector);
template ErrorCode CorrelationMatrix(ConstRealVector, ConstRealVector, CorrelationScale,
                                     const RealMatrix &);
template ErrorCode CorrelationMatrix(ConstComplexVector, ConstComplexVector, CorrelationScale,
                                     const ComplexMatrix &);

} // namespace qx
