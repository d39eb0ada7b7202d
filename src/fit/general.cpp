#include "fit/general.h"

#include "fit/residuals.h"
#include "fit/sequential_qr.h"
#include "frame/constants.h"
#include "frame/scratch.h"
#include "linalg/factorisations/range.h"
#include "linalg/factorisations/svd.h"
#include "linalg/matrix.h"
#include "linalg/products/products.h"
#include "linalg/systems/least_squares.h"
#include "linalg/systems/lu.h"
#include "linalg/systems/triangular.h"

#include <cmath>
#include <cstring>

namespace qx {

namespace {

// Copies R without the target, row by row.
void CopyTriangle(const SequentialQR &triangle, int32_t k, DBL *r) {
    for (int32_t i = 0; i < k; ++i)
        for (int32_t j = 0; j < k; ++j)
            r[std::ptrdiff_t{i} * k + j] = j < i ? 0.0 : triangle.row(i)[j];
}

// a b^T of two square matrices.
ErrorCode TimesTranspose(const DBL *a, const DBL *b, int32_t k, DBL *out) {
    Scratch<ElementType::DBL> transposed;
    if (const ErrorCode failed = transposed.allocate(int64_t{k} * k))
        return failed;
    const RealMatrix bTransposed(transposed.data(), k, k);
    CopyTransposed<ElementType::DBL>({b, k, k}, bTransposed);
    OrderedProduct<ElementType::DBL>({a, k, k}, bTransposed, {out, k, k});
    return 0;
}

// Brings the columns of R to a length near 1 by powers of two, and returns their exponents.
// Different lengths then cost the decomposition no digits; with a single exponent the longest
// column would dominate: powers of x differ by many orders of magnitude.
void EquilibrateColumns(DBL *r, int32_t k, I32 *exponents) {
    for (std::ptrdiff_t j = 0; j < k; ++j) {
        double largest = 0.0;
        for (std::ptrdiff_t i = 0; i <= j; ++i)
            largest = std::fabs(r[i * k + j]) > largest ? std::fabs(r[i * k + j]) : largest;
        int exponent = 0;
        if (largest != 0.0)
            std::frexp(largest, &exponent);
        for (std::ptrdiff_t i = 0; i <= j; ++i)
            r[i * k + j] = std::ldexp(r[i * k + j], -exponent);
        exponents[j] = exponent;
    }
}

// Uses one exponent for all columns, which keeps the ratios of the singular values.
void ScaleTogether(DBL *r, int32_t k, I32 *exponents) {
    // The decomposition treats values far below 1 as zero.
    const int exponent = BringIntoRange<ElementType::DBL>({r, k, k}, 1.0);
    for (int32_t j = 0; j < k; ++j)
        exponents[j] = exponent;
}

// H has the singular values and the right vectors of R, and of U only U^T y is needed. If only
// zeros are left out, the solution and the covariance are the same for scaled columns.
ErrorCode SolveByValues(const LinearModel &model, const SequentialQR &triangle, int32_t method,
                        DBL *c, DBL *covariance) {
    const int32_t k = model.k;
    const std::ptrdiff_t square = std::ptrdiff_t{k} * k;
    Scratch<ElementType::DBL> memory;
    Scratch<ElementType::I32> exponents;
    if (const ErrorCode failed = memory.allocate(3 * int64_t{k} * k + k))
        return failed;
    if (const ErrorCode failed = exponents.allocate(k))
        return failed;
    DBL *const r = memory.data(), *const u = r + square, *const v = u + square,
               *const s = v + square;
    CopyTriangle(triangle, k, r);
    if (method == byCutSVD)
        ScaleTogether(r, k, exponents.data());
    else
        EquilibrateColumns(r, k, exponents.data());
    if (CheckFinite(r, square) != 0)
        return ErrNonFiniteInput;
    if (const ErrorCode failed =
            SVDecompose<ElementType::DBL>({r, k, k}, {u, k, k}, {s, k}, {v, k, k}))
        return failed;

    const double cut = method == byCutSVD ? model.n * s[0] * kEpsilon : 0.0;
    Fill(c, k, 0.0);
    for (int32_t j = 0; j < k; ++j) {
        const bool isUsed = s[j] > cut;
        double along = 0.0;
        for (int32_t i = 0; i < k; ++i)
            along += u[std::ptrdiff_t{i} * k + j] * triangle.target(i);
        const double share = along / s[j], inverse = 1.0 / s[j];
        for (int32_t i = 0; i < k; ++i) {
            DBL *const element = v + std::ptrdiff_t{i} * k + j;
            if (isUsed)
                c[i] += share * *element;
            *element = isUsed ? std::ldexp(*element * inverse, -exponents[i]) : 0.0;
        }
    }
    for (int32_t i = 0; i < k; ++i)
        c[i] = std::ldexp(c[i], -exponents[i]);
    return covariance == nullptr ? 0 : TimesTranspose(v, v, k, covariance);
}

ErrorCode SolveByTriangle(const LinearModel &model, const SequentialQR &triangle, DBL *c,
                          DBL *covariance) {
    const int32_t k = model.k;
    for (int32_t i = 0; i < k; ++i)
        c[i] = triangle.target(i);
    if (const ErrorCode failed =
            SolveUpperTriangular({triangle.row(0), k, k, triangle.stride()}, {c, k}, {c, k}))
        return failed;
    if (covariance == nullptr)
        return 0;
    Scratch<ElementType::DBL> memory;
    if (const ErrorCode failed = memory.allocate(3 * int64_t{k} * k))
        return failed;
    const std::ptrdiff_t square = std::ptrdiff_t{k} * k;
    DBL *const r = memory.data(), *const transposed = r + square, *const normal = r + 2 * square;
    CopyTriangle(triangle, k, r);
    CopyTransposed<ElementType::DBL>({r, k, k}, {transposed, k, k});
    OrderedProduct<ElementType::DBL>({transposed, k, k}, {r, k, k}, {normal, k, k});
    return PseudoInverseMatrix<ElementType::DBL>({normal, k, k}, -1.0, {covariance, k, k});
}

// The sums of the normal equations: [normal | right], k by k + 1, where each element is one sum
// over the samples in ascending order.
ErrorCode SumNormalEquations(const LinearModel &model, DBL *sums) {
    const int32_t k = model.k, cols = k + 1;
    Fill(sums, std::ptrdiff_t{k} * cols, 0.0);
    RowStream stream;
    if (const ErrorCode failed = stream.open(model))
        return failed;
    Scratch<ElementType::DBL> rows;
    RowBlock block;
    while (stream.next(&block)) {
        const int32_t count = block.count;
        if (rows.data() == nullptr) // the first block is the largest
            if (const ErrorCode failed = rows.allocate(int64_t{count} * cols))
                return failed;
        CopyTransposed<ElementType::DBL>({block.start, cols, count}, {rows.data(), count, cols});
        for (int32_t j = 0; model.w != nullptr && j < k; ++j)
            for (int32_t i = 0; i < count; ++i)
                block.column(j)[i] *= std::fabs(model.w[block.first + i]);
        AddProduct<ElementType::DBL>({block.start, k, count}, {rows.data(), count, cols},
                                     {sums, k, cols});
    }
    return 0;
}

ErrorCode SolveByNormalEquations(const LinearModel &model, int32_t method, DBL *c,
                                 DBL *covariance) {
    const std::ptrdiff_t k = model.k;
    Scratch<ElementType::DBL> memory;
    if (const ErrorCode failed = memory.allocate(2 * int64_t{k} * k + 2 * int64_t{k}))
        return failed;
    DBL *const sums = memory.data(), *const normal = sums + k * (k + 1);
    DBL *const right = normal + k * k;
    if (const ErrorCode failed = SumNormalEquations(model, sums))
        return failed;
    for (std::ptrdiff_t i = 0; i < k; ++i) {
        std::memcpy(normal + i * k, sums + i * (k + 1), static_cast<std::size_t>(k) * sizeof(DBL));
        right[i] = sums[i * (k + 1) + k];
    }
    const ConstRealMatrix matrix(normal, model.k, model.k);
    if (covariance != nullptr)
        if (const ErrorCode failed =
                PseudoInverseMatrix<ElementType::DBL>(matrix, -1.0, {covariance, model.k, model.k}))
            return failed;
    if (method == byLU)
        return SolveByLU<ElementType::DBL>(matrix, {right, model.k}, {c, model.k});
    const ErrorCode status = CholeskySolve<ElementType::DBL>(matrix, lowerTriangle,
                                                             {right, model.k, 1}, {c, model.k, 1});
    return status == ErrNotPositiveDefinite ? ErrSingularMatrix : status;
}

} // namespace

ErrorCode SolveLinearModel(const LinearModel &model, int32_t method, DBL *c, DBL *covariance) {
    if (model.k < 1)
        return ErrOrderNotPositive;
    if (model.n < model.k)
        return ErrPolynomialOrderTooHigh;
    if (method < bySVD || method > byCutSVD)
        return ErrInvalidSelector;
    if (method == byLU || method == byCholesky)
        return SolveByNormalEquations(model, method, c, covariance);
    SequentialQR triangle;
    if (const ErrorCode failed = triangle.reduce(model))
        return failed;
    if (method == bySVD || method == byCutSVD)
        return SolveByValues(model, triangle, method, c, covariance);
    return SolveByTriangle(model, triangle, c, covariance);
}

ErrorCode FitGeneral(const ConstRealMatrix &h, const FitSamples &samples, int32_t algorithm,
                     RealVector c, const RealMatrix &covariance, const FitOutput &out) {
    const int32_t n = h.rows(), k = h.cols();
    const auto writeRows = [&](const RowBlock &block) {
        const auto bytes = static_cast<std::size_t>(block.count) * sizeof(DBL);
        CopyTransposed<ElementType::DBL>(h.block(block.first, 0, block.count, k),
                                         {block.start, k, block.count});
        std::memcpy(block.column(k), samples.y.data() + block.first, bytes);
    };
    DBL *const wanted = covariance.isEmpty() ? nullptr : covariance.data();
    if (const ErrorCode status =
            SolveLinearModel({writeRows, n, k, samples.weights()}, algorithm, c.data(), wanted))
        return status;
    EvaluateFit(samples, out, [&](int32_t i) {
        double f = 0.0;
        for (int32_t j = 0; j < k; ++j)
            f += h(i, j) * c[j];
        return f;
    });
    return 0;
}

ErrorCode SolveUpperTriangular(const ConstRealMatrix &r, ConstRealVector v, RealVector x) {
    for (std::ptrdiff_t i = r.rows() - 1; i >= 0; --i) {
        const DBL *const row = r.row(i);
        if (row[i] == 0.0 || row[i] != row[i])
            return ErrSingularMatrix;
        double tail = 0.0;
        for (std::ptrdiff_t j = i + 1; j < r.rows(); ++j)
            tail += row[j] * x[j];
        x[i] = (v[i] - tail) / row[i];
    }
    return 0;
}

} // namespace qx
