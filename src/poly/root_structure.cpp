#include "poly/root_structure.h"

#include "frame/constants.h"
#include "frame/scratch.h"
#include "linalg/eigenproblems/general.h"
#include "poly/common_divisor.h"
#include "poly/complex_arithmetic.h"
#include "poly/root_products.h"
#include "poly/simple_roots.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

constexpr auto Real = ElementType::DBL;
constexpr auto Complex = ElementType::CDB;

void CoefficientOf(CDB coefficient, DBL *out) { *out = coefficient.re; }
void CoefficientOf(CDB coefficient, CDB *out) { *out = coefficient; }

template <ElementType E>
ErrorCode EigenvaluesOfCompanion(const CDB *p, int32_t degree, CDB *roots) {
    Scratch<E> companion;
    if (const ErrorCode failed = companion.allocate(int64_t{degree} * degree))
        return failed;
    for (std::ptrdiff_t i = 0; i < degree; ++i) {
        for (std::ptrdiff_t j = 0; j < degree; ++j)
            CoefficientOf({i == j + 1 ? 1.0 : 0.0, 0.0}, &companion[i * degree + j]);
        CoefficientOf(-p[i + 1], &companion[i]);
    }
    const ErrorCode status = EigenGeneral<E>({companion.data(), degree, degree}, {roots, degree});
    return Merge(status, companion.release());
}

// Each root of the next level raises the multiplicity of the nearest root that has reached the
// level before.
void RaiseNearest(const CDB *found, int32_t foundCount, int32_t level, const CDB *roots,
                  I32 *multiplicities, int32_t rootCount) {
    for (int32_t i = 0; i < foundCount; ++i) {
        int32_t nearest = -1;
        double least = kInfinity;
        for (int32_t j = 0; j < rootCount; ++j) {
            const double distance = ScaledHypot(found[i] - roots[j]);
            if (multiplicities[j] == level - 1 && distance < least) {
                nearest = j;
                least = distance;
            }
        }
        if (nearest >= 0)
            multiplicities[nearest] = level;
    }
}

// The Gauss-Newton steps of PejorativeRefine.
class RootRefinement {
public:
    RootRefinement(const CDB *p, int32_t degree, CDB *roots, const I32 *multiplicities,
                   int32_t rootCount)
        : p_(p), roots_(roots), multiplicities_(multiplicities), degree_(degree),
          count_(rootCount) {}

    ErrorCode allocate() {
        const int64_t length = int64_t{degree_} + 1;
        DBL *distances;
        if (const ErrorCode failed =
                memory_.take(Sized(product_, length), Sized(others_, length),
                             Sized(change_, count_), Sized(best_, count_), Sized(order_, count_),
                             Sized(row_, count_), Sized(distances, count_)))
            return failed;
        LejaOrder(
            count_, [this](int32_t j) { return std::log(ScaledHypot(roots_[j])); },
            [this](int32_t j, int32_t i) { return std::log(ScaledHypot(roots_[j] - roots_[i])); },
            order_, distances);
        return system_.allocate(degree_, count_);
    }

    // Takes the step and sets its relative size, or returns the code with which it failed.
    ErrorCode step(double *size) {
        setUpStep();
        if (const ErrorCode failed = system_.solve(change_))
            return failed;
        double ofChange = 0.0, ofRoots = 0.0;
        for (int32_t j = 0; j < count_; ++j) {
            ofRoots += SquaredModulus(roots_[j]);
            ofChange += SquaredModulus(change_[j]);
            roots_[j] -= change_[j];
        }
        *size = std::sqrt(ofChange / ofRoots);
        return 0;
    }
    // Keeps the roots if they are the best so far. Errors within rounding errors are equally good.
    void keepIfBest() {
        const double rounding = degree_ * kEpsilon;
        if (!(error_ <= (leastError_ > rounding ? leastError_ : rounding)))
            return;
        leastError_ = error_;
        for (int32_t j = 0; j < count_; ++j)
            best_[j] = roots_[j];
    }
    double restoreBest() {
        for (int32_t j = 0; j < count_; ++j)
            roots_[j] = best_[j];
        return leastError_;
    }

    // Multiplies the factors and measures the backward error of the current roots.
    void multiply() {
        GrowingProduct product = multiplyPowers(product_);
        for (int32_t k = 0; k < count_; ++k)
            product.multiply(roots_[order_[k]]);
        error_ = 0.0;
        for (int32_t i = 0; i < degree_; ++i) {
            const double off = Modulus(product_[i + 1] - p_[i + 1]) * weight(i);
            if (!(off <= error_) && error_ == error_)
                error_ = off; // a NaN is kept
        }
    }

private:
    double weight(int32_t i) const {
        const double size = Modulus(p_[i + 1]);
        return size > 1.0 ? 1.0 / size : 1.0;
    }
    // With s the product of (x - root)^(multiplicity - 1), the polynomial is s times all x - root,
    // and its derivative with respect to root j is -multiplicity s times all of these but the j-th.
    // Row i of the system has coefficient i + 1 of the polynomial, row i of `system_` meanwhile
    // coefficient i of the products without one factor, in Leja's order: column k is complete once
    // all factors after the k-th have been multiplied to it.
    void setUpStep() {
        system_.reset(degree_, count_);
        GrowingProduct before = multiplyPowers(others_); // times the factors before the next one
        int32_t length = degree_ - count_ + 1;
        for (int32_t k = 0; k < count_; ++k, ++length) {
            const CDB root = roots_[order_[k]];
            for (std::ptrdiff_t i = length - 1; k > 0 && i > 0; --i)
                SubtractMultiple(root, k, &system_.at(i - 1, 0), &system_.at(i, 0));
            for (std::ptrdiff_t i = 0; i < length; ++i)
                system_.at(i, k) = others_[i];
            before.multiply(root);
        }
        for (int32_t i = 0; i < degree_; ++i) {
            const double factor = weight(i);
            for (int32_t k = 0; k < count_; ++k)
                row_[k] = system_.at(i, k);
            for (int32_t k = 0; k < count_; ++k) {
                const int32_t j = order_[k];
                system_.at(i, j) = row_[k] * -double(multiplicities_[j]) * factor;
            }
            system_.right(i) = (product_[i + 1] - p_[i + 1]) * factor;
        }
    }
    GrowingProduct multiplyPowers(CDB *coefficients) const {
        GrowingProduct product(coefficients);
        bool isComplete = false;
        for (int32_t times = 1; !isComplete; ++times) {
            isComplete = true;
            for (int32_t i = 0; i < count_; ++i) {
                if (times < multiplicities_[order_[i]]) {
                    product.multiply(roots_[order_[i]]);
                    isComplete = false;
                }
            }
        }
        return product;
    }

    const CDB *p_;
    CDB *roots_;
    const I32 *multiplicities_;
    int32_t degree_, count_;
    double error_ = 0.0, leastError_ = kInfinity;
    CDB *product_ = nullptr, *others_ = nullptr, *change_ = nullptr, *best_ = nullptr,
        *row_ = nullptr;
    I32 *order_ = nullptr;
    ScratchParts memory_;
    LeastSquaresSystem system_;
};

} // namespace

ErrorCode CompanionRoots(const CDB *p, int32_t degree, CDB *roots) {
    for (int32_t i = 1; i <= degree; ++i)
        if (p[i].im != 0.0)
            return EigenvaluesOfCompanion<Complex>(p, degree, roots);
    const ErrorCode status = EigenvaluesOfCompanion<Real>(p, degree, roots);
    // The complex iteration uses other shifts, and may converge.
    return status != ErrIterationLimit ? status : EigenvaluesOfCompanion<Complex>(p, degree, roots);
}

ErrorCode GCDRootStructure(const CDB *p, int32_t degree, double tolerance, CDB *roots,
                           I32 *multiplicities, int32_t *rootCount) {
    constexpr double errorGrowth = 100.0;
    *rootCount = 0;
    CommonDivisor divisor;
    SimpleRootsProof proof;
    if (const ErrorCode failed = divisor.allocate(degree))
        return failed;
    if (const ErrorCode failed = proof.allocate(degree))
        return failed;
    Scratch<Complex> work;
    if (const ErrorCode failed = work.allocate(2 * int64_t{degree} + 1))
        return failed;
    CDB *const current = work.data(), *const found = current + degree + 1;
    for (int32_t i = 0; i <= degree; ++i)
        current[i] = p[i];
    int32_t left = degree, largest = degree;
    for (int32_t level = 1; left > 0; ++level) {
        CDB *const target = level == 1 ? roots : found;
        // Most polynomials have simple roots only, and then the search for a divisor takes most of
        // the time: it is made if the roots do not prove that there is none. It begins before them
        // if a divisor is likely.
        const bool mayBeSimple = left <= largest;
        bool hasRoots = false, isSimple = false;
        divisor.begin(current, left, tolerance);
        const int32_t likely = mayBeSimple ? divisor.likelyQuotientDegree() : left;
        if (likely < left - 1)
            if (const ErrorCode failed = divisor.search(likely + 1))
                return failed;
        if (!divisor.isFound() && mayBeSimple) {
            const ErrorCode status = CompanionRoots(current, left, target);
            if (status == ErrOutOfMemory)
                return status;
            hasRoots = status == 0;
            isSimple = hasRoots && proof.holds(current, left, tolerance, target);
        }
        if (!divisor.isFound() && !isSimple) {
            if (const ErrorCode failed = divisor.search(largest))
                return failed;
            if (!divisor.isFound())
                break;
        }
        const int32_t count = isSimple ? left : divisor.quotientDegree();
        if (!(hasRoots && count == left))
            if (const ErrorCode failed = CompanionRoots(divisor.quotient(), count, target))
                return failed;
        if (level == 1) {
            *rootCount = count;
            for (int32_t j = 0; j < count; ++j)
                multiplicities[j] = 1;
        } else {
            RaiseNearest(found, count, level, roots, multiplicities, *rootCount);
        }
        left -= count;
        largest = count;
        if (left == 0)
            break;
        for (int32_t i = 0; i <= left; ++i)
            current[i] = divisor.divisor()[i];
        tolerance = std::max(tolerance, errorGrowth * divisor.error());
    }
    return 0;
}

ErrorCode PejorativeRefine(const CDB *p, int32_t degree, double tolerance, CDB *roots,
                           const I32 *multiplicities, int32_t rootCount) {
    constexpr int32_t stepLimit = 30;
    RootRefinement refinement(p, degree, roots, multiplicities, rootCount);
    if (const ErrorCode failed = refinement.allocate())
        return failed;
    double before = kInfinity, size = 0.0;
    refinement.multiply();
    for (int32_t turn = 0; turn < stepLimit; ++turn) {
        refinement.keepIfBest();
        if (const ErrorCode failed = refinement.step(&size))
            return failed == ErrOutOfMemory ? failed : ErrIterationLimit;
        refinement.multiply();
        // Small steps that no longer decrease are rounding errors.
        if (!(size > 4.0 * kEpsilon && size < 0.5 * before) && turn > 0)
            break;
        before = size;
    }
    refinement.keepIfBest();
    const bool isSettled = size < 1e-3 && refinement.restoreBest() <= 100.0 * tolerance;
    return isSettled ? 0 : ErrIterationLimit;
}

} // namespace qx
