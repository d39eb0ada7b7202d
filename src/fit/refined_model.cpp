#include "fit/refined_model.h"

#include "fit/sequential_qr.h"
#include "linalg/factorisations/svd.h"
#include "linalg/matrix.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace qx {
namespace {

constexpr double eps = std::numeric_limits<double>::epsilon();
constexpr int32_t sums = 8, chunk = 64;

// Residuals of up to `chunk` rows; the low parts are accumulated without rounding them into the
// high parts.
struct Residuals {
    double high[chunk], low[chunk];

    void load(const PairBlock &block, int32_t from, int32_t count, int32_t k) {
        const DBL *const y = block.high.column(k) + from;
        for (int32_t i = 0; i < count; ++i)
            high[i] = y[i];
        for (int32_t i = 0; i < count; ++i)
            low[i] = block.low == nullptr ? 0.0 : block.low[column(block, k) + from + i];
    }
    template <bool withLow>
    void subtract(const PairBlock &block, int32_t j, int32_t from, int32_t count, Pair c) {
        const DBL *const h = block.high.column(j) + from;
        const DBL *const hLow = withLow ? block.low + column(block, j) + from : h;
        for (int32_t i = 0; i < count; ++i) {
            const double value = h[i];
            const Pair product = ExactProduct(value, c.hi);
            const Pair sum = ExactSum(high[i], -product.hi);
            double rest = value * c.lo;
            if constexpr (withLow)
                rest += hLow[i] * c.hi;
            high[i] = sum.hi;
            low[i] += sum.lo - (product.lo + rest);
        }
    }
    void normalise(int32_t count) {
        for (int32_t i = 0; i < count; ++i) {
            const Pair sum = ExactSum(high[i], low[i]);
            high[i] = sum.hi;
            low[i] = sum.lo;
        }
    }
    void weigh(const DBL *w, int32_t count) {
        for (int32_t i = 0; i < count; ++i) {
            const Pair product = ExactProduct(high[i], w[i]);
            high[i] = product.hi;
            low[i] = product.lo + low[i] * w[i];
        }
    }
    static std::ptrdiff_t column(const PairBlock &block, int32_t j) {
        return std::ptrdiff_t{j} * block.high.count;
    }
};

// The products of the columns with the residuals: row i of a block goes to partial sum i mod 8.
class Gradient {
public:
    ErrorCode make(int32_t k) { return memory_.take(Sized(high_, k, sums), Sized(low_, k, sums)); }
    void clear() {
        Fill(high_.data(), high_.count(), 0.0);
        Fill(low_.data(), low_.count(), 0.0);
    }
    template <bool withLow>
    void add(const PairBlock &block, int32_t j, int32_t from, int32_t count, const Residuals &r) {
        const DBL *const h = block.high.column(j) + from;
        const DBL *const hLow = withLow ? block.low + Residuals::column(block, j) + from : h;
        double high[sums], low[sums];
        for (int32_t s = 0; s < sums; ++s) {
            high[s] = high_(j, s);
            low[s] = low_(j, s);
        }
        const auto step = [&](int32_t i, int32_t s) {
            const Pair product = ExactProduct(h[i], r.high[i]);
            const Pair sum = ExactSum(high[s], product.hi);
            double rest = h[i] * r.low[i];
            if constexpr (withLow)
                rest += hLow[i] * r.high[i];
            high[s] = sum.hi;
            low[s] += sum.lo + (product.lo + rest);
        };
        int32_t i = 0;
        for (; i + sums <= count; i += sums)
            for (int32_t s = 0; s < sums; ++s)
                step(i + s, s);
        for (int32_t s = 0; i + s < count; ++s)
            step(i + s, s);
        for (int32_t s = 0; s < sums; ++s) {
            high_(j, s) = high[s];
            low_(j, s) = low[s];
        }
    }
    double at(int32_t j) const {
        Pair sum = {0.0, 0.0};
        for (int32_t s = 0; s < sums; ++s)
            sum = PairSum(sum, QuickSum(high_(j, s), low_(j, s)));
        return sum.hi;
    }

private:
    ScratchParts memory_;
    RealMatrix high_, low_;
};

// Passes over the rows with the residuals of c.
class ResidualPass {
public:
    explicit ResidualPass(const PairModel &model) : model_(model) {}

    // visit(block, from, count, residuals) for each chunk of rows.
    template <class Visit>
    ErrorCode run(const PairVector &c, const Visit &visit) {
        const int32_t columns = model_.k + 1;
        const int32_t capacity =
            std::min(model_.n, std::max(chunk, 3072 / columns / chunk * chunk));
        Scratch<ElementType::DBL> high, low;
        if (const ErrorCode failed = high.allocate(int64_t{capacity} * columns))
            return failed;
        if (model_.rows.hasLow())
            if (const ErrorCode failed = low.allocate(int64_t{capacity} * columns))
                return failed;
        Residuals r;
        for (int32_t first = 0; first < model_.n; first += std::min(capacity, model_.n - first)) {
            const int32_t rows = std::min(capacity, model_.n - first);
            const PairBlock block = {{first, rows, high.data()},
                                     model_.rows.hasLow() ? low.data() : nullptr};
            model_.rows.write(block);
            for (int32_t from = 0; from < rows; from += chunk) {
                const int32_t count = std::min(chunk, rows - from);
                r.load(block, from, count, model_.k);
                for (int32_t j = 0; j < model_.k; ++j) {
                    if (block.low != nullptr)
                        r.subtract<true>(block, j, from, count, c.at(j));
                    else
                        r.subtract<false>(block, j, from, count, c.at(j));
                }
                r.normalise(count);
                visit(block, from, count, r);
            }
        }
        return 0;
    }

private:
    const PairModel &model_;
};

// The singular values and right vectors of the triangle, and U^T y.
struct Values {
    ErrorCode make(const PairModel &model, double tolerance) {
        const int32_t k = model.k;
        const auto writeRows = [&](const RowBlock &block) { model.rows.write({block, nullptr}); };
        SequentialQR triangle;
        if (const ErrorCode failed = triangle.reduce({writeRows, model.n, k, model.w}))
            return failed;
        ScratchParts working;
        RealMatrix r, u;
        if (const ErrorCode failed = working.take(Sized(r, k, k), Sized(u, k, k)))
            return failed;
        if (const ErrorCode failed = memory.take(Sized(v, k, k), Sized(s, k), Sized(along, k)))
            return failed;
        for (int32_t i = 0; i < k; ++i)
            for (int32_t j = 0; j < k; ++j)
                r(i, j) = j < i ? 0.0 : triangle.row(i)[j];
        if (const ErrorCode failed = SVDecompose<ElementType::DBL>(r, u, s, v, SVDScaling::Always))
            return failed;
        const double cut = (tolerance >= 0.0 ? tolerance : eps) * model.n * s[0];
        while (rank < k && s[rank] > cut)
            ++rank;
        for (int32_t j = 0; j < k; ++j) {
            along[j] = 0.0;
            for (int32_t i = 0; i < k; ++i)
                along[j] += u(i, j) * triangle.target(i);
        }
        return 0;
    }

    // x = V (along / s^power) over the values that count.
    void combine(int power, RealVector x) const {
        Fill(x.data(), x.size(), 0.0);
        for (int32_t j = 0; j < rank; ++j) {
            const double share = power == 1 ? along[j] / s[j] : along[j] / s[j] / s[j];
            for (std::ptrdiff_t i = 0; i < x.size(); ++i)
                x[i] += v(i, j) * share;
        }
    }
    void project(const Gradient &gradient) const {
        const auto k = static_cast<int32_t>(along.size());
        Fill(along.data(), k, 0.0);
        for (int32_t i = 0; i < k; ++i) {
            const double g = gradient.at(i);
            for (int32_t j = 0; j < rank; ++j)
                along[j] += v(i, j) * g;
        }
    }
    void writeCovariance(const RealMatrix &out) const {
        const auto k = static_cast<int32_t>(along.size());
        for (int32_t i = 0; i < k; ++i)
            for (int32_t l = 0; l <= i; ++l) {
                double sum = 0.0;
                for (int32_t j = rank - 1; j >= 0; --j)
                    sum += v(i, j) / s[j] * (v(l, j) / s[j]);
                out(i, l) = out(l, i) = sum;
            }
    }

    ScratchParts memory;
    RealMatrix v;
    RealVector s, along;
    int32_t rank = 0;
};

double Largest(ConstRealVector x) {
    double largest = 0.0;
    for (std::ptrdiff_t j = 0; j < x.size(); ++j)
        largest = std::max(largest, std::fabs(x[j]));
    return largest;
}

// Whether a step that is `rate` times this one changes no significant digit of a rounded
// coefficient, or of a pair if pairs are wanted.
bool IsSettled(const PairVector &c, ConstRealVector step, double rate, bool inPairs) {
    const double least = Largest(c.high) * (inPairs ? 0x1p-106 : 0x1p-90);
    const double relative = inPairs ? 0.0 : 0x1p-57;
    for (std::ptrdiff_t j = 0; j < step.size(); ++j)
        if (std::fabs(step[j]) * rate > std::max(relative * std::fabs(c.high[j]), least))
            return false;
    return true;
}

ErrorCode Improve(const PairModel &model, const Values &values, const PairVector &c,
                  RealVector step) {
    constexpr int32_t mostSteps = 8;
    Gradient gradient;
    if (const ErrorCode failed = gradient.make(model.k))
        return failed;
    double last = Largest(c.high);
    for (int32_t round = 0; round < mostSteps; ++round) {
        gradient.clear();
        const ErrorCode failed = ResidualPass(model).run(
            c, [&](const PairBlock &block, int32_t from, int32_t count, Residuals &r) {
                if (model.w != nullptr)
                    r.weigh(model.w + block.high.first + from, count);
                for (int32_t j = 0; j < model.k; ++j) {
                    if (block.low != nullptr)
                        gradient.add<true>(block, j, from, count, r);
                    else
                        gradient.add<false>(block, j, from, count, r);
                }
            });
        if (failed != 0)
            return failed;
        values.project(gradient);
        values.combine(2, step);
        const double size = Largest(step);
        // Steps that do not decrease are rounding errors, or the condition number is above 1 / eps.
        if (!(size <= 0.5 * last))
            break;
        for (int32_t j = 0; j < model.k; ++j)
            c.set(j, PairSum(c.at(j), {step[j], 0.0}));
        if (size == 0.0 || IsSettled(c, step, size / last, model.rows.hasLow()))
            break;
        last = size;
    }
    return 0;
}

} // namespace

ErrorCode SolveRefined(const PairModel &model, double tolerance, const PairVector &c,
                       const RealMatrix &covariance) {
    Values values;
    RealVector step;
    ScratchParts memory;
    if (const ErrorCode failed = values.make(model, tolerance))
        return failed;
    if (const ErrorCode failed = memory.take(Sized(step, model.k)))
        return failed;
    values.combine(1, c.high);
    Fill(c.low.data(), c.low.size(), 0.0);
    if (const ErrorCode failed = Improve(model, values, c, step))
        return failed;
    if (!covariance.isEmpty())
        values.writeCovariance(covariance);
    return values.rank < model.k ? WarnRankDeficient : 0;
}

ErrorCode RefinedResiduals(const PairModel &model, const PairVector &c, RealVector residuals,
                           double *squares) {
    *squares = 0.0;
    return ResidualPass(model).run(
        c, [&](const PairBlock &block, int32_t from, int32_t count, const Residuals &r) {
            for (int32_t i = 0; i < count; ++i) {
                const int32_t at = block.high.first + from + i;
                residuals[at] = r.high[i];
                *squares += (model.w == nullptr ? 1.0 : model.w[at]) * (r.high[i] * r.high[i]);
            }
        });
}

} // namespace qx
