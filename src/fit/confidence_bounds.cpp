#include "fit/confidence_bounds.h"

#include "fit/sequential_qr.h"
#include "frame/constants.h"
#include "frame/extended.h"
#include "linalg/matrix.h"
#include "special/incomplete_beta.h"

#include <algorithm>
#include <cmath>
#include <cstring>

namespace qx {

namespace {

// A column that depends on those before it leaves a diagonal element of a few eps of its column.
bool HasFullRank(const SequentialQR &triangle, int32_t k) {
    const double tolerance = (16.0 + k) * kEpsilon;
    for (int32_t j = 0; j < k; ++j) {
        double largest = 0.0;
        for (int32_t i = 0; i <= j; ++i)
            largest = std::max(largest, std::fabs(triangle.row(i)[j]));
        if (!(std::fabs(triangle.row(j)[j]) > tolerance * largest))
            return false;
    }
    return true;
}

// lengths[i] = the length of row i of R^-1, whose elements solve v R = e_i'. v is work.
void RowLengthsOfInverse(const SequentialQR &triangle, RealVector v, RealVector lengths) {
    const auto k = static_cast<int32_t>(v.size());
    for (int32_t i = 0; i < k; ++i) {
        Fill(v.data(), k, 0.0);
        v[i] = 1.0;
        double squares = 0.0, scale = 0.0;
        for (int32_t j = i; j < k; ++j) {
            v[j] /= triangle.row(j)[j];
            const DBL *const row = triangle.row(j);
            for (int32_t l = j + 1; l < k; ++l)
                v[l] -= v[j] * row[l];
            scale = std::max(scale, std::fabs(v[j]));
        }
        for (int32_t j = i; j < k; ++j)
            squares += (v[j] / scale) * (v[j] / scale);
        lengths[i] = scale * std::sqrt(squares);
    }
}

// The columns of the block become those of J R^-1, and lengths[i] the length of its row i.
void RowLengthsThroughTriangle(const SequentialQR &triangle, int32_t k, const RowBlock &block,
                               RealVector lengths) {
    const int32_t count = block.count;
    Fill(lengths.data(), count, 0.0);
    for (int32_t j = 0; j < k; ++j) {
        DBL *const column = block.column(j);
        for (int32_t i = 0; i < j; ++i) {
            const double factor = triangle.row(i)[j];
            const DBL *const before = block.column(i);
            for (int32_t l = 0; l < count; ++l)
                column[l] -= factor * before[l];
        }
        const double diagonal = triangle.row(j)[j];
        for (int32_t l = 0; l < count; ++l) {
            column[l] /= diagonal;
            lengths[l] += column[l] * column[l];
        }
    }
    for (int32_t l = 0; l < count; ++l)
        lengths[l] = std::sqrt(lengths[l]);
}

// The root of the sum of |w| (y - f)^2 over dof, without intermediate overflow. NaN or infinite if
// a residual is.
double ResidualDeviation(const FittedModel &model, ConstRealVector f, int32_t dof) {
    const DBL *const w = model.linear.w;
    const auto weighted = [&](int32_t i) {
        const double residual = model.y[i] - f[i];
        return w == nullptr ? residual : std::sqrt(std::fabs(w[i])) * residual;
    };
    double largest = 0.0, all = 0.0;
    for (int32_t i = 0; i < model.linear.n; ++i) {
        const double size = std::fabs(weighted(i));
        largest = size > largest ? size : largest;
        all += size * 0.0;
    }
    if (all != 0.0 || largest == 0.0)
        return all; // NaN, or 0
    int exponent;
    std::frexp(largest, &exponent);
    double squares = 0.0;
    for (int32_t i = 0; i < model.linear.n; ++i) {
        const double part = std::ldexp(weighted(i), -exponent);
        squares += part * part;
    }
    return std::ldexp(std::sqrt(squares / dof), exponent);
}

} // namespace

// With x = dof / (dof + t^2), I_x(dof / 2, 1 / 2) is the probability beyond -t and t.
double TwoSidedT(double confidence, double dof) {
    const bool isInner = confidence < 0.5;
    const UnitPoint point =
        InverseIncompleteBeta(dof / 2, 0.5, isInner ? confidence : 1.0 - confidence, isInner);
    return SquareRoot(Extended{dof, 0.0} * (point.y / point.x)).high;
}

ErrorCode BoundsOfFit(const FittedModel &model, double confidence, BoundsOf what,
                      RealVector halfWidths, RealVector lower, RealVector upper) {
    const int32_t n = model.linear.n, k = model.linear.k;
    SequentialQR triangle;
    if (const ErrorCode failed = triangle.reduce(model.linear))
        return failed;
    if (!HasFullRank(triangle, k))
        return ErrSingularMatrix;

    // First the values of the model are written to `upper`, sqrt(j' (J' W J)^-1 j) to `lower`.
    RowStream stream;
    if (const ErrorCode failed = stream.open(model.linear))
        return failed;
    RowBlock block;
    while (stream.next(&block)) {
        std::memcpy(upper.data() + block.first, block.column(k),
                    static_cast<std::size_t>(block.count) * sizeof(DBL));
        RowLengthsThroughTriangle(triangle, k, block, lower.part(block.first, block.count));
    }
    const int32_t dof = model.used - k;
    const double deviation = ResidualDeviation(model, upper, dof);
    if (!std::isfinite(deviation) || CheckFinite(upper.data(), n) != 0)
        return ErrNonFiniteInput;

    const double width = TwoSidedT(confidence, dof) * deviation;
    for (int32_t i = 0; i < n; ++i) {
        const double length = lower[i], f = upper[i];
        const double half =
            width * (what == BoundsOf::Curve ? length : std::sqrt(length * length + 1.0));
        lower[i] = f - half;
        upper[i] = f + half;
    }
    if (halfWidths.isEmpty())
        return 0;
    Scratch<ElementType::DBL> work;
    if (const ErrorCode failed = work.allocate(k))
        return failed;
    RowLengthsOfInverse(triangle, {work.data(), k}, halfWidths);
    for (int32_t i = 0; i < k; ++i)
        halfWidths[i] *= width;
    return 0;
}

} // namespace qx
