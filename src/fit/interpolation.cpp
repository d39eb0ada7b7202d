#include "fit/interpolation.h"

#include "frame/scratch.h"

#include <cmath>

namespace qx {

namespace {

// A tableau of corrections: the columns c and d, both y at first, d moved by an offset.
struct Tableau {
    RealVector c, d;
    ScratchParts memory;

    ErrorCode start(const Table &table, double offset) {
        if (const ErrorCode failed = memory.take(Sized(c, table.n()), Sized(d, table.n())))
            return failed;
        for (int32_t i = 0; i < table.n(); ++i) {
            c[i] = table.y[i];
            d[i] = table.y[i] + offset;
        }
        return 0;
    }
};

int32_t NearestPoint(const Table &table, double xi) {
    int32_t nearest = 0;
    double least = std::fabs(xi - table.x[0]);
    for (int32_t i = 1; i < table.n(); ++i) {
        const double distance = std::fabs(xi - table.x[i]);
        if (distance < least) {
            least = distance;
            nearest = i;
        }
    }
    return nearest;
}

// Walks through the tableau from the nearest point, taking each time the correction that keeps the
// points in use centred on xi. `advance(i, m)` replaces c[i] and d[i] by those of column m.
template <class Advance>
ErrorCode WalkTableau(const Table &table, int32_t nearest, const Tableau &tableau, double *yi,
                      double *dy, const Advance &advance) {
    int32_t at = nearest - 1;
    double sum = table.y[nearest];
    double correction = 0.0;
    for (int32_t m = 1; m < table.n(); ++m) {
        for (int32_t i = 0; i < table.n() - m; ++i)
            if (const ErrorCode bad = advance(i, m))
                return bad;
        correction = 2 * (int64_t{at} + 1) < table.n() - m ? tableau.c[at + 1] : tableau.d[at--];
        sum += correction;
    }
    *yi = sum;
    *dy = correction;
    return 0;
}

// A larger slope, or NaN, requests a natural end condition.
bool IsSlope(double slope) { return slope <= 9.9e+29; }

ErrorCode CheckAbscissae(ConstRealVector x) {
    for (std::ptrdiff_t i = 1; i < x.size(); ++i)
        if (x[i] == x[i - 1] || (i > 1 && x[i] == x[i - 2]))
            return ErrAbscissaeOrder;
    return 0;
}

} // namespace

ErrorCode InterpolateByPolynomial(const Table &table, double xi, double *yi, double *dy) {
    QX_EXPECTS(table.n() > 0);
    Tableau tableau;
    if (const ErrorCode failed = tableau.start(table, 0.0))
        return failed;
    const RealVector c = tableau.c, d = tableau.d;
    const ConstRealVector x = table.x;
    return WalkTableau(table, NearestPoint(table, xi), tableau, yi, dy, [&](int32_t i, int32_t m) {
        if (x[i + m] == x[i])
            return ErrorCode{ErrAbscissaeOrder};
        const double quotient = (c[i + 1] - d[i]) / (x[i] - x[i + m]);
        d[i] = (x[i + m] - xi) * quotient;
        c[i] = (x[i] - xi) * quotient;
        return ErrorCode{0};
    });
}

ErrorCode InterpolateByRational(const Table &table, double xi, double *yi, double *dy) {
    QX_EXPECTS(table.n() > 0);
    const ConstRealVector x = table.x;
    const int32_t nearest = NearestPoint(table, xi);
    if (std::fabs(xi - x[nearest]) == 0.0) {
        *yi = table.y[nearest];
        *dy = 0.0;
        return 0;
    }
    Tableau tableau;
    if (const ErrorCode failed = tableau.start(table, 1e-10)) // avoids 0 / 0 in the tableau
        return failed;
    const RealVector c = tableau.c, d = tableau.d;
    return WalkTableau(table, nearest, tableau, yi, dy, [&](int32_t i, int32_t m) {
        const double difference = c[i + 1] - d[i];
        const double t = (x[i] - xi) * d[i] / (x[i + m] - xi);
        const double denominator = t - c[i + 1];
        if (denominator == 0.0)
            return ErrorCode{ErrDuplicateAbscissa}; // a pole
        const double quotient = difference / denominator;
        d[i] = c[i + 1] * quotient;
        c[i] = t * quotient;
        return ErrorCode{0};
    });
}

// Solves the tridiagonal system of the spline by a forward pass, which leaves the ratios of the
// elimination in s and the right side in u, and a backward pass.
ErrorCode SplineSecondDerivatives(const Table &table, double firstSlope, double lastSlope,
                                  RealVector s) {
    const auto [x, y] = table;
    const int32_t n = table.n();
    QX_EXPECTS(n > 0);
    if (const ErrorCode bad = CheckAbscissae(x))
        return bad;
    s[0] = 0.0;
    if (n == 1) // no segment
        return 0;
    Scratch<ElementType::DBL> u;
    if (const ErrorCode failed = u.allocate(n))
        return failed;
    u[0] = 0.0;
    if (IsSlope(firstSlope)) {
        s[0] = -0.5;
        u[0] = 3.0 / (x[1] - x[0]) * ((y[1] - y[0]) / (x[1] - x[0]) - firstSlope);
    }
    for (int32_t i = 1; i < n - 1; ++i) {
        const double sig = (x[i] - x[i - 1]) / (x[i + 1] - x[i - 1]);
        const double p = sig * s[i - 1] + 2.0;
        const double bend =
            (y[i + 1] - y[i]) / (x[i + 1] - x[i]) - (y[i] - y[i - 1]) / (x[i] - x[i - 1]);
        s[i] = (sig - 1.0) / p;
        u[i] = (6.0 * bend / (x[i + 1] - x[i - 1]) - sig * u[i - 1]) / p;
    }
    const double h = x[n - 1] - x[n - 2];
    const bool isClamped = IsSlope(lastSlope);
    const double qn = isClamped ? 0.5 : 0.0;
    const double un = isClamped ? 3.0 / h * (lastSlope - (y[n - 1] - y[n - 2]) / h) : 0.0;
    s[n - 1] = (un - qn * u[n - 2]) / (qn * s[n - 2] + 1.0);
    for (int32_t k = n - 2; k >= 0; --k)
        s[k] = s[k] * s[k + 1] + u[k];
    return 0;
}

ErrorCode InterpolateBySpline(const Table &table, ConstRealVector s, double xi, double *yi) {
    const auto [x, y] = table;
    const int32_t n = table.n();
    QX_EXPECTS(n > 0);
    const bool ascends = x[n - 1] > x[0];
    int32_t lo = 0;
    int32_t hi = n - 1;
    while (hi - lo > 1) {
        const int32_t mid = lo + (hi - lo) / 2;
        const bool isBelow = ascends ? x[mid] > xi : x[mid] < xi;
        (isBelow ? hi : lo) = mid;
    }
    const double h = x[hi] - x[lo];
    if (h == 0.0)
        return ErrAbscissaeOrder;
    const double a = (x[hi] - xi) / h;
    const double b = (xi - x[lo]) / h;
    *yi = y[lo] * a + y[hi] * b + ((b * b * b - b) * s[hi] + (a * a * a - a) * s[lo]) * h * h / 6.0;
    return 0;
}

} // namespace qx
