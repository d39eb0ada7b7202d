#include "stats/basic.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

// base^exponent by repeated squaring, exponent at least 1. The order of the products is part of the
// result.
double Power(double base, int32_t exponent) {
    while (exponent % 2 == 0) {
        base *= base;
        exponent /= 2;
    }
    double power = base;
    for (exponent /= 2; exponent != 0; exponent /= 2) {
        base *= base;
        if (exponent % 2 != 0)
            power *= base;
    }
    return power;
}

template <ElementType E>
double CountOf(ConstVectorView<E> x) {
    return static_cast<double>(x.size());
}

} // namespace

ErrorCode ArrayMean(ConstRealVector x, DBL *mean) {
    if (x.isEmpty())
        return ErrEmptyInput;
    double sum = 0.0;
    for (const double v : x)
        sum += v;
    *mean = sum / CountOf(x);
    return 0;
}

ErrorCode ArrayRMS(ConstRealVector x, DBL *rms) {
    if (x.isEmpty())
        return ErrEmptyInput;
    double sum = 0.0;
    for (const double v : x)
        sum += v * v;
    *rms = std::sqrt(sum / CountOf(x));
    return 0;
}

ErrorCode ArrayCxRMS(ConstComplexVector z, DBL *rms) {
    if (z.isEmpty())
        return ErrEmptyInput;
    double sum = 0.0;
    for (std::ptrdiff_t i = 0; i < z.size(); ++i)
        sum += z[i].im * z[i].im + z[i].re * z[i].re;
    *rms = std::sqrt(sum / CountOf(z));
    return 0;
}

ErrorCode ArrayMSE(ConstRealVector x, ConstRealVector y, DBL *mse) {
    const std::ptrdiff_t m = std::min(x.size(), y.size());
    if (m < 1)
        return ErrEmptyInput;
    double sum = 0.0;
    for (std::ptrdiff_t i = 0; i < m; ++i) {
        // kept: expanded, not the square of a difference
        const double t = y[i] * (y[i] - 2.0 * x[i]);
        sum += x[i] * x[i] + t;
    }
    *mse = sum / static_cast<double>(m);
    return x.size() == y.size() ? 0 : WarnLengthsDiffer;
}

ErrorCode ArrayMoment(ConstRealVector x, int32_t order, DBL *moment) {
    double mean;
    if (const ErrorCode status = ArrayMean(x, &mean))
        return status;
    if (order < 1)
        return ErrOrderNotPositive;
    double sum = 0.0;
    for (const double v : x)
        sum += Power(v - mean, order);
    *moment = sum / CountOf(x);
    return 0;
}

} // namespace qx
