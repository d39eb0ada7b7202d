#include "frame/scratch.h"
#include "linalg/complex_functions.h"
#include "linalg/functions/diagonal.h"
#include "linalg/functions/functions.h"
#include "linalg/products/products.h"
#include "linalg/properties/scalars.h"
#include "linalg/systems/lu.h"

#include <cmath>

namespace qx {
namespace {

// How often a matrix of this finite norm is halved, to a norm below 1.
int32_t Squarings(double norm) {
    return norm < 0.5 ? 0 : static_cast<int32_t>(std::log(norm) / std::log(2.0) + 1.0);
}

template <ElementType E>
class PadeExponential {
    typedef ElementOf<E> T;

public:
    explicit PadeExponential(int32_t n) : n_(n), count_(std::ptrdiff_t{n} * n) {}

    ErrorCode replace(T *a) {
        if (const ErrorCode failed = blocks_.allocate(4 * int64_t{count_}))
            return failed;
        if (const ErrorCode failed = pivots_.allocate(n_))
            return failed;
        double norm;
        if (const ErrorCode failed = MatrixNorm(a, n_, n_, infinityNorm, &norm))
            return failed;
        if (!std::isfinite(norm))
            return ErrNonFiniteInput;
        const int32_t squarings = Squarings(norm);
        // Directly, for 2^squarings itself may overflow.
        const double factor = std::ldexp(1.0, -squarings);
        for (std::ptrdiff_t i = 0; i < count_; ++i)
            scaled()[i] = a[i] * factor;
        if (const ErrorCode failed = sumUp(PadeDegree(1e-8, norm), a))
            return failed;
        if (const ErrorCode failed = divide(a))
            return failed;
        if (const ErrorCode failed = square(squarings))
            return failed;
        for (std::ptrdiff_t i = 0; i < count_; ++i)
            a[i] = scaled()[i];
        return 0;
    }

private:
    T *scaled() const { return blocks_.data(); }
    T *denominator() const { return blocks_.data() + count_; }
    T *power() const { return blocks_.data() + 2 * count_; }
    T *product() const { return blocks_.data() + 3 * count_; }

    ErrorCode multiply(const T *a, const T *b, T *c) const {
        return MatrixProductPlain(a, b, n_, n_, n_, c);
    }

    // The numerator and the denominator of the approximant of degree q at the scaled matrix.
    ErrorCode sumUp(int32_t q, T *numerator) {
        for (std::ptrdiff_t i = 0; i < count_; ++i) {
            numerator[i] = scaled()[i] * 0.5;
            denominator()[i] = scaled()[i] * -0.5;
        }
        for (std::ptrdiff_t i = 0; i < n_; ++i) {
            const std::ptrdiff_t at = i * n_ + i;
            numerator[at] = numerator[at] + ScalarOf<E>::Of(1.0);
            denominator()[at] = denominator()[at] + ScalarOf<E>::Of(1.0);
        }
        if (const ErrorCode failed = multiply(scaled(), scaled(), power()))
            return failed;
        double c = 0.5, sign = 1.0;
        for (int32_t k = 2; k <= q; ++k) {
            c = ((q - k) + 1.0) / (k * (1.0 + (2.0 * q - k))) * c;
            for (std::ptrdiff_t i = 0; i < count_; ++i) {
                numerator[i] = numerator[i] + power()[i] * c;
                denominator()[i] = denominator()[i] + power()[i] * (sign * c);
            }
            sign = -sign;
            if (k == q)
                break;
            if (const ErrorCode failed = multiply(power(), scaled(), product()))
                return failed;
            for (std::ptrdiff_t i = 0; i < count_; ++i)
                power()[i] = product()[i];
        }
        return 0;
    }

    // The scaled matrix becomes the quotient. A singular denominator is not looked for.
    ErrorCode divide(const T *numerator) {
        int32_t parity;
        const ErrorCode status = LUDecompose(denominator(), n_, n_, pivots_.data(), &parity);
        if (status < 0)
            return status;
        if (const ErrorCode failed = InvertFactors(denominator(), pivots_.data(), n_))
            return failed;
        return multiply(denominator(), numerator, scaled());
    }

    ErrorCode square(int32_t times) {
        for (; times > 0; --times) {
            if (const ErrorCode failed = multiply(scaled(), scaled(), product()))
                return failed;
            for (std::ptrdiff_t i = 0; i < count_; ++i)
                scaled()[i] = product()[i];
        }
        return 0;
    }

    int32_t n_;
    std::ptrdiff_t count_;
    Scratch<E> blocks_;
    Scratch<ElementType::I32> pivots_;
};

template <ElementType E>
ErrorCode ReplaceByExponential(ElementOf<E> *a, int32_t n) {
    if (n < 1)
        return ErrEmptyInput;
    if (IsDiagonal<E>(a, n)) {
        for (std::ptrdiff_t i = 0; i < n; ++i)
            a[i * n + i] = Exponential(a[i * n + i]);
        return 0;
    }
    return PadeExponential<E>(n).replace(a);
}

} // namespace

int32_t PadeDegree(double tolerance, double norm) {
    const double target = tolerance / (std::exp(norm) * norm);
    int32_t q = 1;
    double bound = 1.0 / 6.0;
    while (bound * std::exp(bound) > target) {
        ++q;
        const double odd = 2.0 * q - 1.0, even = 2.0 * q;
        bound = bound * odd * (static_cast<double>(q) * q) / (odd * odd * (even * even)) /
                (4.0 * (even + 1.0));
    }
    return q;
}

ErrorCode MatrixExponential(DBL *a, int32_t n) {
    return ReplaceByExponential<ElementType::DBL>(a, n);
}
ErrorCode MatrixExponential(CDB *a, int32_t n) {
    return ReplaceByExponential<ElementType::CDB>(a, n);
}

} // namespace qx
