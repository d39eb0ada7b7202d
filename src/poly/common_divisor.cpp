#include "poly/common_divisor.h"

#include "linalg/factorisations/qr.h"
#include "poly/complex_arithmetic.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

CDB Widened(double x) { return {x, 0.0}; }
CDB Widened(CDB z) { return z; }

template <ElementType E>
typename ScalarOf<E>::type Solution(CDB x) {
    if constexpr (E == ElementType::DBL)
        return x.re;
    else
        return x;
}

double LargestPart(const CDB *a, int32_t count) {
    double largest = 0.0;
    for (int32_t i = 0; i < count; ++i)
        largest = std::max(largest, AbsSum(a[i])); // without NaN
    return largest;
}

} // namespace

// `triangle_` is also large enough for a real matrix and its triangle.
ErrorCode LeastSquaresSystem::allocate(int64_t maxRows, int64_t maxCols) {
    return memory_.take(Sized(augmented_, maxRows * (maxCols + 1)),
                        Sized(triangle_, maxRows * (maxCols + 1)));
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

bool LeastSquaresSystem::copyRealParts() const {
    DBL *const real = reinterpret_cast<DBL *>(triangle_.data());
    bool isReal = true;
    for (std::ptrdiff_t i = 0; i < rows_ && isReal; ++i)
        for (std::ptrdiff_t j = i * width(); j < (i + 1) * width(); ++j) {
            isReal &= augmented_[j].im == 0.0 && std::fabs(augmented_[j].re) < 0x1p300;
            real[j] = augmented_[j].re;
        }
    return isReal;
}

// The right side is factored as an additional column and so becomes Q^H times itself.
template <ElementType E>
ErrorCode LeastSquaresSystem::solveWith(const ElementOf<E> *augmented, ElementOf<E> *triangle,
                                        CDB *x) const {
    ElementOf<E> *const r = triangle;
    const auto rows = static_cast<int32_t>(rows_), cols = static_cast<int32_t>(width());
    if (const ErrorCode failed =
            QRDecompose<E>({augmented, rows, cols}, qrOnlyR, {}, {r, std::min(rows, cols), cols}))
        return failed;
    for (std::ptrdiff_t i = cols_ - 1; i >= 0; --i) {
        typename ScalarOf<E>::type sum = r[i * width() + cols_];
        for (std::ptrdiff_t j = i + 1; j < cols_; ++j)
            sum = sum - r[i * width() + j] * Solution<E>(x[j]);
        x[i] = Widened(Quotient(sum, r[i * width() + i]));
    }
    return 0;
}

// Complex arithmetic with real elements has the same bits as real arithmetic, except for the signs
// of zeros in imaginary parts, unless something is infinite or NaN.
ErrorCode LeastSquaresSystem::solve(CDB *x) {
    if (copyRealParts()) {
        DBL *const real = reinterpret_cast<DBL *>(triangle_.data());
        if (const ErrorCode failed = solveWith<ElementType::DBL>(real, real + rows_ * width(), x))
            return failed;
        if (std::all_of(x, x + cols_, [](CDB value) { return IsFinite(value); }))
            return 0;
    }
    return solveWith<ElementType::CDB>(augmented_.data(), triangle_.data(), x);
}

ErrorCode CommonDivisor::allocate(int32_t maxDegree) {
    const int64_t n = maxDegree, size = 2 * n + 2;
    if (const ErrorCode failed = sylvester_.allocate(2 * n, 2 * n))
        return failed;
    if (const ErrorCode failed =
            memory_.take(Sized(slope_, n), Sized(unknowns_, size), Sized(step_, size)))
        return failed;
    return system_.allocate(size, size);
}

void CommonDivisor::begin(const CDB *p, int32_t n, double tolerance) {
    p_ = p;
    n_ = n;
    tolerance_ = tolerance;
    tried_ = 0;
    quotientDegree_ = -1;
    for (int32_t i = 0; i < n; ++i)
        slope_[i] = p[i] * (double(n - i) / n);
    sylvester_.begin(p, n, slope_.data(), n - 1);
}

ErrorCode CommonDivisor::search(int32_t largest) {
    // A degree is tried if the singular value, relative to the polynomial, is at most this many
    // tolerances.
    constexpr double trialFactor = 100.0;
    const double threshold = trialFactor * tolerance_ * CoefficientNorm(p_, std::ptrdiff_t{n_} + 1);
    while (tried_ < std::min(largest, n_ - 1)) {
        ++tried_;
        sylvester_.advance();
        if (!(sylvester_.smallestSingularValue() <= threshold))
            continue;
        bool isDivisor = false;
        if (const ErrorCode failed = tryDegree(tried_, &isDivisor))
            return failed;
        if (isDivisor) {
            quotientDegree_ = tried_;
            return 0;
        }
    }
    if (largest >= n_) {
        degree_ = quotientDegree_ = n_;
        residual_ = 0.0;
        u()[0] = {1.0, 0.0};
        for (int32_t i = 0; i <= n_; ++i)
            v()[i] = p_[i];
    }
    return 0;
}

// Euclid's algorithm: with k distinct roots, the k-th remainder of p and p' vanishes, up to
// rounding errors and those of the coefficients.
int32_t CommonDivisor::likelyQuotientDegree() {
    constexpr double vanishing = 1e-6;
    CDB *upper = unknowns_.data(), *lower = step_.data();
    for (int32_t i = 0; i <= n_; ++i)
        upper[i] = p_[i];
    for (int32_t i = 0; i < n_; ++i)
        lower[i] = slope_[i];
    double ofUpper = LargestPart(upper, n_ + 1), ofLower = LargestPart(lower, n_);
    for (int32_t k = 1; k < n_; ++k) {
        const int32_t count = n_ - k; // coefficients of the remainder
        const CDB first = Quotient(upper[0], lower[0]);
        const CDB second = Quotient(upper[1] - first * lower[1], lower[0]);
        for (int32_t i = 0; i < count; ++i) {
            const CDB next = i + 2 <= count ? first * lower[i + 2] : CDB{};
            upper[i] = upper[i + 2] - next - second * lower[i + 1];
        }
        const double size = LargestPart(upper, count);
        const double terms = ofUpper + (AbsSum(first) + AbsSum(second)) * ofLower;
        if (!(size > 0.0) || !IsFinite(size))
            return size == 0.0 ? k : n_;
        if (size < vanishing * terms)
            return k;
        ofUpper = ofLower;
        ofLower = size;
        std::swap(upper, lower);
    }
    return n_;
}

ErrorCode CommonDivisor::tryDegree(int32_t k, bool *isDivisor) {
    degree_ = k;
    ErrorCode failed = firstGuess();
    if (failed == 0)
        failed = refine();
    if (failed != 0)
        return failed == ErrOutOfMemory ? failed : 0;
    *isDivisor = residual_ <= tolerance_;
    return 0;
}

// Takes v and w from the vector that the Sylvester matrix maps to nearly 0, and u by division.
ErrorCode CommonDivisor::firstGuess() {
    const int32_t k = degree_, degreeOfU = n_ - k;
    const CDB *const x = sylvester_.singularVector();
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

// Gauss-Newton steps for u v = p and u w = p' / n with u[0] = 1, as long as they reduce the error.
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

// The largest error of a coefficient of either product; NaN if one is NaN.
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
