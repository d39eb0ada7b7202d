#include "fit/refined.h"

#include "fit/refined_model.h"
#include "linalg/factorisations/range.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

ConstRealMatrix AsColumn(ConstRealVector x) {
    return {x.data(), static_cast<int32_t>(x.size()), 1};
}
bool AreNumbers(ConstRealVector x) {
    return x.isEmpty() || HoldsOnlyNumbers<ElementType::DBL>(AsColumn(x));
}

// The smallest e with all |x| below 2^e; 0 if all x are 0.
int ExponentOf(ConstRealVector x) {
    double largest = 0.0;
    for (std::ptrdiff_t i = 0; i < x.size(); ++i)
        largest = std::max(largest, std::fabs(x[i]));
    int exponent = 0;
    if (largest != 0.0)
        std::frexp(largest, &exponent);
    return exponent;
}

// y and the weights, divided by powers of two.
struct ScaledSamples {
    ErrorCode make(const FitSamples &samples) {
        if (const ErrorCode failed = memory.take(Sized(y, samples.n()), Sized(w, samples.w.size())))
            return failed;
        yExponent = ExponentOf(samples.y);
        wExponent = ExponentOf(samples.w);
        for (std::ptrdiff_t i = 0; i < y.size(); ++i)
            y[i] = std::ldexp(samples.y[i], -yExponent);
        for (std::ptrdiff_t i = 0; i < w.size(); ++i)
            w[i] = std::ldexp(std::fabs(samples.w[i]), -wExponent);
        return 0;
    }
    const DBL *weights() const { return w.isEmpty() ? nullptr : w.data(); }
    int32_t n() const { return static_cast<int32_t>(y.size()); }

    ScratchParts memory;
    RealVector y, w;
    int yExponent = 0, wExponent = 0;
};

// Computes the values y - r and the MSE for the coefficients found.
ErrorCode Evaluate(const PairModel &model, const PairVector &c, const ScaledSamples &samples,
                   const FitOutput &out) {
    double squares;
    if (const ErrorCode failed = RefinedResiduals(model, c, out.values, &squares))
        return failed;
    for (int32_t i = 0; i < model.n; ++i)
        out.values[i] = std::ldexp(samples.y[i] - out.values[i], samples.yExponent);
    *out.mse = std::ldexp(squares / model.n, samples.wExponent + 2 * samples.yExponent);
    return 0;
}

class MatrixRows final : public PairRows {
public:
    MatrixRows(const ConstRealMatrix &h, const ScaledSamples &samples, IndexVector exponents)
        : h_(h), samples_(samples), exponents_(exponents) {}
    bool hasLow() const override { return false; }
    void write(const PairBlock &block) const override {
        const int32_t first = block.high.first, count = block.high.count, k = h_.cols();
        CopyTransposed<ElementType::DBL>(h_.block(first, 0, count, k),
                                         {block.high.start, k, count});
        for (int32_t j = 0; j < k; ++j)
            DivideByPower<ElementType::DBL>({block.high.column(j), 1, count}, exponents_[j]);
        for (int32_t i = 0; i < count; ++i)
            block.high.column(k)[i] = samples_.y[first + i];
    }

private:
    const ConstRealMatrix h_;
    const ScaledSamples &samples_;
    const IndexVector exponents_;
};

void ColumnExponents(const ConstRealMatrix &h, IndexVector exponents) {
    for (int32_t j = 0; j < h.cols(); ++j) {
        double largest = 0.0;
        for (int32_t i = 0; i < h.rows(); ++i)
            largest = std::max(largest, std::fabs(h(i, j)));
        int exponent = 0;
        if (largest != 0.0)
            std::frexp(largest, &exponent);
        exponents[j] = exponent;
    }
}

// x = middle + half t, in pairs of doubles, after x has been divided by 2^exponent.
struct Interval {
    int exponent = 0;
    double middle = 0.0, half = 1.0;

    explicit Interval(ConstRealVector x) : exponent(ExponentOf(x)) {}
    void shift(ConstRealVector x) {
        double low = std::ldexp(x[0], -exponent), high = low;
        for (std::ptrdiff_t i = 1; i < x.size(); ++i) {
            const double value = std::ldexp(x[i], -exponent);
            low = std::min(low, value);
            high = std::max(high, value);
        }
        middle = 0.5 * low + 0.5 * high;
        half = std::max(high - middle, middle - low);
        half = half == 0.0 ? 1.0 : half;
    }
    Pair at(double x) const {
        return PairQuotient(ExactSum(std::ldexp(x, -exponent), -middle), {half, 0.0});
    }
};

constexpr int32_t chunk = 64;

// Chebyshev polynomials of t, or powers of t, of which some are fixed and subtracted from y.
class PolynomialPairRows final : public PairRows {
public:
    enum class Basis { Chebyshev, Powers };
    // value[j] is the fixed coefficient of power j of t where isFixed[j] is not 0.
    PolynomialPairRows(Basis basis, const Interval &interval, ConstRealVector x,
                       const ScaledSamples &samples, IndexVector isFixed, RealVector value)
        : basis_(basis), interval_(interval), x_(x), samples_(samples), isFixed_(isFixed),
          value_(value) {}
    bool hasLow() const override { return true; }
    void write(const PairBlock &block) const override {
        for (int32_t from = 0; from < block.high.count; from += chunk)
            writeChunk(block, from, std::min(chunk, block.high.count - from));
    }

private:
    // Pairs of up to `chunk` rows.
    struct Pairs {
        double high[chunk], low[chunk];
        Pair at(int32_t i) const { return {high[i], low[i]}; }
        void set(int32_t i, Pair value) {
            high[i] = value.hi;
            low[i] = value.lo;
        }
    };

    void writeChunk(const PairBlock &block, int32_t from, int32_t count) const {
        Pairs t, last, now, y;
        start(block.high.first + from, count, &t, &y);
        for (int32_t i = 0; i < count; ++i) {
            last.set(i, {0.0, 0.0});
            now.set(i, {1.0, 0.0});
        }
        int32_t column = 0;
        for (std::ptrdiff_t j = 0; j < value_.size(); ++j) {
            if (isFixed_[j] == 0)
                put(block, column++, from, now, count);
            for (int32_t i = 0; isFixed_[j] != 0 && i < count; ++i)
                y.set(i, PairSum(y.at(i), PairProduct(now.at(i), {-value_[j], 0.0})));
            advance(j, count, t, &last, &now);
        }
        put(block, column, from, y, count);
    }
    void start(std::ptrdiff_t first, int32_t count, Pairs *t, Pairs *y) const {
        for (int32_t i = 0; i < count; ++i) {
            t->set(i, interval_.at(x_[first + i]));
            y->set(i, {samples_.y[first + i], 0.0});
        }
    }
    // Advances from term j to the next.
    void advance(std::ptrdiff_t j, int32_t count, const Pairs &t, Pairs *last, Pairs *now) const {
        if (basis_ == Basis::Powers) {
            for (int32_t i = 0; i < count; ++i)
                now->set(i, PairProduct(t.at(i), now->at(i)));
            return;
        }
        const double factor = j > 0 ? 2.0 : 1.0;
        for (int32_t i = 0; i < count; ++i) {
            const Pair product = Scaled(PairProduct(t.at(i), now->at(i)), factor);
            const Pair next = PairSum(product, {-last->high[i], -last->low[i]});
            last->set(i, now->at(i));
            now->set(i, next);
        }
    }
    static void put(const PairBlock &block, int32_t column, int32_t from, const Pairs &values,
                    int32_t count) {
        const std::ptrdiff_t at = std::ptrdiff_t{column} * block.high.count + from;
        for (int32_t i = 0; i < count; ++i)
            block.high.start[at + i] = values.high[i];
        for (int32_t i = 0; block.low != nullptr && i < count; ++i)
            block.low[at + i] = values.low[i];
    }

    const Basis basis_;
    const Interval interval_;
    const ConstRealVector x_;
    const ScaledSamples &samples_;
    const IndexVector isFixed_;
    const RealVector value_;
};

// Converts coefficients of Chebyshev polynomials to those of powers, by Clenshaw's recurrence;
// `one` and `two` are memory of the same size.
void ToPowers(const PairVector &c, const PairVector &one, const PairVector &two) {
    const std::ptrdiff_t k = c.high.size();
    PairVector now = one, before = two; // b[j + 1] and b[j + 2]
    for (const PairVector *start : {&one, &two})
        for (std::ptrdiff_t i = 0; i < k; ++i)
            start->set(i, {0.0, 0.0});
    for (std::ptrdiff_t j = k - 1; j >= 0; --j) {
        const double factor = j > 0 ? 2.0 : 1.0;
        for (std::ptrdiff_t i = k - 1; i >= 0; --i) { // b[j] = c[j] + 2 t b[j + 1] - b[j + 2]
            Pair next = {-before.high[i], -before.low[i]};
            if (i > 0)
                next = PairSum(Scaled(now.at(i - 1), factor), next);
            before.set(i, i == 0 ? PairSum(c.at(j), next) : next);
        }
        std::swap(now, before);
    }
    for (std::ptrdiff_t i = 0; i < k; ++i)
        c.set(i, now.at(i));
}

// Converts coefficients of powers of t to those of powers of middle + half t.
void ToAbscissae(const PairVector &c, const Interval &interval) {
    const std::ptrdiff_t k = c.high.size();
    Pair power = {1.0, 0.0};
    for (std::ptrdiff_t j = 1; j < k; ++j) {
        power = PairProduct(power, {interval.half, 0.0});
        c.set(j, PairQuotient(c.at(j), power));
    }
    for (std::ptrdiff_t i = 0; i + 1 < k; ++i)
        for (std::ptrdiff_t j = k - 2; j >= i; --j)
            c.set(j, PairSum(c.at(j), PairProduct(c.at(j + 1), {-interval.middle, 0.0})));
}

} // namespace

ErrorCode FitGeneralRefined(const ConstRealMatrix &h, const FitSamples &samples, double tolerance,
                            RealVector c, const RealMatrix &covariance, const FitOutput &out) {
    const int32_t n = h.rows(), k = h.cols();
    QX_EXPECTS(1 <= k && k <= n && out.values.size() == n && out.mse != nullptr);
    if (!HoldsOnlyNumbers<ElementType::DBL>(h) || !AreNumbers(samples.y) || !AreNumbers(samples.w))
        return ErrNonFiniteInput;
    ScaledSamples scaled;
    if (const ErrorCode failed = scaled.make(samples))
        return failed;
    PairVector found;
    IndexVector exponents;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(found.high, k), Sized(found.low, k), Sized(exponents, k)))
        return failed;
    ColumnExponents(h, exponents);
    const MatrixRows rows(h, scaled, exponents);
    const PairModel model = {rows, n, k, scaled.weights()};
    const ErrorCode status = SolveRefined(model, tolerance, found, covariance);
    if (status < 0)
        return status;
    for (int32_t j = 0; j < k; ++j)
        c[j] = std::ldexp(found.high[j], scaled.yExponent - exponents[j]);
    for (int32_t i = 0; i < covariance.rows(); ++i)
        for (int32_t j = 0; j < k; ++j)
            covariance(i, j) =
                std::ldexp(covariance(i, j), -scaled.wExponent - exponents[i] - exponents[j]);
    const ErrorCode failed = Evaluate(model, found, scaled, out);
    return failed != 0 ? failed : status;
}

ErrorCode FitPolynomialRefined(const FitSamples &samples, const FixedTerms &fixed, double tolerance,
                               RealVector c, const FitOutput &out) {
    const auto terms = static_cast<int32_t>(c.size());
    QX_EXPECTS(terms >= 1 && terms <= highestRefined + 1 && out.values.size() == samples.n());
    if (!AreNumbers(samples.x) || !AreNumbers(samples.y) || !AreNumbers(samples.w) ||
        !AreNumbers(fixed.values))
        return ErrNonFiniteInput;
    ScaledSamples scaled;
    if (const ErrorCode failed = scaled.make(samples))
        return failed;
    RealVector value;
    IndexVector isFixed;
    PairVector found, one, two;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(value, terms), Sized(isFixed, terms), Sized(found.high, terms),
                        Sized(found.low, terms), Sized(one.high, terms), Sized(one.low, terms),
                        Sized(two.high, terms), Sized(two.low, terms)))
        return failed;
    Interval interval(samples.x);
    for (int32_t j = 0; j < terms; ++j) {
        isFixed[j] = 0;
        c[j] = value[j] = found.high[j] = found.low[j] = 0.0;
    }
    int32_t k = terms;
    for (int32_t i = 0; i < fixed.count(); ++i) {
        const int32_t j = fixed.orders[i];
        if (j < 0 || j >= terms)
            continue;
        k -= isFixed[j] == 0;
        isFixed[j] = 1;
        c[j] = fixed.values[i];
        value[j] = std::ldexp(c[j], interval.exponent * j - scaled.yExponent);
    }
    typedef PolynomialPairRows Rows;
    const auto basis = k == terms ? Rows::Basis::Chebyshev : Rows::Basis::Powers;
    if (samples.n() < k)
        return ErrPolynomialOrderTooHigh;
    if (samples.n() < 1)
        return ErrEmptyInput;
    if (basis == Rows::Basis::Chebyshev)
        interval.shift(samples.x);
    const Rows rows(basis, interval, samples.x, scaled, isFixed, value);
    const PairModel model = {rows, samples.n(), k, scaled.weights()};
    const PairVector free = {found.high.part(0, k), found.low.part(0, k)};
    const ErrorCode status = k == 0 ? 0 : SolveRefined(model, tolerance, free, {});
    if (status < 0)
        return status;
    if (const ErrorCode failed = Evaluate(model, free, scaled, out))
        return failed;
    if (basis == Rows::Basis::Chebyshev) {
        ToPowers(found, one, two);
        ToAbscissae(found, interval);
    }
    int32_t next = 0;
    for (int32_t j = 0; j < terms; ++j)
        if (isFixed[j] == 0)
            c[j] = std::ldexp(found.high[next++], scaled.yExponent - interval.exponent * j);
    return status;
}

} // namespace qx
