#include "linalg/complex_functions.h"
#include "linalg/functions/diagonal.h"
#include "linalg/functions/functions.h"
#include "linalg/products/products.h"
#include "linalg/properties/determinant_and_norms.h"
#include "linalg/systems/lu.h"

#include <cmath>
#include <utility>

namespace qx {
namespace {

// How often a matrix of this finite norm is halved, to a norm below 1.
int32_t Squarings(double norm) {
    return norm < 0.5 ? 0 : static_cast<int32_t>(std::log(norm) / std::log(2.0) + 1.0);
}

template <ElementType E>
class PadeExponential {
public:
    ErrorCode replace(const MatrixView<E> &a) {
        const int32_t n = a.rows();
        if (const ErrorCode failed =
                memory_.take(Sized(scaled_, n, n), Sized(denominator_, n, n), Sized(power_, n, n),
                             Sized(product_, n, n), Sized(pivots_, n)))
            return failed;
        double norm;
        if (const ErrorCode failed = MatrixNorm<E>(a, infinityNorm, &norm))
            return failed;
        if (!std::isfinite(norm))
            return ErrNonFiniteInput;
        const int32_t squarings = Squarings(norm);
        // Computed directly, since 2^squarings itself may overflow.
        const double factor = std::ldexp(1.0, -squarings);
        for (int32_t i = 0; i < n; ++i)
            for (int32_t j = 0; j < n; ++j)
                scaled_(i, j) = a(i, j) * factor;
        if (const ErrorCode failed = sumUp(PadeDegree(1e-8, norm), a))
            return failed;
        if (const ErrorCode failed = divide(a))
            return failed;
        if (const ErrorCode failed = square(squarings))
            return failed;
        CopyMatrix<E>(scaled_, a);
        return 0;
    }

private:
    // The numerator and the denominator of the approximant of degree q at the scaled matrix.
    ErrorCode sumUp(int32_t q, const MatrixView<E> &numerator) {
        const int32_t n = numerator.rows();
        for (int32_t i = 0; i < n; ++i)
            for (int32_t j = 0; j < n; ++j) {
                numerator(i, j) = scaled_(i, j) * 0.5;
                denominator_(i, j) = scaled_(i, j) * -0.5;
            }
        for (int32_t i = 0; i < n; ++i) {
            numerator(i, i) = numerator(i, i) + ScalarOf<E>::Of(1.0);
            denominator_(i, i) = denominator_(i, i) + ScalarOf<E>::Of(1.0);
        }
        MatrixProduct<E>(scaled_, scaled_, power_);
        double c = 0.5, sign = 1.0;
        for (int32_t k = 2; k <= q; ++k) {
            c = ((q - k) + 1.0) / (k * (1.0 + (2.0 * q - k))) * c;
            for (int32_t i = 0; i < n; ++i)
                for (int32_t j = 0; j < n; ++j) {
                    numerator(i, j) = numerator(i, j) + power_(i, j) * c;
                    denominator_(i, j) = denominator_(i, j) + power_(i, j) * (sign * c);
                }
            sign = -sign;
            if (k == q)
                break;
            MatrixProduct<E>(power_, scaled_, product_);
            std::swap(power_, product_);
        }
        return 0;
    }

    // The scaled matrix becomes the quotient. The denominator is not tested for singularity.
    ErrorCode divide(const ConstMatrixView<E> &numerator) {
        int32_t parity;
        LUDecompose<E>(denominator_, pivots_, &parity);
        if (const ErrorCode failed = InvertFactors<E>(denominator_, pivots_))
            return failed;
        MatrixProduct<E>(denominator_, numerator, scaled_);
        return 0;
    }

    ErrorCode square(int32_t times) {
        for (; times > 0; --times) {
            MatrixProduct<E>(scaled_, scaled_, product_);
            std::swap(scaled_, product_);
        }
        return 0;
    }

    ScratchParts memory_;
    MatrixView<E> scaled_, denominator_, power_, product_;
    IndexVector pivots_;
};

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

template <ElementType E>
ErrorCode MatrixExponential(const MatrixView<E> &a) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty());
    if (!IsDiagonal<E>(a))
        return PadeExponential<E>().replace(a);
    for (int32_t i = 0; i < a.rows(); ++i)
        a(i, i) = Exponential(a(i, i));
    return 0;
}

template ErrorCode MatrixExponential(const RealMatrix &);
template ErrorCode MatrixExponential(const ComplexMatrix &);

} // namespace qx
