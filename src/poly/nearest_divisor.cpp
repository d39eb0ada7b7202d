#include "poly/nearest_divisor.h"

#include "linalg/scalar.h"
#include "poly/complex_arithmetic.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

// Descending coefficients of norm 1.
void Normalise(ConstComplexVector ascending, CDB *descending) {
    const std::ptrdiff_t count = ascending.size();
    double largest = 0.0;
    for (const CDB &coefficient : ascending)
        largest = std::max({largest, std::fabs(coefficient.re), std::fabs(coefficient.im)});
    for (std::ptrdiff_t i = 0; i < count; ++i)
        descending[i] = ascending[count - 1 - i] / largest;
    const double norm = CoefficientNorm(descending, count);
    for (std::ptrdiff_t i = 0; i < count; ++i)
        descending[i] = descending[i] / norm;
}

} // namespace

ErrorCode NearestDivisor::find(ConstComplexVector p, ConstComplexVector q, double tolerance) {
    isSwapped_ = p.size() < q.size();
    if (isSwapped_)
        std::swap(p, q);
    if (const ErrorCode failed = assign(p, q))
        return failed;
    if (n_ > 0) {
        if (const ErrorCode failed = search(tolerance))
            return failed;
    }
    if (degree_ == 0) {
        u()[0] = {1.0, 0.0};
        for (int32_t i = 0; i <= m_; ++i)
            v()[i] = this->p()[i];
        for (int32_t i = 0; i <= n_; ++i)
            w()[i] = this->q()[i];
        distance_ = 0.0;
    }
    return 0;
}

ErrorCode NearestDivisor::assign(ConstComplexVector p, ConstComplexVector q) {
    m_ = static_cast<int32_t>(p.size() - 1);
    n_ = static_cast<int32_t>(q.size() - 1);
    degree_ = 0;
    const int64_t sum = int64_t{m_} + n_;
    if (const ErrorCode failed =
            memory_.take(Sized(inputs_, sum + 2), Sized(unknowns_, sum + 3), Sized(step_, sum + 3)))
        return failed;
    Normalise(p, this->p());
    Normalise(q, this->q());
    return 0;
}

// If there is a divisor of this degree within the tolerance, the singular value is below the
// tolerance times the square root of the number of columns; ten times as much leaves room for the
// estimate.
ErrorCode NearestDivisor::search(double tolerance) {
    constexpr double trialFactor = 10.0;
    const int64_t sum = int64_t{m_} + n_;
    if (const ErrorCode failed = direction_.allocate(int64_t{n_} + 1))
        return failed;
    if (const ErrorCode failed = sylvester_.allocate(sum, sum))
        return failed;
    if (const ErrorCode failed = system_.allocate(sum + 3, sum + 3))
        return failed;
    sylvester_.begin(p(), m_, q(), n_);
    for (int32_t degree = n_; degree > 0; --degree) {
        sylvester_.advance();
        const double threshold = trialFactor * tolerance * std::sqrt(double(sylvester_.columns()));
        if (!(sylvester_.smallestSingularValue() <= threshold))
            continue;
        const ErrorCode failed = tryDegree(degree);
        if (failed == ErrOutOfMemory)
            return failed;
        if (failed == 0 && distance_ <= tolerance)
            return 0;
    }
    degree_ = 0;
    return 0;
}

ErrorCode NearestDivisor::tryDegree(int32_t degree) {
    degree_ = degree;
    if (const ErrorCode failed = firstGuess())
        return failed;
    return refine();
}

// Takes v and w from the vector that the Sylvester matrix maps to nearly 0, and u, of norm 1, from
// both products.
ErrorCode NearestDivisor::firstGuess() {
    const int32_t gap = m_ - n_, steps = n_ - degree_;
    const CDB *const x = sylvester_.singularVector();
    for (std::ptrdiff_t i = 0; i < gap; ++i)
        v()[i] = x[i];
    for (std::ptrdiff_t s = 0; s <= steps; ++s) {
        v()[gap + s] = x[gap + 2 * s];
        w()[s] = -x[gap + 2 * s + 1];
    }
    system_.reset(m_ + n_ + 2, degree_ + 1);
    system_.addProductBy(v(), m_ - degree_, degree_, 0, 0);
    system_.addProductBy(w(), n_ - degree_, degree_, m_ + 1, 0);
    for (int32_t i = 0; i <= m_; ++i)
        system_.right(i) = p()[i];
    for (int32_t i = 0; i <= n_; ++i)
        system_.right(m_ + 1 + i) = q()[i];
    if (const ErrorCode failed = system_.solve(u()))
        return failed;
    const double norm = CoefficientNorm(u(), std::ptrdiff_t{degree_} + 1);
    for (std::ptrdiff_t i = 0; i <= degree_; ++i)
        direction_[i] = u()[i] = u()[i] / norm;
    for (std::ptrdiff_t i = degree_ + 1; i < unknowns(); ++i)
        u()[i] = u()[i] * norm;
    return 0;
}

// Gauss-Newton steps for u v = p and u w = q, with the inner product of u and its initial direction
// held at 1, as long as they reduce the error.
ErrorCode NearestDivisor::refine() {
    constexpr int32_t stepLimit = 10;
    double sum = residual();
    for (int32_t turn = 0; turn < stepLimit && sum <= 1e-2; ++turn) {
        setUpStep();
        if (const ErrorCode failed = system_.solve(step_.data()))
            return failed;
        for (int32_t i = 0; i < unknowns(); ++i)
            u()[i] -= step_[i];
        const double before = sum;
        sum = residual();
        if (!(sum < before)) {
            for (int32_t i = 0; i < unknowns(); ++i)
                u()[i] += step_[i];
            residual();
            break;
        }
    }
    return 0;
}

void NearestDivisor::setUpStep() {
    const int32_t m = m_, n = n_, k = degree_;
    system_.reset(m + n + 3, unknowns());
    CDB along = {-1.0, 0.0};
    for (std::ptrdiff_t j = 0; j <= k; ++j) {
        system_.at(0, j) = Conj(direction_[j]);
        along += Conj(direction_[j]) * u()[j];
    }
    system_.right(0) = along;
    system_.addProductBy(v(), m - k, k, 1, 0);
    system_.addProductBy(u(), k, m - k, 1, k + 1);
    for (int32_t i = 0; i <= m; ++i)
        system_.right(1 + i) = ProductAt(i, u(), k, v(), m - k) - p()[i];
    system_.addProductBy(w(), n - k, k, m + 2, 0);
    system_.addProductBy(u(), k, n - k, m + 2, m + 2);
    for (int32_t i = 0; i <= n; ++i)
        system_.right(m + 2 + i) = ProductAt(i, u(), k, w(), n - k) - q()[i];
}

// The norm of all errors, which the steps reduce, and the distance.
double NearestDivisor::residual() {
    double ofP = 0.0, ofQ = 0.0;
    for (int32_t i = 0; i <= m_; ++i)
        ofP += SquaredModulus(ProductAt(i, u(), degree_, v(), m_ - degree_) - p()[i]);
    for (int32_t i = 0; i <= n_; ++i)
        ofQ += SquaredModulus(ProductAt(i, u(), degree_, w(), n_ - degree_) - q()[i]);
    distance_ = std::sqrt(ofP > ofQ ? ofP : ofQ);
    return std::sqrt(ofP + ofQ);
}

} // namespace qx
