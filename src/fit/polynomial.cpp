#include "fit/polynomial.h"

#include "fit/general.h"
#include "fit/residuals.h"
#include "frame/scratch.h"

#include <algorithm>

namespace qx {

namespace {

constexpr int32_t highestFitted = 25;

// Which terms are fitted, and the values of the others.
class Terms {
public:
    ErrorCode make(int32_t order, const FixedTerms &fixed) {
        if (const ErrorCode failed = kinds_.allocate(int64_t{order} + 1))
            return failed;
        for (int32_t j = 0; j <= order; ++j)
            kinds_[j] = isFree;
        for (int32_t i = 0; i < fixed.count(); ++i)
            if (0 <= fixed.orders[i] && fixed.orders[i] <= order)
                kinds_[fixed.orders[i]] = i;
        if (order > highestFitted) {
            isCapped_ = true;
            const int32_t limit = fixed.count() > 0 ? limitBeside(order) : highestFitted;
            for (int32_t j = limit + 1; j <= order; ++j)
                kinds_[j] = kinds_[j] == isFree ? int32_t{isZero} : kinds_[j];
        }
        for (int32_t j = 0; j <= order; ++j) {
            freeCount_ += kinds_[j] == isFree;
            last_ = kinds_[j] == isZero ? last_ : j;
        }
        return 0;
    }

    bool isFreeAt(int32_t j) const { return kinds_[j] == isFree; }
    bool isFixedAt(int32_t j) const { return kinds_[j] >= 0; }
    int32_t fixedAt(int32_t j) const { return kinds_[j]; }
    int32_t freeCount() const { return freeCount_; }
    int32_t last() const { return last_; } // all terms after it are zero
    bool isCapped() const { return isCapped_; }

private:
    enum Kind : int32_t { isFree = -1, isZero = -2 }; // else the index of its fixed value

    // kept: if fewer than two of the first 26 terms are free, the first two free terms of all are
    // fitted
    int32_t limitBeside(int32_t order) const {
        int32_t found = 0;
        for (int32_t j = 0; j <= order; ++j)
            if (kinds_[j] == isFree && ++found == 2)
                return std::max(highestFitted, j);
        return order;
    }

    Scratch<ElementType::I32> kinds_;
    int32_t freeCount_ = 0, last_ = 0;
    bool isCapped_ = false;
};

constexpr int32_t chunk = 64;

// The free powers of x, and y without the fixed terms.
class PolynomialRows {
public:
    PolynomialRows(const Terms &terms, const FitSamples &samples, const FixedTerms &fixed)
        : terms_(terms), samples_(samples), fixed_(fixed) {}

    void operator()(const RowBlock &block) const {
        for (int32_t from = 0; from < block.count; from += chunk)
            write(block, from, std::min(chunk, block.count - from));
    }

private:
    void write(const RowBlock &block, int32_t from, int32_t count) const {
        const std::ptrdiff_t first = block.first + from;
        const DBL *const x = samples_.x.data() + first, *const y = samples_.y.data() + first;
        double power[chunk], fixed[chunk];
        for (int32_t i = 0; i < count; ++i) {
            power[i] = 1.0;
            fixed[i] = 0.0;
        }
        int32_t column = 0;
        for (int32_t j = 0; j <= terms_.last(); ++j) {
            for (int32_t i = 0; j > 0 && i < count; ++i)
                power[i] *= x[i];
            if (terms_.isFreeAt(j)) {
                DBL *const to = block.column(column++) + from;
                for (int32_t i = 0; i < count; ++i)
                    to[i] = power[i];
            } else if (terms_.isFixedAt(j)) {
                const double value = fixed_.values[terms_.fixedAt(j)];
                for (int32_t i = 0; i < count; ++i)
                    fixed[i] += value * power[i];
            }
        }
        DBL *const target = block.column(column) + from;
        for (int32_t i = 0; i < count; ++i)
            target[i] = y[i] - fixed[i];
    }

    const Terms &terms_;
    const FitSamples &samples_;
    const FixedTerms &fixed_;
};

ErrorCode SolveFreeTerms(const LinearModel &model, int32_t algorithm, FitNorm norm,
                         const FitLimits &limits, DBL *c) {
    if (model.k == 0)
        return 0;
    return norm == leastSquares ? SolveLinearModel(model, algorithm, c, nullptr)
                                : SolveRobustly(model, norm, limits, c);
}

// The solution is in the first elements of c and is moved to its places from the last element on.
void PlaceTerms(const Terms &terms, const FixedTerms &fixed, RealVector c) {
    int32_t next = terms.freeCount();
    for (auto j = static_cast<int32_t>(c.size()) - 1; j >= 0; --j) {
        if (terms.isFreeAt(j))
            c[j] = c[--next];
        else
            c[j] = terms.isFixedAt(j) ? fixed.values[terms.fixedAt(j)] : 0.0;
    }
}

// Horner's rule from the highest term down, and the MSE.
void Evaluate(const FitSamples &samples, ConstRealVector c, const FitOutput &out) {
    SquaredResiduals squares(samples);
    double f[chunk];
    for (int32_t from = 0; from < samples.n(); from += chunk) {
        const int32_t count = std::min(chunk, samples.n() - from);
        const DBL *const x = samples.x.data() + from;
        for (int32_t i = 0; i < count; ++i)
            f[i] = c[c.size() - 1];
        for (std::ptrdiff_t j = c.size() - 2; j >= 0; --j)
            for (int32_t i = 0; i < count; ++i)
                f[i] = f[i] * x[i] + c[j];
        for (int32_t i = 0; i < count; ++i) {
            squares.add(from + i, f[i]);
            out.values[from + i] = f[i];
        }
    }
    if (out.mse != nullptr)
        *out.mse = squares.mean();
}

} // namespace

ErrorCode CheckPolynomialOrder(int32_t n, int32_t order, int32_t fixedCount) {
    if (order < 0)
        return ErrPolynomialOrderNegative;
    return n <= order - fixedCount ? ErrPolynomialOrderTooHigh : 0;
}

ErrorCode FitPolynomial(const FitSamples &samples, const FixedTerms &fixed, int32_t algorithm,
                        RealVector c, const FitOutput &out, FitNorm norm, const FitLimits &limits) {
    const int32_t n = samples.n();
    QX_EXPECTS(CheckPolynomialOrder(n, static_cast<int32_t>(c.size()) - 1, fixed.count()) == 0);
    Terms terms;
    if (const ErrorCode failed = terms.make(static_cast<int32_t>(c.size()) - 1, fixed))
        return failed;
    const PolynomialRows rows(terms, samples, fixed);
    const LinearModel model = {rows, n, terms.freeCount(), samples.weights()};
    if (const ErrorCode failed = SolveFreeTerms(model, algorithm, norm, limits, c.data()))
        return failed;
    PlaceTerms(terms, fixed, c);
    if (out.mse != nullptr && n < 1)
        return ErrEmptyInput;
    if (!out.values.isEmpty())
        Evaluate(samples, c.part(0, terms.last() + 1), out);
    return terms.isCapped() ? WarnPolynomialOrderCapped : 0;
}

} // namespace qx
