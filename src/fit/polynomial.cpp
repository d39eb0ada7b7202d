#include "fit/polynomial.h"

#include "fit/general.h"
#include "fit/residuals.h"
#include "frame/scratch.h"

#include <algorithm>

namespace qx {

namespace {

constexpr int32_t highestFitted = 25;

// Which terms are fitted, and what the others are.
class Terms {
public:
    ErrorCode make(int32_t order, const I32 *fixedOrders, int32_t fixedCount) {
        if (const ErrorCode failed = kinds_.allocate(int64_t{order} + 1))
            return failed;
        for (int32_t j = 0; j <= order; ++j)
            kinds_[j] = isFree;
        for (int32_t i = 0; i < fixedCount; ++i)
            if (0 <= fixedOrders[i] && fixedOrders[i] <= order)
                kinds_[fixedOrders[i]] = i;
        if (order > highestFitted) {
            isCapped_ = true;
            const int32_t limit = fixedCount > 0 ? limitBeside(order) : highestFitted;
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
    int32_t last() const { return last_; } // behind it all are zero
    bool isCapped() const { return isCapped_; }

private:
    enum Kind : int32_t { isFree = -1, isZero = -2 }; // else fixed, with the index of its value

    // kept: where the first 26 terms leave only one free, the second one of all is fitted, too
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
    PolynomialRows(const Terms &terms, const DBL *x, const DBL *y, const DBL *fixedValues)
        : terms_(terms), x_(x), y_(y), fixedValues_(fixedValues) {}

    void operator()(const RowBlock &block) const {
        for (int32_t from = 0; from < block.count; from += chunk)
            write(block, from, std::min(chunk, block.count - from));
    }

private:
    void write(const RowBlock &block, int32_t from, int32_t count) const {
        const DBL *const x = x_ + block.first + from, *const y = y_ + block.first + from;
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
                const double value = fixedValues_[terms_.fixedAt(j)];
                for (int32_t i = 0; i < count; ++i)
                    fixed[i] += value * power[i];
            }
        }
        DBL *const target = block.column(column) + from;
        for (int32_t i = 0; i < count; ++i)
            target[i] = y[i] - fixed[i];
    }

    const Terms &terms_;
    const DBL *x_, *y_, *fixedValues_;
};

ErrorCode SolveFreeTerms(const LinearModel &model, int32_t algorithm, FitNorm norm,
                         RobustLimits limits, DBL *c) {
    if (model.k == 0)
        return 0;
    return norm == leastSquares ? SolveLinearModel(model, algorithm, c, nullptr)
                                : SolveRobustly(model, norm, limits, c);
}

// The solution stands in the first elements of c and is spread out from its end.
void PlaceTerms(const Terms &terms, int32_t order, const DBL *fixedValues, DBL *c) {
    int32_t next = terms.freeCount();
    for (int32_t j = order; j >= 0; --j) {
        if (terms.isFreeAt(j))
            c[j] = c[--next];
        else
            c[j] = terms.isFixedAt(j) ? fixedValues[terms.fixedAt(j)] : 0.0;
    }
}

// Horner's rule from the highest term down, and the MSE.
void Evaluate(const DBL *x, const DBL *y, const DBL *w, int32_t n, const DBL *c, int32_t order,
              DBL *fit, DBL *mse) {
    SquaredResiduals squares(w);
    double f[chunk];
    for (int32_t from = 0; from < n; from += chunk) {
        const int32_t count = std::min(chunk, n - from);
        for (int32_t i = 0; i < count; ++i)
            f[i] = c[order];
        for (int32_t j = order - 1; j >= 0; --j)
            for (int32_t i = 0; i < count; ++i)
                f[i] = f[i] * x[from + i] + c[j];
        for (int32_t i = 0; i < count; ++i) {
            squares.add(from + i, y[from + i], f[i]);
            fit[from + i] = f[i];
        }
    }
    if (mse != nullptr)
        *mse = squares.mean(n);
}

} // namespace

ErrorCode CheckPolynomialOrder(int32_t n, int32_t order, int32_t fixedCount) {
    if (fixedCount < 0 || order < 0)
        return ErrPolynomialOrderNegative;
    return n <= order - fixedCount ? ErrPolynomialOrderTooHigh : 0;
}

ErrorCode FitPolynomial(const DBL *x, const DBL *y, const DBL *w, int32_t n, int32_t order,
                        int32_t algorithm, const I32 *fixedOrders, const DBL *fixedValues,
                        int32_t fixedCount, DBL *fit, DBL *coefficients, DBL *mse, FitNorm norm,
                        RobustLimits limits) {
    if (const ErrorCode failed = CheckPolynomialOrder(n, order, fixedCount))
        return failed;
    Terms terms;
    if (const ErrorCode failed = terms.make(order, fixedOrders, fixedCount))
        return failed;
    const PolynomialRows rows(terms, x, y, fixedValues);
    if (const ErrorCode failed =
            SolveFreeTerms({rows, n, terms.freeCount(), w}, algorithm, norm, limits, coefficients))
        return failed;
    PlaceTerms(terms, order, fixedValues, coefficients);
    if (mse != nullptr && n < 1)
        return ErrEmptyInput;
    if (fit != nullptr)
        Evaluate(x, y, w, n, coefficients, terms.last(), fit, mse);
    return terms.isCapped() ? WarnPolynomialOrderCapped : 0;
}

} // namespace qx
