#include "stats/factorial_anova.h"

#include "frame/constants.h"
#include "frame/extended.h"
#include "frame/scratch.h"
#include "special/incomplete_beta.h"
#include "stats/levels.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr int maxSubsets = 1 << maxFactors;

Extended Whole(double x) { return {x, 0.0}; }
Extended Square(Extended x) { return x * x; }

// A subset of the factors is a set of bits. Its cells are the combinations of its factors' levels,
// with the last factor varying fastest; the tables of all subsets are stored one after the other.
class Layout {
public:
    explicit Layout(const FactorialDesign &design) : factors_(design.factors) {
        for (int i = 0; i < factors_; ++i)
            levels_[i] = design.factor[i].levels;
        for (int subset = 0; subset < subsets(); ++subset) {
            cells_[subset] = 1;
            degrees_[subset] = 1;
            for (int i = 0; i < factors_; ++i)
                if (has(subset, i)) {
                    cells_[subset] *= levels_[i];
                    degrees_[subset] *= levels_[i] - 1;
                }
            start_[subset] = subset == 0 ? 0 : start_[subset - 1] + cells_[subset - 1];
        }
    }

    static bool has(int subset, int factor) { return (subset >> factor & 1) != 0; }
    int factors() const { return factors_; }
    int subsets() const { return 1 << factors_; }
    int all() const { return subsets() - 1; }
    int64_t cells(int subset) const { return cells_[subset]; }
    int64_t cells() const { return cells_[all()]; }
    int64_t degrees(int subset) const { return degrees_[subset]; }
    int64_t size() const { return start_[all()] + cells_[all()]; } // of all tables together

    // The index of the cell with these levels in the table of `subset`.
    std::ptrdiff_t place(int subset, const int32_t *level) const {
        int64_t cell = 0;
        for (int i = 0; i < factors_; ++i)
            if (has(subset, i))
                cell = cell * levels_[i] + level[i];
        return static_cast<std::ptrdiff_t>(start_[subset] + cell);
    }
    std::ptrdiff_t start(int subset) const { return static_cast<std::ptrdiff_t>(start_[subset]); }

    // visit(levels) for each cell of the subset, in the order of its table.
    template <class Visit>
    void forEachCell(int subset, Visit visit) const {
        int32_t level[maxFactors] = {};
        for (int64_t cell = 0; cell < cells_[subset]; ++cell) {
            visit(static_cast<const int32_t *>(level));
            for (int i = factors_ - 1; i >= 0; --i) {
                if (!has(subset, i))
                    continue;
                if (++level[i] < levels_[i])
                    break;
                level[i] = 0;
            }
        }
    }

private:
    int factors_;
    int32_t levels_[maxFactors] = {};
    int64_t cells_[maxSubsets] = {}, degrees_[maxSubsets] = {}, start_[maxSubsets] = {};
};

// Scratch memory starts at any byte, so the numbers are stored as pairs of elements.
class ExtendedTable {
public:
    ErrorCode allocate(int64_t count) {
        const ErrorCode failed = elements_.allocate(2 * count);
        if (failed == 0)
            Fill(elements_.data(), static_cast<std::ptrdiff_t>(2 * count), 0.0);
        return failed;
    }
    Extended at(std::ptrdiff_t i) const { return {elements_[2 * i], elements_[2 * i + 1]}; }
    void put(std::ptrdiff_t i, Extended value) {
        elements_[2 * i] = value.high;
        elements_[2 * i + 1] = value.low;
    }
    void add(std::ptrdiff_t i, Extended value) { put(i, at(i) + value); }

private:
    Scratch<ElementType::DBL> elements_;
};

// Finds the cell of each observation. ErrAnovaFactorEmpty, ErrAnovaCellCount, ErrOutOfMemory.
ErrorCode AssignCells(const FactorialDesign &design, const Layout &layout,
                      Scratch<ElementType::I32> &cellOf) {
    if (const ErrorCode failed = cellOf.allocate(design.n()))
        return failed;
    for (int32_t k = 0; k < design.n(); ++k)
        cellOf[k] = 0;
    for (int i = 0; i < design.factors; ++i) {
        const Factor &factor = design.factor[i];
        Levels levels;
        if (const ErrorCode failed = levels.reserve(factor.levels))
            return failed;
        for (int32_t k = 0; k < design.n(); ++k) {
            const int32_t place = levels.placeOf(factor.labels[k]);
            if (place < 0)
                return ErrAnovaFactorEmpty;
            cellOf[k] = cellOf[k] * factor.levels + place;
        }
        if (levels.count() < factor.levels)
            return ErrAnovaFactorEmpty;
    }

    Scratch<ElementType::I32> counts;
    if (const ErrorCode failed = counts.allocate(layout.cells()))
        return failed;
    const auto cells = static_cast<std::ptrdiff_t>(layout.cells());
    for (std::ptrdiff_t cell = 0; cell < cells; ++cell)
        counts[cell] = 0;
    for (int32_t k = 0; k < design.n(); ++k)
        ++counts[cellOf[k]];
    for (std::ptrdiff_t cell = 0; cell < cells; ++cell)
        if (counts[cell] != design.observations)
            return ErrAnovaCellCount;
    return 0;
}

// The data times a power of 2 with which squares of differences neither overflow nor underflow.
class ScaledData {
public:
    explicit ScaledData(const FactorialDesign &design) : y_(design.y) {
        double least = y_[0];
        double largest = y_[0];
        for (int32_t k = 1; k < design.n(); ++k) {
            const double value = y_[k]; // its address is aligned, unlike that of an element
            least = std::min(least, value);
            largest = std::max(largest, value);
        }
        constexpr int limit = 1000;
        int exponent = limit;
        if (std::isfinite(largest - least))
            std::frexp(largest - least, &exponent);
        scale_ = std::ldexp(1.0, -std::clamp(exponent, -limit, limit));
        spread_ = largest * scale_ - least * scale_;
    }
    double at(std::ptrdiff_t k) const { return y_[k] * scale_; }
    // The difference from the first observation, exact.
    Extended shifted(double scaled) const { return ExactSum(scaled, -at(0)); }
    double spread() const { return spread_; } // largest minus smallest
    double unscaledSquare(double x) const { return x / scale_ / scale_; }

private:
    ConstRealVector y_;
    double scale_ = 1.0;
    double spread_ = 0.0;
};

struct SumsOfSquares {
    Extended effect[maxSubsets]; // indexed by the subset of the factors
    Extended error;
    Extended total;
};

// The mean of each cell: that of the differences from an observation of the cell, which is exactly
// 0 if all are equal. ErrOutOfMemory.
ErrorCode CellMeans(const FactorialDesign &design, const Layout &layout, const ScaledData &data,
                    const Scratch<ElementType::I32> &cellOf, ExtendedTable &means) {
    Scratch<ElementType::DBL> first;
    if (const ErrorCode failed = first.allocate(layout.cells()))
        return failed;
    for (int32_t k = design.n() - 1; k >= 0; --k)
        first[cellOf[k]] = data.at(k);
    const std::ptrdiff_t start = layout.start(layout.all());
    for (int32_t k = 0; k < design.n(); ++k)
        means.add(start + cellOf[k], ExactSum(data.at(k), -first[cellOf[k]]));
    const auto cells = static_cast<std::ptrdiff_t>(layout.cells());
    for (std::ptrdiff_t cell = 0; cell < cells; ++cell)
        means.put(start + cell,
                  data.shifted(first[cell]) + means.at(start + cell) / Whole(design.observations));
    return 0;
}

// The means for all other subsets, from those of the cells.
void MarginalMeans(const Layout &layout, ExtendedTable &means) {
    const int all = layout.all();
    layout.forEachCell(all, [&](const int32_t *level) {
        const Extended mean = means.at(layout.place(all, level));
        for (int subset = 0; subset < all; ++subset)
            means.add(layout.place(subset, level), mean);
    });
    for (int subset = 0; subset < all; ++subset) {
        const Extended count = Whole(static_cast<double>(layout.cells() / layout.cells(subset)));
        const std::ptrdiff_t end = layout.start(subset + 1);
        for (std::ptrdiff_t i = layout.start(subset); i < end; ++i)
            means.put(i, means.at(i) / count);
    }
}

// The sum of squares of the effects of a subset of factors. An effect, which is a mean minus all
// effects of lower order, is an alternating sum of means.
Extended EffectSquares(const Layout &layout, const ExtendedTable &means, int subset) {
    Extended sum = Whole(0.0);
    layout.forEachCell(subset, [&](const int32_t *level) {
        Extended effect = Whole(0.0);
        for (int part = 0; part <= subset; ++part) {
            if ((part & ~subset) != 0)
                continue;
            bool isAdded = true;
            for (int i = 0; i < layout.factors(); ++i)
                isAdded = isAdded != Layout::has(subset ^ part, i);
            const Extended mean = means.at(layout.place(part, level));
            effect = isAdded ? effect + mean : effect - mean;
        }
        sum = sum + Square(effect);
    });
    return sum;
}

// 0 if deviations with this root mean square are rounding errors of twice the precision.
Extended WithoutRounding(Extended sum, int32_t n, double spread) {
    const double deviation = n * 0x1p-100 * spread;
    return sum.high <= n * (deviation * deviation) ? Whole(0.0) : sum;
}

// ErrOutOfMemory.
ErrorCode SquareDeviations(const FactorialDesign &design, const Layout &layout,
                           const ScaledData &data, const Scratch<ElementType::I32> &cellOf,
                           SumsOfSquares *sums) {
    ExtendedTable means;
    if (const ErrorCode failed = means.allocate(layout.size()))
        return failed;
    if (const ErrorCode failed = CellMeans(design, layout, data, cellOf, means))
        return failed;
    MarginalMeans(layout, means);

    const auto rounded = [&](Extended sum) {
        return WithoutRounding(sum, design.n(), data.spread());
    };
    for (int subset = 1; subset < layout.subsets(); ++subset) {
        const auto share = static_cast<double>(design.n() / layout.cells(subset));
        sums->effect[subset] = rounded(EffectSquares(layout, means, subset) * Whole(share));
    }
    const Extended grandMean = means.at(0);
    const std::ptrdiff_t start = layout.start(layout.all());
    sums->error = sums->total = Whole(0.0);
    for (int32_t k = 0; k < design.n(); ++k) {
        const Extended value = data.shifted(data.at(k));
        sums->error = sums->error + Square(value - means.at(start + cellOf[k]));
        sums->total = sums->total + Square(value - grandMean);
    }
    sums->error = rounded(sums->error);
    return 0;
}

struct MeanSquare {
    Extended value;
    double degrees;
};

MeanSquare MeanOf(Extended sum, int64_t degrees) {
    const auto count = static_cast<double>(degrees);
    return {sum / Whole(count), count};
}

// a + b - c with the degrees of freedom of F. E. Satterthwaite; 0 if only rounding errors are left,
// or if it is negative.
MeanSquare Combined(const MeanSquare &a, const MeanSquare &b, const MeanSquare &c) {
    const Extended value = a.value + b.value - c.value;
    if (!(value.high > 0x1p-60 * (a.value.high + b.value.high + c.value.high)))
        return {Whole(0.0), 0.0};
    double reciprocal = 0.0;
    for (const MeanSquare &part : {a, b, c}) {
        const double ratio = part.value.high / value.high;
        reciprocal += ratio * ratio / part.degrees;
    }
    return {value, 1.0 / reciprocal};
}

// The mean squares of a table, and the denominators of their tests.
struct MeanSquares {
    MeanSquare effect[maxSubsets];
    MeanSquare error;
    int factors;
    int random; // the random factors as a subset

    // The mean square whose expectation is that of the effect's mean square in the absence of the
    // effect. In the unrestricted model it consists of the error and a component for each larger
    // subset with a random factor. It is determined by the number of such subsets with one factor
    // more: none (all factors are fixed), one, or two. With two, both contain the component of the
    // whole set.
    MeanSquare denominator(int subset) const {
        int larger[2] = {};
        int count = 0;
        for (int i = 0; i < factors; ++i) {
            const int with = subset | 1 << i;
            if (with != subset && (with & random) != 0)
                larger[count++] = with;
        }
        if (count == 0)
            return error;
        if (count == 1)
            return effect[larger[0]];
        return Combined(effect[larger[0]], effect[larger[1]], effect[larger[0] | larger[1]]);
    }
};

// The upper tail of the F distribution.
double UpperTail(double f, double numerator, double denominator) {
    const UnitPoint point = UnitPoint::Share(Whole(denominator), ExactProduct(numerator, f));
    return IncompleteBeta(denominator / 2, numerator / 2, point).lower;
}

double CriticalValue(double significance, double numerator, double denominator) {
    if (significance == 0.0)
        return kInfinity;
    if (significance == 1.0)
        return 0.0;
    const UnitPoint point =
        InverseIncompleteBeta(denominator / 2, numerator / 2, significance, false);
    return point.y.high / point.x.high * (denominator / numerator);
}

constexpr AnovaSource noSource = {kNaN, 0.0, kNaN, kNaN, kNaN, kNaN, kNaN};

// ErrAnovaDesign.
ErrorCode Test(const MeanSquare &effect, const MeanSquare &denominator, const double *significance,
               AnovaSource *source) {
    if (!(denominator.value.high > 0.0))
        return ErrAnovaDesign;
    source->f = (effect.value / denominator.value).high;
    source->p = UpperTail(source->f, effect.degrees, denominator.degrees);
    source->denominatorDegrees = denominator.degrees;
    if (significance != nullptr)
        source->critical = CriticalValue(*significance, effect.degrees, denominator.degrees);
    return 0;
}

} // namespace

ErrorCode FactorialAnova(const FactorialDesign &design, const double *significance,
                         FactorialTable *table) {
    const Layout layout(design);
    Scratch<ElementType::I32> cellOf;
    if (const ErrorCode failed = AssignCells(design, layout, cellOf))
        return failed;
    for (int32_t k = 0; k < design.n(); ++k)
        if (!std::isfinite(design.y[k]))
            return ErrNaNInData;
    if (significance != nullptr && !(*significance >= 0.0 && *significance <= 1.0))
        return ErrBadSignificance;

    const ScaledData data(design);
    SumsOfSquares sums;
    if (const ErrorCode failed = SquareDeviations(design, layout, data, cellOf, &sums))
        return failed;

    // With one observation per cell the highest interaction serves as the error.
    const bool isReplicated = design.observations > 1;
    const int tested = isReplicated ? layout.subsets() : layout.all();
    MeanSquares squares = {};
    squares.factors = design.factors;
    for (int i = 0; i < design.factors; ++i)
        squares.random |= (design.factor[i].isRandom ? 1 : 0) << i;
    for (int subset = 1; subset < tested; ++subset)
        squares.effect[subset] = MeanOf(sums.effect[subset], layout.degrees(subset));
    if (!isReplicated)
        sums.error = sums.effect[layout.all()];
    squares.error = MeanOf(sums.error, isReplicated ? design.n() - layout.cells()
                                                    : layout.degrees(layout.all()));

    const auto described = [&](Extended sum, double degrees) {
        AnovaSource source = noSource;
        source.sumOfSquares = data.unscaledSquare(sum.high);
        source.degrees = degrees;
        return source;
    };
    // Main effects first, then the interactions of two factors.
    static constexpr int orderOfTwo[] = {1, 2, 3};
    static constexpr int orderOfThree[] = {1, 2, 4, 3, 5, 6, 7};
    const int *order = design.factors == 2 ? orderOfTwo : orderOfThree;
    int at = 0;
    for (; at < layout.all(); ++at) {
        const int subset = order[at];
        AnovaSource &source = table->source[at];
        source = noSource;
        if (subset >= tested)
            continue;
        const MeanSquare &effect = squares.effect[subset];
        source = described(sums.effect[subset], effect.degrees);
        source.meanSquare = data.unscaledSquare(effect.value.high);
        if (const ErrorCode failed =
                Test(effect, squares.denominator(subset), significance, &source))
            return failed;
    }
    table->source[at] = described(sums.error, squares.error.degrees);
    table->source[at++].meanSquare = data.unscaledSquare(squares.error.value.high);
    table->source[at++] = described(sums.total, design.n() - 1.0);
    table->sources = at;
    return 0;
}

} // namespace qx
