#include "linalg/complex_functions.h"
#include "linalg/eigenproblems/general.h"
#include "linalg/functions/diagonal.h"
#include "linalg/functions/functions.h"
#include "linalg/products/products.h"
#include "linalg/properties/determinant_and_norms.h"
#include "linalg/systems/lu.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

constexpr auto E = ElementType::CDB;

constexpr double reached = 1e-12;

// Replaces z by log z; ErrDegenerateValue for 0.
ErrorCode TakeLogarithm(CDB *z) {
    if (SquaredModulus(*z) == 0.0)
        return ErrDegenerateValue;
    *z = Logarithm(*z);
    return 0;
}

// The largest modulus of a - b, relative to the largest of a plus the largest of b; infinity if one
// of them is not finite.
double RelativeError(const ConstComplexMatrix &a, const ConstComplexMatrix &b) {
    if (!AllFinite<E>(a) || !AllFinite<E>(b))
        return HUGE_VAL;
    double difference = 0.0, first = 0.0, second = 0.0;
    for (int32_t i = 0; i < a.rows(); ++i)
        for (int32_t j = 0; j < a.cols(); ++j) {
            difference = std::max(difference, std::sqrt(SquaredModulus(a(i, j) - b(i, j))));
            first = std::max(first, std::sqrt(SquaredModulus(a(i, j))));
            second = std::max(second, std::sqrt(SquaredModulus(b(i, j))));
        }
    return difference / (first + second);
}

// By eigenvectors: v log(w) v^-1. ErrConditionTooHigh, ErrDegenerateValue (an eigenvalue is 0),
// ErrSingularMatrix, and the codes of the eigenproblem.
ErrorCode LogByEigen(const ConstComplexMatrix &a, const ComplexMatrix &log) {
    const int32_t n = a.rows();
    ComplexMatrix vectors, inverse;
    ComplexVector values;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(vectors, n, n), Sized(inverse, n, n), Sized(values, n)))
        return failed;
    if (const ErrorCode failed = EigenGeneral<E>(a, values, vectors))
        return failed;
    double condition;
    const ErrorCode status = ConditionNumber<E>(vectors, twoNorm, &condition);
    if (status == ErrOutOfMemory)
        return status;
    if (status != 0 || !(condition <= 1e14))
        return ErrConditionTooHigh;
    for (CDB &value : values)
        if (const ErrorCode failed = TakeLogarithm(&value))
            return failed;
    if (const ErrorCode failed = InvertByLU<E>(vectors, inverse))
        return failed;
    for (int32_t i = 0; i < n; ++i)
        for (int32_t j = 0; j < n; ++j)
            vectors(i, j) = vectors(i, j) * values[j];
    MatrixProduct<E>(vectors, inverse, log);
    return 0;
}

// 2^k times the logarithm of the 2^k-th root of a, where k square roots bring the norm of y = 1 -
// root to at most 0.1: -(y + y^2 / 2 + ...) with ten terms. ErrIterationLimit after 100 roots, and
// the codes of the square roots.
ErrorCode LogByRoots(const ConstComplexMatrix &a, const ComplexMatrix &log) {
    constexpr int32_t mostRoots = 100, terms = 10;
    constexpr double radius = 0.1;
    const int32_t n = a.rows();
    ComplexMatrix root, y, power, product;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(root, n, n), Sized(y, n, n), Sized(power, n, n),
                                             Sized(product, n, n)))
        return failed;
    CopyMatrix<E>(a, root);
    ErrorCode status = 0;
    int32_t roots = 0;
    for (;; ++roots) {
        double norm;
        CopyMatrix<E>(root, y);
        for (int32_t i = 0; i < n; ++i)
            y(i, i).re -= 1.0;
        if (const ErrorCode failed = MatrixNorm<E>(y, frobeniusNorm, &norm))
            return failed;
        if (!(norm > radius))
            break;
        if (roots == mostRoots)
            return ErrIterationLimit;
        status = MatrixSquareRoot(root, root);
        if (status < 0)
            return status;
    }
    for (int32_t i = 0; i < n; ++i)
        for (int32_t j = 0; j < n; ++j)
            log(i, j) = power(i, j) = y(i, j) = -y(i, j);
    for (int32_t k = 1; k < terms; ++k) {
        MatrixProduct<E>(power, y, product);
        std::swap(power, product);
        const double factor = 1.0 / (k + 1);
        for (int32_t i = 0; i < n; ++i)
            for (int32_t j = 0; j < n; ++j)
                log(i, j) += power(i, j) * factor;
    }
    const double scale = -1.0 * std::ldexp(1.0, roots);
    for (CDB &element : log.elements())
        element = element * scale;
    return status;
}

// Refines the logarithm of one matrix.
class Refinement {
public:
    explicit Refinement(const ConstComplexMatrix &a) : a_(a) {}

    ErrorCode allocate() {
        const int32_t n = a_.rows();
        return memory_.take(Sized(log_, n, n), Sized(exponential_, n, n), Sized(inverse_, n, n),
                            Sized(correction_, n, n), Sized(best_, n, n));
    }
    ComplexMatrix log() const { return log_; }

    // Whether exp of the logarithm reproduces a. If not, *status reports whether something failed.
    bool isExact(ErrorCode *status) {
        CopyMatrix<E>(log_, exponential_);
        *status = MatrixExponential<E>(exponential_);
        if (*status < 0)
            return false;
        error_ = RelativeError(a_, exponential_);
        return error_ < reached;
    }

    ErrorCode improve() {
        keepBest();
        perturb(exponential_);
        ErrorCode status = LogByEigen(exponential_, log_);
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
    void keepBest() {
        CopyMatrix<E>(log_, best_);
        bestError_ = error_;
    }
    ErrorCode giveBest() {
        CopyMatrix<E>(best_, log_);
        return AllFinite<E>(log_) ? WarnLowAccuracy : ErrNonFiniteInput;
    }

    // The matrix, with 1e-12 / n times a fixed sequence (the logistic map) added to all its
    // elements.
    void perturb(const ComplexMatrix &perturbed) const {
        const int32_t n = a_.rows();
        double x = 0.142857;
        for (int32_t i = 0; i < n; ++i)
            for (int32_t j = 0; j < n; ++j) {
                x = (1.0 - x) * (x * 4.0);
                perturbed(i, j).re = x * 1e-12 / n + a_(i, j).re;
                x = (1.0 - x) * (x * 4.0);
                perturbed(i, j).im = x * 1e-12 / n + a_(i, j).im;
            }
    }

    // One Newton step: log - (exp(log) - a) exp(log)^-1.
    ErrorCode correct(bool *converged) {
        const int32_t n = a_.rows();
        if (const ErrorCode failed = InvertByLU<E>(exponential_, inverse_))
            return failed;
        for (int32_t i = 0; i < n; ++i)
            for (int32_t j = 0; j < n; ++j)
                exponential_(i, j) -= a_(i, j);
        MatrixProduct<E>(exponential_, inverse_, correction_);
        if (!AllFinite<E>(correction_))
            return giveBest();
        *converged = true;
        for (int32_t i = 0; i < n; ++i)
            for (int32_t j = 0; j < n; ++j) {
                log_(i, j) -= correction_(i, j);
                const CDB value = log_(i, j), change = correction_(i, j);
                if (std::fabs(change.re) > std::fabs(value.re) * reached ||
                    std::fabs(change.im) > std::fabs(value.im) * reached)
                    *converged = false;
            }
        return 0;
    }

    ConstComplexMatrix a_;
    ScratchParts memory_;
    ComplexMatrix log_, exponential_, inverse_, correction_, best_;
    double error_ = 0.0, bestError_ = 0.0;
};

// Takes the logarithm by repeated roots after the eigenvalues led to `failure`; the result replaces
// a.
ErrorCode FallBackOnRoots(const ComplexMatrix &a, const ComplexMatrix &log, ErrorCode failure) {
    const ErrorCode status = LogByRoots(a, log);
    if (status == ErrOutOfMemory)
        return status;
    if (status < 0)
        return ErrDegenerateValue;
    CopyMatrix<E>(log, a);
    return failure == ErrDegenerateValue && status == 0 ? WarnSingular : status;
}

} // namespace

ErrorCode MatrixLogarithm(const ComplexMatrix &a) {
    QX_EXPECTS(a.isSquare() && !a.isEmpty());
    if (!AllFinite<E>(a))
        return ErrNonFiniteInput;
    if (IsDiagonal<E>(a)) {
        for (int32_t i = 0; i < a.rows(); ++i)
            if (const ErrorCode failed = TakeLogarithm(&a(i, i)))
                return failed;
        return 0;
    }
    Refinement refinement(a);
    if (const ErrorCode failed = refinement.allocate())
        return failed;
    const ComplexMatrix log = refinement.log();
    for (CDB &element : log.elements())
        element = {0.0, 0.0};
    ErrorCode status = LogByEigen(a, log);
    if (status == ErrDegenerateValue || status == ErrConditionTooHigh)
        return FallBackOnRoots(a, log, status);
    if (status < 0 && status != ErrSingularMatrix)
        return status;
    if (!refinement.isExact(&status))
        status = status < 0 ? status : refinement.improve();
    if (status < 0)
        return status;
    CopyMatrix<E>(log, a);
    return status;
}

} // namespace qx
