#include "poly/common_divisor.h"

#include "frame/constants.h"
#include "linalg/factorisations/qr.h"
#include "linalg/factorisations/reflector.h"
#include "poly/complex_arithmetic.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

constexpr auto Complex = ElementType::CDB;

double Norm(const CDB *x, std::ptrdiff_t n) {
    double sum = 0.0;
    for (std::ptrdiff_t i = 0; i < n; ++i)
        sum += SquaredModulus(x[i]);
    return std::sqrt(sum);
}

// Coefficient i of the product of polynomials of these degrees.
CDB ProductAt(std::ptrdiff_t i, const CDB *a, std::ptrdiff_t degreeA, const CDB *b,
              std::ptrdiff_t degreeB) {
    CDB sum = {};
    for (std::ptrdiff_t j = std::max<std::ptrdiff_t>(0, i - degreeB); j <= std::min(i, degreeA);
         ++j)
        sum += a[j] * b[i - j];
    return sum;
}

} // namespace

ErrorCode LeastSquaresSystem::allocate(int64_t maxRows, int64_t maxCols) {
    if (const ErrorCode failed = augmented_.allocate(maxRows * (maxCols + 1)))
        return failed;
    return triangle_.allocate(std::min(maxRows, maxCols + 1) * (maxCols + 1));
}

void LeastSquaresSystem::reset(int32_t rows, int32_t cols) {
    rows_ = rows;
    cols_ = cols;
    for (std::ptrdiff_t i = 0; i < rows_ * width(); ++i)
        augmented_[i] = {};
}

void LeastSquaresSystem::scaleRow(std::ptrdiff_t row, double factor) {
    for (std::ptrdiff_t col = 0; col <= cols_; ++col)
        at(row, col) = at(row, col) * factor;
}

void LeastSquaresSystem::addProductBy(const CDB *a, int32_t degree, int32_t shift, int32_t row,
                                      int32_t col) {
    for (std::ptrdiff_t s = 0; s <= shift; ++s)
        for (std::ptrdiff_t i = 0; i <= degree; ++i)
            at(row + s + i, col + s) += a[i];
}

// The right side as one more column becomes Q^H times it.
ErrorCode LeastSquaresSystem::solve(CDB *x) {
    CDB *const r = triangle_.data();
    if (const ErrorCode failed = QRDecompose(augmented_.data(), static_cast<int32_t>(rows_),
                                             static_cast<int32_t>(width()), qrOnlyR, nullptr, r))
        return failed;
    for (std::ptrdiff_t i = cols_ - 1; i >= 0; --i) {
        CDB sum = r[i * width() + cols_];
        for (std::ptrdiff_t j = i + 1; j < cols_; ++j)
            sum -= r[i * width() + j] * x[j];
        x[i] = Quotient(sum, r[i * width() + i]);
    }
    return 0;
}

ErrorCode CommonDivisor::allocate(int32_t maxDegree) {
    capacity_ = maxDegree;
    const int64_t n = maxDegree, size = 2 * n + 2;
    for (const auto &[memory, count] : {std::pair(&sylvester_, 4 * n * n),
                                        {&vectors_, 2 * size},
                                        {&kappas_, size},
                                        {&slope_, n},
                                        {&unknowns_, size},
                                        {&step_, size}})
        if (const ErrorCode failed = memory->allocate(count))
            return failed;
    if (const ErrorCode failed = diagonal_.allocate(size))
        return failed;
    return system_.allocate(size, size);
}

ErrorCode CommonDivisor::find(const CDB *p, int32_t n, int32_t largest, double tolerance) {
    // A singular value that is no larger, relative to the polynomial, is worth a trial.
    constexpr double trialFactor = 100.0;
    p_ = p;
    n_ = n;
    columns_ = 0;
    quotientDegree_ = -1;
    for (int32_t i = 0; i < n; ++i)
        slope_[i] = p[i] * (double(n - i) / n);
    const double threshold = trialFactor * tolerance * Norm(p, std::ptrdiff_t{n} + 1);
    for (int32_t k = 1; k <= std::min(largest, n - 1); ++k) {
        if (k == 1)
            appendColumn(slope_.data(), n - 1, 0, n + k);
        appendColumn(slope_.data(), n - 1, k, n + k);
        appendColumn(p, n, k - 1, n + k);
        if (!(smallestSingularValue(columns_) <= threshold))
            continue;
        bool isDivisor = false;
        if (const ErrorCode failed = tryDegree(k, tolerance, &isDivisor))
            return failed;
        if (isDivisor) {
            quotientDegree_ = k;
            return 0;
        }
    }
    if (largest >= n) {
        degree_ = quotientDegree_ = n;
        residual_ = 0.0;
        u()[0] = {1.0, 0.0};
        for (int32_t i = 0; i <= n; ++i)
            v()[i] = p[i];
    }
    return 0;
}

void CommonDivisor::appendColumn(const CDB *a, int32_t degree, int32_t shift, int32_t rows) {
    CDB *const added = column(columns_);
    for (std::ptrdiff_t i = 0; i < 2 * std::ptrdiff_t{capacity_}; ++i)
        added[i] = i >= shift && i <= shift + degree ? a[i - shift] : CDB{};
    for (std::ptrdiff_t j = 0; j < columns_; ++j) {
        const CDB *const reflector = column(j);
        if (IsZero(kappas_[j]))
            continue;
        CDB product = {};
        for (std::ptrdiff_t i = j; i < rows; ++i)
            product += Conj(reflector[i]) * added[i];
        product = Quotient(product, kappas_[j]);
        for (std::ptrdiff_t i = j; i < rows; ++i)
            added[i] -= reflector[i] * product;
    }
    const Reflector<Complex> reflector(added + columns_, 1, rows - columns_,
                                       Reflector<Complex>::Leave::Reduced);
    kappas_[columns_] = reflector.kappa;
    diagonal_[columns_] = reflector.beta;
    ++columns_;
}

// Inverse iteration with R^H R. The singular vector is left in vectors_.
double CommonDivisor::smallestSingularValue(int32_t cols) {
    CDB *const x = vectors_.data(), *const y = x + cols;
    for (int32_t i = 0; i < cols; ++i) // nothing that a structure could be orthogonal to
        x[i] = {1.0 + i * 7 % 5 * 0.25, 0.0};
    double value = kInfinity;
    for (int32_t turn = 0; turn < 4; ++turn) {
        solveAdjoint(cols, x, y);
        const double before = Norm(y, cols);
        for (int32_t i = 0; i < cols; ++i)
            x[i] = y[i];
        solveTriangle(cols, x);
        const double after = Norm(x, cols);
        value = before / after;
        for (int32_t i = 0; i < cols; ++i)
            x[i] = x[i] / after;
    }
    return value;
}

// Diagonal elements that vanish are as good as these.
double CommonDivisor::pivot(std::ptrdiff_t i) const {
    const double least = 1e-30 * std::fabs(diagonal_[0]);
    return std::fabs(diagonal_[i]) > least ? double(diagonal_[i]) : least;
}

void CommonDivisor::solveAdjoint(int32_t cols, const CDB *x, CDB *y) const {
    for (std::ptrdiff_t i = 0; i < cols; ++i) {
        CDB sum = x[i];
        for (std::ptrdiff_t j = 0; j < i; ++j)
            sum -= Conj(column(i)[j]) * y[j];
        y[i] = sum / pivot(i);
    }
}

void CommonDivisor::solveTriangle(int32_t cols, CDB *x) const {
    for (std::ptrdiff_t i = cols - 1; i >= 0; --i) {
        x[i] = x[i] / pivot(i);
        for (std::ptrdiff_t j = 0; j < i; ++j)
            x[j] -= column(i)[j] * x[i];
    }
}

ErrorCode CommonDivisor::tryDegree(int32_t k, double tolerance, bool *isDivisor) {
    degree_ = k;
    ErrorCode failed = firstGuess();
    if (failed == 0)
        failed = refine();
    if (failed != 0)
        return failed == ErrOutOfMemory ? failed : 0;
    *isDivisor = residual_ <= tolerance;
    return 0;
}

// v and w from the vector that the Sylvester matrix maps to nearly 0, u by division.
ErrorCode CommonDivisor::firstGuess() {
    const int32_t k = degree_, degreeOfU = n_ - k;
    const CDB *const x = vectors_.data();
    v()[0] = {1.0, 0.0};
    for (std::ptrdiff_t s = 1; s <= k; ++s) {
        v()[s] = Quotient(x[2 * s - 1], x[0]);
        w()[s - 1] = Quotient(-x[2 * s], x[0]);
    }
    system_.reset(n_ + 1, degreeOfU + 1);
    system_.addProductBy(v(), k, degreeOfU, 0, 0);
    for (int32_t i = 0; i <= n_; ++i) {
        system_.right(i) = p_[i];
        system_.scaleRow(i, weight(p_[i]));
    }
    return system_.solve(u());
}

// Gauss-Newton steps for u v = p and u w = p' / n with u[0] = 1, as long as they help.
ErrorCode CommonDivisor::refine() {
    constexpr int32_t stepLimit = 10;
    const int32_t unknowns = n_ + degree_ + 2;
    residual_ = residual();
    for (int32_t turn = 0; turn < stepLimit && residual_ <= 1e-2; ++turn) {
        setUpStep();
        if (const ErrorCode failed = system_.solve(step_.data()))
            return failed;
        for (int32_t i = 0; i < unknowns; ++i)
            u()[i] -= step_[i];
        const double before = residual_;
        residual_ = residual();
        if (!(residual_ < before)) {
            for (int32_t i = 0; i < unknowns; ++i)
                u()[i] += step_[i];
            residual_ = before;
            break;
        }
    }
    return 0;
}

void CommonDivisor::setUpStep() {
    const int32_t n = n_, k = degree_, degreeOfU = n - k;
    system_.reset(2 * n + 2, n + k + 2);
    system_.at(0, 0) = {1.0, 0.0};
    system_.right(0) = u()[0] - CDB{1.0, 0.0};
    system_.addProductBy(v(), k, degreeOfU, 1, 0);
    system_.addProductBy(u(), degreeOfU, k, 1, degreeOfU + 1);
    for (int32_t i = 0; i <= n; ++i) {
        system_.right(1 + i) = ProductAt(i, u(), degreeOfU, v(), k) - p_[i];
        system_.scaleRow(1 + i, weight(p_[i]));
    }
    system_.addProductBy(w(), k - 1, degreeOfU, n + 2, 0);
    system_.addProductBy(u(), degreeOfU, k - 1, n + 2, n + 2);
    for (int32_t i = 0; i < n; ++i) {
        system_.right(n + 2 + i) = ProductAt(i, u(), degreeOfU, w(), k - 1) - slope_[i];
        system_.scaleRow(n + 2 + i, weight(slope_[i]));
    }
}

// The largest error of a coefficient of either product; NaN where one is.
double CommonDivisor::residual() const {
    const int32_t k = degree_, degreeOfU = n_ - k;
    double worst = 0.0;
    const auto add = [&worst](CDB error, double factor) {
        const double size = Modulus(error) * factor;
        if (!(size <= worst) && worst == worst)
            worst = size;
    };
    for (int32_t i = 0; i <= n_; ++i)
        add(ProductAt(i, u(), degreeOfU, v(), k) - p_[i], weight(p_[i]));
    for (int32_t i = 0; i < n_; ++i)
        add(ProductAt(i, u(), degreeOfU, w(), k - 1) - slope_[i], weight(slope_[i]));
    return worst;
}

double CommonDivisor::weight(CDB coefficient) {
    const double size = Modulus(coefficient);
    return size > 1.0 ? 1.0 / size : 1.0;
}

} // namespace qx
