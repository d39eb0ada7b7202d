#include "frame/scratch.h"
#include "linalg/complex_functions.h"
#include "linalg/eigenproblems/general.h"
#include "linalg/functions/diagonal.h"
#include "linalg/functions/functions.h"
#include "linalg/matrix.h"
#include "linalg/products/products.h"
#include "linalg/properties/scalars.h"
#include "linalg/systems/lu.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace qx {
namespace {

typedef Scratch<ElementType::CDB> Block;

constexpr double reached = 1e-12;

void Copy(const CDB *from, int64_t count, CDB *to) {
    for (int64_t i = 0; i < count; ++i)
        to[i] = from[i];
}

// log of every element; ErrDegenerateValue for 0.
ErrorCode TakeLogarithms(CDB *z, std::ptrdiff_t stride, int32_t count) {
    for (int32_t i = 0; i < count; ++i) {
        CDB &value = z[i * stride];
        if (value.re * value.re + value.im * value.im == 0.0)
            return ErrDegenerateValue;
        value = Logarithm(value);
    }
    return 0;
}

// a less the identity.
void SubtractIdentity(const CDB *a, int32_t n, CDB *difference) {
    Copy(a, int64_t{n} * n, difference);
    for (std::ptrdiff_t i = 0; i < n; ++i)
        difference[i * n + i].re -= 1.0;
}

// Refines the logarithm of one matrix.
class Refinement {
public:
    Refinement(const CDB *a, int32_t n) : a_(a), n_(n), count_(int64_t{n} * n) {}

    ErrorCode allocate() { return blocks_.allocate(5 * count_); }
    CDB *log() const { return blocks_.data(); }

    // Whether exp of the logarithm gives a back. Else *status tells a failure.
    bool isExact(ErrorCode *status) {
        Copy(log(), count_, exponential());
        *status = MatrixExponential(exponential(), n_);
        if (*status < 0)
            return false;
        if (MatrixRelativeError(a_, exponential(), n_, &error_) != 0)
            error_ = HUGE_VAL;
        return error_ < reached;
    }

    ErrorCode improve() {
        Copy(log(), count_, best());
        bestError_ = error_;
        perturb(exponential());
        ErrorCode status = LogByEigen(exponential(), n_, log());
        if (status < 0)
            return status;
        if (isExact(&status) || status < 0)
            return status;
        if (error_ < bestError_)
            keepBest();
        for (int round = 0; round < 2; ++round) {
            bool converged = false;
            status = correct(&converged);
            if (status != 0 || converged)
                return status;
            if (isExact(&status) || status < 0)
                return status;
            if (!(error_ < bestError_))
                break;
            keepBest();
        }
        return giveBest();
    }

private:
    CDB *exponential() const { return blocks_.data() + count_; }
    CDB *inverse() const { return blocks_.data() + 2 * count_; }
    CDB *correction() const { return blocks_.data() + 3 * count_; }
    CDB *best() const { return blocks_.data() + 4 * count_; }

    void keepBest() {
        Copy(log(), count_, best());
        bestError_ = error_;
    }
    ErrorCode giveBest() {
        Copy(best(), count_, log());
        return CheckFinite(log(), count_) != 0 ? ErrNonFiniteInput : WarnLowAccuracy;
    }

    // The matrix with 1e-12 / n of a fixed sequence, the logistic map, on all its elements.
    void perturb(CDB *perturbed) const {
        double x = 0.142857;
        for (int64_t i = 0; i < count_; ++i) {
            x = (1.0 - x) * (x * 4.0);
            perturbed[i].re = x * 1e-12 / n_ + a_[i].re;
            x = (1.0 - x) * (x * 4.0);
            perturbed[i].im = x * 1e-12 / n_ + a_[i].im;
        }
    }

    // One Newton step: log - (exp(log) - a) exp(log)^-1.
    ErrorCode correct(bool *converged) {
        ErrorCode status = InvertByLU(exponential(), n_, inverse());
        if (status < 0)
            return status;
        for (int64_t i = 0; i < count_; ++i)
            exponential()[i] -= a_[i];
        status = MatrixProductPlain(exponential(), inverse(), n_, n_, n_, correction());
        if (status < 0)
            return status;
        if (CheckFinite(correction(), count_) != 0)
            return giveBest();
        *converged = true;
        for (int64_t i = 0; i < count_; ++i) {
            log()[i] -= correction()[i];
            const CDB value = log()[i], change = correction()[i];
            if (std::fabs(change.re) > std::fabs(value.re) * reached ||
                std::fabs(change.im) > std::fabs(value.im) * reached)
                *converged = false;
        }
        return 0;
    }

    const CDB *a_;
    int32_t n_;
    int64_t count_;
    double error_ = 0.0, bestError_ = 0.0;
    Block blocks_;
};

// What repeated roots give where the eigenvalues gave `failure`; the result replaces a.
ErrorCode FallBackOnRoots(CDB *a, int32_t n, CDB *log, ErrorCode failure) {
    const ErrorCode status = LogByRoots(a, n, log, 10, 0.1);
    if (status == ErrOutOfMemory)
        return status;
    if (status < 0)
        return ErrDegenerateValue;
    Copy(log, int64_t{n} * n, a);
    return failure == ErrDegenerateValue && status == 0 ? WarnSingular : status;
}

} // namespace

ErrorCode MatrixRelativeError(const CDB *a, const CDB *b, int32_t n, double *error) {
    const int64_t count = int64_t{n} * n;
    *error = std::numeric_limits<double>::quiet_NaN();
    if (CheckFinite(a, count) != 0 || CheckFinite(b, count) != 0)
        return ErrNonFiniteInput;
    double difference = 0.0, first = 0.0, second = 0.0;
    for (int64_t i = 0; i < count; ++i) {
        difference = std::max(difference, std::sqrt(SquaredModulus(a[i] - b[i])));
        first = std::max(first, std::sqrt(SquaredModulus(a[i])));
        second = std::max(second, std::sqrt(SquaredModulus(b[i])));
    }
    *error = difference / (first + second);
    return 0;
}

ErrorCode LogByEigen(const CDB *a, int32_t n, CDB *log) {
    const int64_t count = int64_t{n} * n;
    Block blocks;
    if (const ErrorCode failed = blocks.allocate(2 * count + n))
        return failed;
    CDB *const vectors = blocks.data(), *const inverse = vectors + count,
               *const values = inverse + count;
    if (const ErrorCode failed =
            CxEigenGeneral(a, n, generalMatrix, eigenValuesAndVectors, values, vectors))
        return failed;
    double condition;
    if (ConditionNumber(vectors, n, n, twoNorm, &condition) == ErrOutOfMemory)
        return ErrOutOfMemory;
    if (!(condition <= 1e14))
        return ErrConditionTooHigh;
    if (const ErrorCode failed = TakeLogarithms(values, 1, n))
        return failed;
    if (const ErrorCode failed = InvertByLU(vectors, n, inverse))
        return failed;
    for (int64_t i = 0; i < count; ++i)
        vectors[i] = vectors[i] * values[i % n];
    return MatrixProductPlain(vectors, inverse, n, n, n, log);
}

ErrorCode LogByRoots(const CDB *a, int32_t n, CDB *log, int32_t terms, double radius) {
    const int64_t count = int64_t{n} * n;
    Block blocks;
    if (const ErrorCode failed = blocks.allocate(4 * count))
        return failed;
    CDB *const root = blocks.data(), *const distance = root + count, *power = distance + count,
               *product = power + count;
    Copy(a, count, root);
    ErrorCode status = 0;
    int32_t roots = 0;
    for (;; ++roots) {
        double norm;
        SubtractIdentity(root, n, distance);
        if (const ErrorCode failed = MatrixNorm(distance, n, n, frobeniusNorm, &norm))
            return failed;
        if (!(norm > radius))
            break;
        if (roots == 100)
            return ErrIterationLimit;
        status = MatrixSquareRoot(root, n);
        if (status < 0)
            return status;
    }
    // y = 1 - root; log(root) = -(y + y^2 / 2 + ...)
    for (int64_t i = 0; i < count; ++i)
        log[i] = power[i] = distance[i] = -distance[i];
    for (int32_t j = 1; j < terms; ++j) {
        if (const ErrorCode failed = MatrixProductPlain(power, distance, n, n, n, product))
            return failed;
        CDB *const held = power;
        power = product;
        product = held;
        const double factor = 1.0 / (j + 1);
        for (int64_t i = 0; i < count; ++i)
            log[i] += power[i] * factor;
    }
    const double scale = -1.0 * std::ldexp(1.0, roots);
    for (int64_t i = 0; i < count; ++i)
        log[i] = log[i] * scale;
    return status;
}

ErrorCode MatrixLogarithm(CDB *a, int32_t n) {
    if (n < 1)
        return ErrEmptyInput;
    const int64_t count = int64_t{n} * n;
    if (CheckFinite(a, count) != 0)
        return ErrNonFiniteInput;
    if (IsDiagonal<ElementType::CDB>(a, n))
        return TakeLogarithms(a, std::ptrdiff_t{n} + 1, n);
    Refinement refinement(a, n);
    if (const ErrorCode failed = refinement.allocate())
        return failed;
    CDB *const log = refinement.log();
    for (int64_t i = 0; i < count; ++i)
        log[i] = {0.0, 0.0};
    ErrorCode status = LogByEigen(a, n, log);
    if (status == ErrDegenerateValue || status == ErrConditionTooHigh)
        return FallBackOnRoots(a, n, log, status);
    if (status < 0 && status != ErrSingularMatrix)
        return status;
    if (!refinement.isExact(&status))
        status = status < 0 ? status : refinement.improve();
    if (status < 0)
        return status;
    Copy(log, count, a);
    return status;
}

} // namespace qx
