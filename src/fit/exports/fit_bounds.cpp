#include "qx/fit_bounds.h"

#include "fit/confidence_bounds.h"
#include "fit/exports/fit_arguments.h"
#include "fit/logarithm.h"
#include "frame/constants.h"
#include "linalg/matrix.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

// The models: how many coefficients each has (0: any number), its own codes, and its value and
// derivatives at a sample.

struct Line {
    static constexpr int32_t count = 2;
    static ErrorCode check(In<DBL1D>, const DBL *) { return 0; }
    static bool isSingular(const DBL *) { return false; }
    static double evaluate(double x, const DBL *c, DBL *d) {
        d[0] = x;
        d[1] = 1.0;
        return c[0] * x + c[1];
    }
};

struct Exponential {
    static constexpr int32_t count = 2;
    static ErrorCode check(In<DBL1D>, const DBL *) { return 0; }
    static bool isSingular(const DBL *c) { return c[0] == 0.0; }
    static double evaluate(double x, const DBL *c, DBL *d) {
        d[0] = std::exp(c[1] * x);
        d[1] = c[0] * d[0] * x;
        return c[0] * d[0];
    }
};

struct Power {
    static constexpr int32_t count = 2;
    static ErrorCode check(In<DBL1D> x, const DBL *) {
        return SameSign(x.view()) == 1.0 ? 0 : ErrNotStrictlyPositive;
    }
    static bool isSingular(const DBL *c) { return c[0] == 0.0; }
    static double evaluate(double x, const DBL *c, DBL *d) {
        d[0] = std::pow(x, c[1]);
        d[1] = c[0] * d[0] * std::log(x);
        return c[0] * d[0];
    }
};

struct Gaussian {
    static constexpr int32_t count = 3;
    static ErrorCode check(In<DBL1D>, const DBL *) { return 0; }
    static bool isSingular(const DBL *c) { return c[0] == 0.0 || c[2] == 0.0; }
    static double evaluate(double x, const DBL *c, DBL *d) {
        const double z = (x - c[1]) / c[2];
        d[0] = std::exp(-0.5 * (z * z));
        d[1] = c[0] * d[0] * z / c[2];
        d[2] = d[1] * z;
        return c[0] * d[0];
    }
};

class Logarithm {
public:
    static constexpr int32_t count = 2;
    explicit Logarithm(double base) : base_(base), logarithm_(base) {}
    ErrorCode check(In<DBL1D> x, const DBL *c) const {
        const double sign = SameSign(x.view());
        const bool isPositive = (sign > 0.0 && c[1] > 0.0) || (sign < 0.0 && c[1] < 0.0);
        return isPositive && base_ > 0.0 && base_ != 1.0 ? 0 : ErrNotStrictlyPositive;
    }
    static bool isSingular(const DBL *c) { return c[0] == 0.0; }
    double evaluate(double x, const DBL *c, DBL *d) const {
        d[0] = logarithm_.log(c[1] * x);
        d[1] = c[0] * logarithm_.log(kE) / c[1];
        return c[0] * d[0];
    }

private:
    double base_;
    LogBase logarithm_;
};

// The outputs for the bounds. The arrays of coefficients have the lengths of those of the fit.
struct ConfidenceOutputs {
    Out<DBL1D> &lowerCoefficients, &upperCoefficients, &lower, &upper;
};
struct PredictionOutputs {
    Out<DBL1D> &lower, &upper;
};

Outcome Sized(const PredictionOutputs &out, int32_t n, int32_t) {
    for (Out<DBL1D> *const array : {&out.lower, &out.upper})
        if (const Outcome bad = array->resize(n))
            return bad;
    return 0;
}
Outcome Sized(const ConfidenceOutputs &out, int32_t n, int32_t coefficients) {
    for (Out<DBL1D> *const array : {&out.lowerCoefficients, &out.upperCoefficients})
        if (const Outcome bad = array->resize(coefficients))
            return bad;
    return Sized(PredictionOutputs{out.lower, out.upper}, n, coefficients);
}

Outcome Bounds(const FittedModel &model, In<DBL1D>, double confidence,
               const PredictionOutputs &out) {
    if (const Outcome bad = Sized(out, model.linear.n, 0))
        return bad;
    return BoundsOfFit(model, confidence, BoundsOf::Observation, {}, out.lower.view(),
                       out.upper.view());
}
// Coefficients beyond the parameters of the model are given constants whose interval has no width.
Outcome Bounds(const FittedModel &model, In<DBL1D> coefficients, double confidence,
               const ConfidenceOutputs &out) {
    const int32_t count = coefficients.size();
    if (const Outcome bad = Sized(out, model.linear.n, count))
        return bad;
    const RealVector low = out.lowerCoefficients.view(), high = out.upperCoefficients.view();
    Fill(high.data(), count, 0.0);
    if (const ErrorCode failed = BoundsOfFit(model, confidence, BoundsOf::Curve, high,
                                             out.lower.view(), out.upper.view()))
        return failed;
    for (int32_t i = 0; i < count; ++i) {
        const double c = coefficients.data()[i], half = high[i];
        low[i] = c - half;
        high[i] = c + half;
    }
    return 0;
}

struct FittedData {
    In<DBL1D> y, w, coefficients;
    bool areFinite() const {
        return CheckFinite(y.data(), y.size()) == 0 &&
               (w.isEmpty() || CheckFinite(w.data(), w.size()) == 0) &&
               CheckFinite(coefficients.data(), coefficients.size()) == 0;
    }
    // The number of samples whose weight is not 0.
    int32_t countUsed() const {
        int32_t used = y.size();
        for (const double weight : w.view())
            used -= weight == 0.0;
        return used;
    }
    const DBL *weights() const { return w.isEmpty() ? nullptr : w.data(); }
};

// The common checks, which follow those of the model.
ErrorCode CheckDegrees(int32_t used, int32_t k, double confidence) {
    return FirstFailed({{used <= k, ErrTooFewForParameters},
                        {!(confidence > 0.0 && confidence < 1.0), ErrProbabilityOutOfRange}});
}

ErrorCode CheckAbscissae(In<DBL1D> x, const FittedData &data, int32_t count) {
    const int32_t n = data.y.size();
    if (x.isEmpty() || data.y.isEmpty() || data.coefficients.isEmpty())
        return ErrEmptyInput;
    return FirstFailed({{x.size() != n || !WeightsFit(data.w, n) ||
                             (count > 0 && data.coefficients.size() != count),
                         ErrSizeMismatch},
                        {n < 3, ErrFewerThanThree}});
}

template <class Model, class Outputs>
Outcome CurveBounds(const Model &curve, In<DBL1D> x, const FittedData &data, double confidence,
                    const Outputs &out) {
    constexpr int32_t k = Model::count;
    if (const ErrorCode failed = CheckAbscissae(x, data, k))
        return failed;
    if (CheckFinite(x.data(), x.size()) != 0 || !data.areFinite())
        return ErrNonFiniteInput;
    const DBL *const c = data.coefficients.data();
    if (const ErrorCode failed = curve.check(x, c))
        return failed;
    const int32_t n = x.size(), used = data.countUsed();
    if (const ErrorCode failed = CheckDegrees(used, k, confidence))
        return failed;
    if (curve.isSingular(c))
        return ErrSingularMatrix;
    const auto writeRows = [&](const RowBlock &block) {
        for (int32_t i = 0; i < block.count; ++i) {
            DBL d[k];
            block.column(k)[i] = curve.evaluate(x.data()[block.first + i], c, d);
            for (int32_t j = 0; j < k; ++j)
                block.column(j)[i] = d[j];
        }
    };
    return Bounds({{writeRows, n, k, data.weights()}, data.y.view(), used}, data.coefficients,
                  confidence, out);
}

// Bounds for the powers that a polynomial fit determines; terms beyond them are given constants.
template <class Outputs>
Outcome PolynomialBounds(In<DBL1D> x, const FittedData &data, double confidence,
                         const Outputs &out) {
    constexpr int32_t mostFitted = 26;
    if (const ErrorCode failed = CheckAbscissae(x, data, 0))
        return failed;
    if (CheckFinite(x.data(), x.size()) != 0 || !data.areFinite())
        return ErrNonFiniteInput;
    const DBL *const c = data.coefficients.data();
    const int32_t terms = data.coefficients.size(), k = std::min(terms, mostFitted);
    const int32_t n = x.size(), used = data.countUsed();
    if (const ErrorCode failed = CheckDegrees(used, k, confidence))
        return failed;
    const auto writeRows = [&](const RowBlock &block) {
        const DBL *const from = x.data() + block.first;
        DBL *const value = block.column(k);
        Fill(value, block.count, c[terms - 1]);
        for (int32_t j = terms - 2; j >= 0; --j)
            for (int32_t i = 0; i < block.count; ++i)
                value[i] = value[i] * from[i] + c[j];
        Fill(block.start, block.count, 1.0);
        for (int32_t j = 1; j < k; ++j)
            for (int32_t i = 0; i < block.count; ++i)
                block.column(j)[i] = block.column(j - 1)[i] * from[i];
    };
    return Bounds({{writeRows, n, k, data.weights()}, data.y.view(), used}, data.coefficients,
                  confidence, out);
}

template <class Outputs>
Outcome MatrixBounds(In<DBL2D> h, const FittedData &data, double confidence, const Outputs &out) {
    if (h.isEmpty() || data.y.isEmpty() || data.coefficients.isEmpty())
        return ErrEmptyInput;
    const int32_t n = h.rows(), k = h.cols();
    if (data.y.size() != n || !WeightsFit(data.w, n) || data.coefficients.size() != k)
        return ErrSizeMismatch;
    if (CheckFinite(h.data(), int64_t{n} * k) != 0 || !data.areFinite())
        return ErrNonFiniteInput;
    const int32_t used = data.countUsed();
    if (const ErrorCode failed = CheckDegrees(used, k, confidence))
        return failed;
    const DBL *const c = data.coefficients.data();
    const auto writeRows = [&](const RowBlock &block) {
        CopyTransposed<ElementType::DBL>(h.view().block(block.first, 0, block.count, k),
                                         {block.start, k, block.count});
        DBL *const value = block.column(k);
        Fill(value, block.count, 0.0);
        for (int32_t j = 0; j < k; ++j)
            for (int32_t i = 0; i < block.count; ++i)
                value[i] += block.column(j)[i] * c[j];
    };
    return Bounds({{writeRows, n, k, data.weights()}, data.y.view(), used}, data.coefficients,
                  confidence, out);
}

// The parameters of the frames of confidence and prediction: the type of x and the bounds.
template <class Model>
struct OfCurve {
    typedef In<DBL1D> X;
    template <class Outputs>
    static Outcome bounds(X x, const FittedData &data, double confidence, const Outputs &out) {
        return CurveBounds(Model(), x, data, confidence, out);
    }
};
struct OfPolynomial {
    typedef In<DBL1D> X;
    template <class Outputs>
    static Outcome bounds(X x, const FittedData &data, double confidence, const Outputs &out) {
        return PolynomialBounds(x, data, confidence, out);
    }
};
struct OfMatrix {
    typedef In<DBL2D> X;
    template <class Outputs>
    static Outcome bounds(X h, const FittedData &data, double confidence, const Outputs &out) {
        return MatrixBounds(h, data, confidence, out);
    }
};

template <class Of>
Outcome Conf(typename Of::X x, In<DBL1D> y, In<DBL1D> w, In<DBL1D> c, double confidence,
             Out<DBL1D> lowerC, Out<DBL1D> upperC, Out<DBL1D> lower, Out<DBL1D> upper) {
    return Of::bounds(x, {y, w, c}, confidence, ConfidenceOutputs{lowerC, upperC, lower, upper});
}
template <class Of>
Outcome Pred(typename Of::X x, In<DBL1D> y, In<DBL1D> w, In<DBL1D> c, double confidence,
             Out<DBL1D> lower, Out<DBL1D> upper) {
    return Of::bounds(x, {y, w, c}, confidence, PredictionOutputs{lower, upper});
}

// A base that is NaN is reported as out of range, an infinite base as not finite.
template <class Outputs>
Outcome LogarithmBounds(In<DBL1D> x, const FittedData &data, double base, double confidence,
                        const Outputs &out) {
    if (std::isinf(base))
        if (const ErrorCode failed = CheckAbscissae(x, data, Logarithm::count))
            return failed;
    return std::isinf(base) ? Outcome(ErrNonFiniteInput)
                            : CurveBounds(Logarithm(base), x, data, confidence, out);
}
Outcome ConfOfLog(In<DBL1D> x, In<DBL1D> y, In<DBL1D> w, In<DBL1D> c, double base,
                  double confidence, Out<DBL1D> lowerC, Out<DBL1D> upperC, Out<DBL1D> lower,
                  Out<DBL1D> upper) {
    return LogarithmBounds(x, {y, w, c}, base, confidence,
                           ConfidenceOutputs{lowerC, upperC, lower, upper});
}
Outcome PredOfLog(In<DBL1D> x, In<DBL1D> y, In<DBL1D> w, In<DBL1D> c, double base,
                  double confidence, Out<DBL1D> lower, Out<DBL1D> upper) {
    return LogarithmBounds(x, {y, w, c}, base, confidence, PredictionOutputs{lower, upper});
}

} // namespace
} // namespace qx

using qx::Returned;

ErrorCode ConfBndLinear_head(DBL1D x, DBL1D y, DBL1D w, DBL1D coefficients, double confidence,
                             DBL1D lowerCoefficients, DBL1D upperCoefficients, DBL1D lowerCurve,
                             DBL1D upperCurve) {
    return Returned(qx::Conf<qx::OfCurve<qx::Line>>, x, y, w, coefficients, confidence,
                    lowerCoefficients, upperCoefficients, lowerCurve, upperCurve);
}
ErrorCode PredBndLinear_head(DBL1D x, DBL1D y, DBL1D w, DBL1D coefficients, double confidence,
                             DBL1D lowerCurve, DBL1D upperCurve) {
    return Returned(qx::Pred<qx::OfCurve<qx::Line>>, x, y, w, coefficients, confidence, lowerCurve,
                    upperCurve);
}

ErrorCode ConfBndExp_head(DBL1D x, DBL1D y, DBL1D w, DBL1D coefficients, double confidence,
                          DBL1D lowerCoefficients, DBL1D upperCoefficients, DBL1D lowerCurve,
                          DBL1D upperCurve) {
    return Returned(qx::Conf<qx::OfCurve<qx::Exponential>>, x, y, w, coefficients, confidence,
                    lowerCoefficients, upperCoefficients, lowerCurve, upperCurve);
}
ErrorCode PredBndExp_head(DBL1D x, DBL1D y, DBL1D w, DBL1D coefficients, double confidence,
                          DBL1D lowerCurve, DBL1D upperCurve) {
    return Returned(qx::Pred<qx::OfCurve<qx::Exponential>>, x, y, w, coefficients, confidence,
                    lowerCurve, upperCurve);
}

ErrorCode ConfBndPower_head(DBL1D x, DBL1D y, DBL1D w, DBL1D coefficients, double confidence,
                            DBL1D lowerCoefficients, DBL1D upperCoefficients, DBL1D lowerCurve,
                            DBL1D upperCurve) {
    return Returned(qx::Conf<qx::OfCurve<qx::Power>>, x, y, w, coefficients, confidence,
                    lowerCoefficients, upperCoefficients, lowerCurve, upperCurve);
}
ErrorCode PredBndPower_head(DBL1D x, DBL1D y, DBL1D w, DBL1D coefficients, double confidence,
                            DBL1D lowerCurve, DBL1D upperCurve) {
    return Returned(qx::Pred<qx::OfCurve<qx::Power>>, x, y, w, coefficients, confidence, lowerCurve,
                    upperCurve);
}

ErrorCode ConfBndLog_head(DBL1D x, DBL1D y, DBL1D w, DBL1D coefficients, double base,
                          double confidence, DBL1D lowerCoefficients, DBL1D upperCoefficients,
                          DBL1D lowerCurve, DBL1D upperCurve) {
    return Returned(qx::ConfOfLog, x, y, w, coefficients, base, confidence, lowerCoefficients,
                    upperCoefficients, lowerCurve, upperCurve);
}
ErrorCode PredBndLog_head(DBL1D x, DBL1D y, DBL1D w, DBL1D coefficients, double base,
                          double confidence, DBL1D lowerCurve, DBL1D upperCurve) {
    return Returned(qx::PredOfLog, x, y, w, coefficients, base, confidence, lowerCurve, upperCurve);
}

ErrorCode ConfBndGauss_head(DBL1D x, DBL1D y, DBL1D w, DBL1D coefficients, double confidence,
                            DBL1D lowerCoefficients, DBL1D upperCoefficients, DBL1D lowerCurve,
                            DBL1D upperCurve) {
    return Returned(qx::Conf<qx::OfCurve<qx::Gaussian>>, x, y, w, coefficients, confidence,
                    lowerCoefficients, upperCoefficients, lowerCurve, upperCurve);
}
ErrorCode PredBndGauss_head(DBL1D x, DBL1D y, DBL1D w, DBL1D coefficients, double confidence,
                            DBL1D lowerCurve, DBL1D upperCurve) {
    return Returned(qx::Pred<qx::OfCurve<qx::Gaussian>>, x, y, w, coefficients, confidence,
                    lowerCurve, upperCurve);
}

ErrorCode ConfBndPoly_head(DBL1D x, DBL1D y, DBL1D w, DBL1D coefficients, double confidence,
                           DBL1D lowerCoefficients, DBL1D upperCoefficients, DBL1D lowerCurve,
                           DBL1D upperCurve) {
    return Returned(qx::Conf<qx::OfPolynomial>, x, y, w, coefficients, confidence,
                    lowerCoefficients, upperCoefficients, lowerCurve, upperCurve);
}
ErrorCode PredBndPoly_head(DBL1D x, DBL1D y, DBL1D w, DBL1D coefficients, double confidence,
                           DBL1D lowerCurve, DBL1D upperCurve) {
    return Returned(qx::Pred<qx::OfPolynomial>, x, y, w, coefficients, confidence, lowerCurve,
                    upperCurve);
}

ErrorCode ConfBndGenLS_head(DBL2D H, DBL1D y, DBL1D w, DBL1D coefficients, double confidence,
                            DBL1D lowerCoefficients, DBL1D upperCoefficients, DBL1D lowerCurve,
                            DBL1D upperCurve) {
    return Returned(qx::Conf<qx::OfMatrix>, H, y, w, coefficients, confidence, lowerCoefficients,
                    upperCoefficients, lowerCurve, upperCurve);
}
ErrorCode PredBndGenLS_head(DBL2D H, DBL1D y, DBL1D w, DBL1D coefficients, double confidence,
                            DBL1D lowerCurve, DBL1D upperCurve) {
    return Returned(qx::Pred<qx::OfMatrix>, H, y, w, coefficients, confidence, lowerCurve,
                    upperCurve);
}
