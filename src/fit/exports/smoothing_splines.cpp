#include "qx/smoothing_splines.h"

#include "fit/b_spline.h"
#include "fit/b_spline_spans.h"
#include "fit/exports/fit_arguments.h"
#include "fit/smoothing_spline.h"
#include "linalg/matrix.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

bool IsFinite(In<DBL1D> x) { return x.isEmpty() || CheckFinite(x.data(), x.size()) == 0; }

ErrorCode CheckSmoothing(In<DBL1D> x, In<DBL1D> y, In<DBL1D> d, int32_t method, double parameter) {
    if (x.isEmpty() || y.isEmpty())
        return ErrEmptyInput;
    const int32_t n = x.size();
    const bool isUsed = method != static_cast<int32_t>(Smoothing::CrossValidated);
    if (const ErrorCode failed =
            FirstFailed({{y.size() != n || !WeightsFit(d, n), ErrSizeMismatch},
                         {method < 0 || method > 2, ErrInvalidSelector},
                         {!IsFinite(x) || !IsFinite(y) || !IsFinite(d) ||
                              (isUsed && std::isinf(parameter) && parameter > 0.0),
                          ErrNonFiniteInput}}))
        return failed;
    for (const double deviation : d.view())
        if (deviation <= 0.0)
            return ErrNotStrictlyPositive;
    if (isUsed && !(parameter >= 0.0))
        return ErrNegativeSetting;
    for (int32_t i = 1; i < n; ++i)
        if (!(x.data()[i - 1] < x.data()[i]))
            return ErrAbscissaeOrder;
    return 0;
}

// The coefficients of each piece in powers of x - x[i].
void FindPieces(ConstRealVector x, ConstRealVector values, ConstRealVector second,
                const RealMatrix &pieces) {
    for (int32_t i = 0; i < pieces.rows(); ++i) {
        const double h = x[i + 1] - x[i];
        DBL *const piece = pieces.row(i);
        piece[0] = values[i];
        piece[1] = (values[i + 1] - values[i]) / h - h * (2.0 * second[i] + second[i + 1]) / 6.0;
        piece[2] = second[i] / 2.0;
        piece[3] = (second[i + 1] - second[i]) / (6.0 * h);
    }
}

Outcome Smooth(In<DBL1D> x, In<DBL1D> y, In<DBL1D> d, int32_t method, double parameter,
               Out<DBL1D> values, Out<DBL2D> coefficients, Out<DBL1D> second, OutDBL lambda,
               OutDBL effective) {
    if (const ErrorCode failed = CheckSmoothing(x, y, d, method, parameter))
        return failed;
    const int32_t n = x.size();
    for (Out<DBL1D> *const array : {&values, &second})
        if (const Outcome bad = array->resize(n))
            return bad;
    if (const Outcome bad = coefficients.resize(n - 1, 4))
        return bad;
    if (n < 3) {
        for (int32_t i = 0; i < n; ++i)
            values.data()[i] = y.data()[i];
        Fill(second.data(), n, 0.0);
        lambda = 0.0;
        effective = n;
    } else {
        SmoothingSpline spline;
        if (const ErrorCode failed = spline.make(x.view(), y.view(), d.view()))
            return failed;
        spline.fit(static_cast<Smoothing>(method), parameter, values.view(), second.view(),
                   lambda.address(), effective.address());
    }
    FindPieces(x.view(), values.view(), second.view(), coefficients.view());
    return 0;
}

bool DoesNotFall(ConstRealVector x) {
    for (std::ptrdiff_t i = 1; i < x.size(); ++i)
        if (x[i] < x[i - 1])
            return false;
    return true;
}

bool KnotsAreInside(In<DBL1D> knots, int32_t degree, double first, double last) {
    const DBL *const t = knots.data();
    for (int32_t i = 0; i < knots.size(); ++i)
        if (!(t[i] > first && t[i] < last) || (i > 0 && t[i] < t[i - 1]) ||
            (i > degree && t[i] == t[i - degree - 1]))
            return false;
    return true;
}

Outcome FitSpline(In<DBL1D> x, In<DBL1D> y, In<DBL1D> w, int32_t degree, int32_t interior,
                  In<DBL1D> given, Out<DBL1D> knots, Out<DBL1D> coefficients, Out<DBL1D> values,
                  OutDBL mse) {
    if (x.isEmpty() || y.isEmpty())
        return ErrEmptyInput;
    const int32_t n = x.size();
    if (const ErrorCode failed =
            FirstFailed({{y.size() != n || !WeightsFit(w, n), ErrSizeMismatch},
                         {degree < 1 || degree > kHighestSplineDegree, ErrOrderNotPositive},
                         {interior < 0, ErrNegativeCount},
                         {!IsFinite(x) || !IsFinite(y) || !IsFinite(w) || !IsFinite(given),
                          ErrNonFiniteInput}}))
        return failed;
    const int32_t inner = given.isEmpty() ? interior : given.size();
    if (!DoesNotFall(x.view()) ||
        (!given.isEmpty() && !KnotsAreInside(given, degree, x.data()[0], x.data()[n - 1])))
        return ErrAbscissaeOrder;
    if (int64_t{inner} + degree + 1 > n)
        return ErrPolynomialOrderTooHigh;
    const int32_t count = inner + degree + 1;
    if (int64_t{count} + degree + 1 > std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    if (const Outcome bad = knots.resize(count + degree + 1))
        return bad;
    if (const Outcome bad = coefficients.resize(count))
        return bad;
    if (const Outcome bad = values.resize(n))
        return bad;
    MakeKnots(x.view(), degree, given.view(), knots.view());
    return FitBSpline(SamplesOf(y, x, w), degree, knots.view(), coefficients.view(),
                      {values.view(), mse.address()});
}

} // namespace
} // namespace qx

using qx::Returned;

ErrorCode CubicSplineFit_head(DBL1D x, DBL1D y, DBL1D deviations, int32_t method, double parameter,
                              DBL1D values, DBL2D coefficients, DBL1D secondDerivatives,
                              double *lambda, double *effectiveParameters) {
    return Returned(qx::Smooth, x, y, deviations, method, parameter, values, coefficients,
                    secondDerivatives, lambda, effectiveParameters);
}

ErrorCode BSplineFit_head(DBL1D x, DBL1D y, DBL1D w, int32_t degree, int32_t interior,
                          DBL1D interiorKnots, DBL1D knots, DBL1D coefficients, DBL1D values,
                          double *mse) {
    return Returned(qx::FitSpline, x, y, w, degree, interior, interiorKnots, knots, coefficients,
                    values, mse);
}
