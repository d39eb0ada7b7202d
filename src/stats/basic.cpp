#include "stats/basic.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

// base^exponent by squaring, exponent at least 1. The order of the products is part of the
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

} // namespace

ErrorCode ArrayMean(const DBL *x, int32_t n, DBL *mean) {
    if (n < 1)
        return ErrEmptyInput;
    double sum = 0.0;
    for (int32_t i = 0; i < n; ++i)
        sum += x[i];
    *mean = sum / n;
    return 0;
}

ErrorCode ArrayRMS(const DBL *x, int32_t n, DBL *rms) {
    if (n < 1)
        return ErrEmptyInput;
    double sum = 0.0;
    for (int32_t i = 0; i < n; ++i)
        sum += x[i] * x[i];
    *rms = std::sqrt(sum / n);
    return 0;
}

ErrorCode ArrayCxRMS(const CDB *z, int32_t n, DBL *rms) {
    if (n < 1)
        return ErrEmptyInput;
    double sum = 0.0;
    for (int32_t i = 0; i < n; ++i)
        sum += z[i].im * z[i].im + z[i].re * z[i].re;
    *rms = std::sqrt(sum / n);
    return 0;
}

ErrorCode ArrayMSE(const DBL *x, int32_t nx, const DBL *y, int32_t ny, DBL *mse) {
    const int32_t m = std::min(nx, ny);
    if (m < 1)
        return ErrEmptyInput;
    double sum = 0.0;
    for (int32_t i = 0; i < m; ++i) {
        // kept: expanded, not a squared difference
        const double t = y[i] * (y[i] - 2.0 * x[i]);
        sum += x[i] * x[i] + t;
    }
    *mse = sum / m;
    return nx == ny ? 0 : WarnLengthsDiffer;
}

ErrorCode ArrayMoment(const DBL *x, int32_t n, int32_t order, DBL *moment) {
    double mean;
    if (const ErrorCode status = ArrayMean(x, n, &mean))
        return status;
    if (order < 1)
        return ErrOrderNotPositive;
    double sum = 0.0;
    for (int32_t i = 0; i < n; ++i)
        sum += Power(x[i] - mean, order);
    *moment = sum / n;
    return 0;
}

} // namespace qx
