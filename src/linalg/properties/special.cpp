#include "linalg/properties/special.h"

#include "frame/scratch.h"
#include "linalg/eigenproblems/general.h"
#include "linalg/matrix.h"

namespace qx {

namespace {

// Fills rows by cols elements with what at(i, j) gives.
template <ElementType E, class At>
void FillEach(ElementOf<E> *out, std::ptrdiff_t rows, std::ptrdiff_t cols, At at) {
    for (std::ptrdiff_t i = 0; i < rows; ++i)
        for (std::ptrdiff_t j = 0; j < cols; ++j)
            out[i * cols + j] = at(i, j);
}

template <ElementType E>
void Identity(ElementOf<E> *out, int32_t n) {
    FillEach<E>(out, n, n, [](auto i, auto j) { return ScalarOf<E>::Of(i == j ? 1.0 : 0.0); });
}

template <ElementType E>
void Diagonal(const ElementOf<E> *x, int32_t n, ElementOf<E> *out) {
    FillEach<E>(out, n, n, [x](auto i, auto j) { return i == j ? x[i] : ScalarOf<E>::Of(0.0); });
}

template <ElementType E>
void Toeplitz(const ElementOf<E> *x, int32_t rows, const ElementOf<E> *y, int32_t cols,
              ElementOf<E> *out) {
    FillEach<E>(out, rows, cols, [x, y](auto i, auto j) { return j > i ? y[j - i] : x[i - j]; });
}

template <ElementType E>
void Vandermonde(const ElementOf<E> *x, std::ptrdiff_t n, ElementOf<E> *out) {
    for (std::ptrdiff_t i = 0; i < n; ++i) {
        auto power = ScalarOf<E>::Of(1.0);
        for (std::ptrdiff_t j = n - 1; j >= 0; --j) {
            out[i * n + j] = power;
            power = power * x[i];
        }
    }
}

template <ElementType E>
void Companion(const ElementOf<E> *x, int32_t n, ElementOf<E> *out) {
    FillEach<E>(out, n, n, [x](auto i, auto j) {
        if (i == 0)
            return static_cast<typename ScalarOf<E>::type>(-x[j + 1] / x[0]);
        return ScalarOf<E>::Of(i == j + 1 ? 1.0 : 0.0);
    });
}

// p (t - root), ascending, for a polynomial of the given degree.
void MultiplyByFactor(CDB *p, int32_t degree, CDB root) {
    p[degree + 1] = p[degree];
    for (int32_t k = degree; k > 0; --k)
        p[k] = p[k - 1] - root * p[k];
    p[0] = -(root * p[0]);
}

ErrorCode Eigenvalues(const DBL *a, int32_t n, CDB *values) {
    return EigenGeneral(a, n, eigenValuesOnly, values, nullptr);
}
ErrorCode Eigenvalues(const CDB *a, int32_t n, CDB *values) {
    return CxEigenGeneral(a, n, generalMatrix, eigenValuesOnly, values, nullptr);
}

template <ElementType E>
ErrorCode PolynomialOfEigenvalues(const ElementOf<E> *a, int32_t n, CDB *polynomial) {
    if (n < 1)
        return ErrEmptyInput;
    Scratch<ElementType::CDB> values;
    if (const ErrorCode failed = values.allocate(n))
        return failed;
    if (const ErrorCode failed = Eigenvalues(a, n, values.data()))
        return failed;
    polynomial[0] = {1.0, 0.0};
    for (int32_t k = 0; k < n; ++k)
        MultiplyByFactor(polynomial, k, values[k]);
    for (int32_t k = 0; k <= n; ++k)
        if (!std::isfinite(polynomial[k].re) || !std::isfinite(polynomial[k].im))
            return ErrOverflow;
    return 0;
}

template <ElementType E>
typename ScalarOf<E>::type Correlation(const ElementOf<E> *x, const ElementOf<E> *y, int32_t n,
                                       int32_t lag, int32_t scale) {
    const int32_t first = lag < 0 ? -lag : 0, end = lag < 0 ? n : n - lag;
    auto sum = ScalarOf<E>::Of(0.0);
    for (int32_t i = first; i < end; ++i)
        sum = sum + x[i + lag] * Conj(y[i]);
    if (scale == unscaled)
        return sum;
    return sum / static_cast<double>(scale == unbiased ? end - first : n);
}

template <ElementType E>
ErrorCode Correlations(const ElementOf<E> *x, const ElementOf<E> *y, int32_t n, int32_t maxLag,
                       int32_t scale, ElementOf<E> *out) {
    Scratch<E> column, row;
    if (const ErrorCode failed = column.allocate(int64_t{maxLag} + 1))
        return failed;
    if (const ErrorCode failed = row.allocate(int64_t{maxLag} + 1))
        return failed;
    for (int32_t lag = 0; lag <= maxLag; ++lag) {
        column[lag] = Correlation<E>(x, y, n, lag, scale);
        row[lag] = Correlation<E>(x, y, n, -lag, scale);
    }
    Toeplitz<E>(column.data(), maxLag + 1, row.data(), maxLag + 1, out);
    return 0;
}

} // namespace

void FillIdentity(DBL *out, int32_t n) { Identity<ElementType::DBL>(out, n); }
void FillIdentity(CDB *out, int32_t n) { Identity<ElementType::CDB>(out, n); }
void FillDiagonal(const DBL *x, int32_t n, DBL *out) { Diagonal<ElementType::DBL>(x, n, out); }
void FillDiagonal(const CDB *x, int32_t n, CDB *out) { Diagonal<ElementType::CDB>(x, n, out); }
void FillToeplitz(const DBL *x, int32_t rows, const DBL *y, int32_t cols, DBL *out) {
    Toeplitz<ElementType::DBL>(x, rows, y, cols, out);
}
void FillToeplitz(const CDB *x, int32_t rows, const CDB *y, int32_t cols, CDB *out) {
    Toeplitz<ElementType::CDB>(x, rows, y, cols, out);
}
void FillVandermonde(const DBL *x, int32_t n, DBL *out) {
    Vandermonde<ElementType::DBL>(x, n, out);
}
void FillVandermonde(const CDB *x, int32_t n, CDB *out) {
    Vandermonde<ElementType::CDB>(x, n, out);
}
void FillCompanion(const DBL *x, int32_t n, DBL *out) { Companion<ElementType::DBL>(x, n, out); }
void FillCompanion(const CDB *x, int32_t n, CDB *out) { Companion<ElementType::CDB>(x, n, out); }

void FillWithEigenvalues(const DBL *values, int32_t n, DBL *out) {
    double sum = 0.0;
    for (int32_t i = 0; i < n; ++i)
        sum += values[i];
    const double weight = 2.0 / n, shared = weight * (weight * sum);
    FillEach<ElementType::DBL>(out, n, n, [=](auto i, auto j) {
        const double element = shared - weight * (values[i] + values[j]);
        return i == j ? values[i] + element : element;
    });
}

ErrorCode CharacteristicPolynomial(const DBL *a, int32_t n, DBL *polynomial) {
    Scratch<ElementType::CDB> coefficients;
    if (const ErrorCode failed = coefficients.allocate(int64_t{n} + 1))
        return failed;
    if (const ErrorCode failed =
            PolynomialOfEigenvalues<ElementType::DBL>(a, n, coefficients.data()))
        return failed;
    for (int32_t k = 0; k <= n; ++k)
        polynomial[k] = coefficients[k].re;
    return 0;
}
ErrorCode CharacteristicPolynomial(const CDB *a, int32_t n, CDB *polynomial) {
    return PolynomialOfEigenvalues<ElementType::CDB>(a, n, polynomial);
}

ErrorCode CorrelationMatrix(const DBL *x, const DBL *y, int32_t n, int32_t maxLag, int32_t scale,
                            DBL *out) {
    return Correlations<ElementType::DBL>(x, y, n, maxLag, scale, out);
}
ErrorCode CorrelationMatrix(const CDB *x, const CDB *y, int32_t n, int32_t maxLag, int32_t scale,
                            CDB *out) {
    return Correlations<ElementType::CDB>(x, y, n, maxLag, scale, out);
}

} // namespace qx
