#include "qx/linear_fits.h"

#include "fit/damped_step.h"
#include "fit/exports/fit_arguments.h"
#include "fit/general.h"
#include "fit/line.h"
#include "fit/polynomial.h"
#include "fit/refined.h"
#include "fit/residuals.h"

#include <cstring>

namespace qx {
namespace {

template <class Gives, class Weights>
Outcome StraightLine(typename Gives::Y y, In<DBL1D> x, Weights w, OutDBL slope, OutDBL intercept,
                     typename Gives::MSE mse) {
    if (!SizesFit(y, x, w))
        return ErrSizeMismatch;
    Line line;
    if (const ErrorCode failed = FitLine(SamplesOf(y, x, w), &line, Gives::output(y, mse)))
        return failed;
    slope = line.slope;
    intercept = line.intercept;
    return 0;
}

// The arguments that the revisions of the polynomial fit have added.
struct PolynomialTerms {
    ConstRealVector w;
    FixedTerms fixed;
};

Outcome FitTerms(In<DBL1D> x, In<DBL1D> y, int32_t order, int32_t algorithm,
                 const PolynomialTerms &terms, Out<DBL1D> fit, Out<DBL1D> coefficients,
                 OutDBL mse) {
    const int32_t n = x.size();
    if (y.size() != n)
        return ErrSizeMismatch;
    if (const ErrorCode failed = CheckPolynomialOrder(n, order, terms.fixed.count()))
        return failed;
    if (order == std::numeric_limits<int32_t>::max())
        return ErrOutOfMemory;
    if (const Outcome bad = fit.resize(n))
        return bad;
    if (const Outcome bad = coefficients.resize(order + 1))
        return bad;
    return FitPolynomial({x.view(), y.view(), terms.w}, terms.fixed, algorithm, coefficients.view(),
                         {fit.view(), mse.address()});
}

Outcome FitPoly(In<DBL1D> x, In<DBL1D> y, int32_t order, int32_t algorithm, Out<DBL1D> fit,
                Out<DBL1D> coefficients, OutDBL mse) {
    return FitTerms(x, y, order, algorithm, {}, fit, coefficients, mse);
}

Outcome FitPolyWithFixed(In<DBL1D> x, In<DBL1D> y, int32_t order, int32_t algorithm,
                         In<I32_1D> fixedOrders, In<DBL1D> fixedValues, Out<DBL1D> fit,
                         Out<DBL1D> coefficients, OutDBL mse) {
    if (fixedOrders.size() != fixedValues.size())
        return ErrSizeMismatch;
    return FitTerms(x, y, order, algorithm, {{}, {fixedOrders.view(), fixedValues.view()}}, fit,
                    coefficients, mse);
}

Outcome FitPolyWeighted(In<DBL1D> x, In<DBL1D> y, int32_t order, In<DBL1D> w, int32_t algorithm,
                        In<I32_1D> fixedOrders, In<DBL1D> fixedValues, Out<DBL1D> fit,
                        Out<DBL1D> coefficients, OutDBL mse) {
    if (!WeightsFit(w, x.size()) || fixedOrders.size() != fixedValues.size())
        return ErrSizeMismatch;
    return FitTerms(x, y, order, algorithm, {w.view(), {fixedOrders.view(), fixedValues.view()}},
                    fit, coefficients, mse);
}

Outcome SizeOutputs(int32_t terms, int32_t n, int32_t side, Out<DBL1D> &coefficients,
                    Out<DBL1D> &fit, Out<DBL2D> &covariance) {
    if (const Outcome bad = coefficients.resize(terms))
        return bad;
    if (const Outcome bad = fit.resize(n))
        return bad;
    return covariance.resize(side, side);
}

template <Given given>
Outcome FitMatrix(In<DBL2D> h, In<DBL1D> y, In<DBL1D> w, int32_t algorithm, int32_t wantCovariance,
                  Out<DBL1D> coefficients, Out<DBL1D> fit, Out<DBL2D> covariance, OutDBL mse) {
    const int32_t k = h.cols(), side = wantCovariance != 0 ? k : 0;
    if (y.size() != h.rows() || !WeightsFit(w, y.size()))
        return ErrSizeMismatch;
    if (side > h.rows()) // checked before resizing a covariance that would be larger than all data
        return ErrPolynomialOrderTooHigh;
    if (const Outcome bad = SizeOutputs(k, y.size(), side, coefficients, fit, covariance))
        return bad;
    SampleWeights weights;
    if (const ErrorCode failed = weights.make(w, given))
        return failed;
    return FitGeneral(h.view(), {{}, y.view(), weights.view()}, algorithm, coefficients.view(),
                      covariance.view(), {fit.view(), mse.address()});
}

Outcome FitPoly2026(In<DBL1D> x, In<DBL1D> y, int32_t order, In<DBL1D> w, double tolerance,
                    In<I32_1D> fixedOrders, In<DBL1D> fixedValues, Out<DBL1D> fit,
                    Out<DBL1D> coefficients, OutDBL mse) {
    const int32_t n = x.size(), fixed = fixedOrders.size();
    if (y.size() != n || !WeightsFit(w, n) || fixedValues.size() != fixed)
        return ErrSizeMismatch;
    if (n < 1)
        return ErrEmptyInput;
    if (const ErrorCode failed = CheckPolynomialOrder(n, order, fixed))
        return failed;
    if (order > highestRefined)
        return ErrPolynomialOrderTooHigh;
    if (const Outcome bad = fit.resize(n))
        return bad;
    if (const Outcome bad = coefficients.resize(order + 1))
        return bad;
    return FitPolynomialRefined({x.view(), y.view(), w.view()},
                                {fixedOrders.view(), fixedValues.view()}, tolerance,
                                coefficients.view(), {fit.view(), mse.address()});
}

Outcome FitMatrix2026(In<DBL2D> h, In<DBL1D> y, In<DBL1D> w, double tolerance,
                      int32_t wantCovariance, Out<DBL1D> coefficients, Out<DBL1D> fit,
                      Out<DBL2D> covariance, OutDBL mse) {
    const int32_t k = h.cols(), side = wantCovariance != 0 ? k : 0;
    if (const Outcome bad =
            FirstFailed({{y.size() != h.rows() || !WeightsFit(w, y.size()), ErrSizeMismatch},
                         {k < 1, ErrOrderNotPositive},
                         {h.rows() < k, ErrPolynomialOrderTooHigh}}))
        return bad;
    if (const Outcome bad = SizeOutputs(k, y.size(), side, coefficients, fit, covariance))
        return bad;
    return FitGeneralRefined(h.view(), {{}, y.view(), w.view()}, tolerance, coefficients.view(),
                             covariance.view(), {fit.view(), mse.address()});
}

Outcome ScoreFit(In<DBL1D> y, In<DBL1D> fit, In<DBL1D> w, int32_t dof, OutDBL sse, OutDBL rSquare,
                 OutDBL rmse) {
    if (const Outcome bad =
            FirstFailed({{y.isEmpty(), ErrEmptyInput},
                         {fit.size() != y.size() || !WeightsFit(w, y.size()), ErrSizeMismatch}}))
        return bad;
    FitScores scores;
    if (const ErrorCode failed = GoodnessOfFit(y.view(), fit.view(), w.view(), dof, &scores))
        return failed;
    sse = scores.sse;
    rSquare = scores.rSquare;
    rmse = scores.rmse;
    return 0;
}

Outcome DampedStep(InOut<DBL1D> coefficients, In<DBL2D> a, In<DBL1D> gradient,
                   const double *lambda) {
    const int32_t n = coefficients.size();
    if (n < 1 || a.rows() != n || a.cols() != n || gradient.size() != n)
        return ErrEmptyInput;
    RealMatrix matrix;
    RealVector g;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(matrix, n, n), Sized(g, n)))
        return failed;
    std::memcpy(matrix.data(), a.data(), static_cast<std::size_t>(matrix.count()) * sizeof(DBL));
    std::memcpy(g.data(), gradient.data(), static_cast<std::size_t>(n) * sizeof(DBL));
    return AddDampedStep(matrix, g, *lambda, coefficients.view());
}

} // namespace
} // namespace qx

using qx::CoefficientsOnly;
using qx::Given;
using qx::In;
using qx::InErr;
using qx::InErrAndReturnedWithHost;
using qx::Returned;
using qx::ValuesInPlace;

ErrorCode LinFit_head(DBL1D y, DBL1D x, DBL1D w, double *slope, double *intercept, double *mse) {
    return Returned(qx::StraightLine<ValuesInPlace, In<DBL1D>>, y, x, w, slope, intercept, mse);
}
int32_t LinFitCoef_head(DBL1D y, DBL1D x, double *slope, double *intercept, ErrorCode *err) {
    return InErr(err, qx::StraightLine<CoefficientsOnly, std::nullptr_t>, y, x, nullptr, slope,
                 intercept, nullptr);
}
int32_t LinFitCoef80_head(DBL1D y, DBL1D x, DBL1D w, double *slope, double *intercept,
                          ErrorCode *err) {
    return InErr(err, qx::StraightLine<CoefficientsOnly, In<DBL1D>>, y, x, w, slope, intercept,
                 nullptr);
}

ErrorCode PolyFit_head(DBL1D x, DBL1D y, int32_t order, int32_t algorithm, DBL1D fit,
                       DBL1D coefficients, double *mse) {
    return Returned(qx::FitPoly, x, y, order, algorithm, fit, coefficients, mse);
}
ErrorCode PolyFit80_head(DBL1D x, DBL1D y, int32_t order, int32_t algorithm, I32_1D fixedOrders,
                         DBL1D fixedValues, DBL1D fit, DBL1D coefficients, double *mse) {
    return Returned(qx::FitPolyWithFixed, x, y, order, algorithm, fixedOrders, fixedValues, fit,
                    coefficients, mse);
}
ErrorCode PolyFit81_head(DBL1D x, DBL1D y, int32_t order, DBL1D w, int32_t algorithm,
                         I32_1D fixedOrders, DBL1D fixedValues, DBL1D fit, DBL1D coefficients,
                         double *mse) {
    return Returned(qx::FitPolyWeighted, x, y, order, w, algorithm, fixedOrders, fixedValues, fit,
                    coefficients, mse);
}

ErrorCode PolyFit2026_head(DBL1D x, DBL1D y, int32_t order, DBL1D w, double tolerance,
                           I32_1D fixedOrders, DBL1D fixedValues, DBL1D fit, DBL1D coefficients,
                           double *mse) {
    return Returned(qx::FitPoly2026, x, y, order, w, tolerance, fixedOrders, fixedValues, fit,
                    coefficients, mse);
}

ErrorCode GenLSFit_head(DBL2D H, DBL1D y, DBL1D deviations, int32_t algorithm,
                        int32_t wantCovariance, DBL1D coefficients, DBL1D fit, DBL2D covariance,
                        double *mse) {
    return Returned(qx::FitMatrix<Given::Deviations>, H, y, deviations, algorithm, wantCovariance,
                    coefficients, fit, covariance, mse);
}
ErrorCode GenLSFit80_head(DBL2D H, DBL1D y, DBL1D w, int32_t algorithm, int32_t wantCovariance,
                          DBL1D coefficients, DBL1D fit, DBL2D covariance, double *mse) {
    return Returned(qx::FitMatrix<Given::Weights>, H, y, w, algorithm, wantCovariance, coefficients,
                    fit, covariance, mse);
}

ErrorCode GenLSFit2026_head(DBL2D H, DBL1D y, DBL1D w, double tolerance, int32_t wantCovariance,
                            DBL1D coefficients, DBL1D fit, DBL2D covariance, double *mse) {
    return Returned(qx::FitMatrix2026, H, y, w, tolerance, wantCovariance, coefficients, fit,
                    covariance, mse);
}

ErrorCode GoodnessOfFit_head(DBL1D y, DBL1D fit, DBL1D w, int32_t dof, double *sse, double *rSquare,
                             double *rmse) {
    return Returned(qx::ScoreFit, y, fit, w, dof, sse, rSquare, rmse);
}

ErrorCode GetNewCoef_head(DBL1D coefficients, DBL2D a, DBL1D gradient, const double *lambda,
                          ErrorCode *err) {
    return InErrAndReturnedWithHost(err, qx::DampedStep, coefficients, a, gradient, lambda);
}
