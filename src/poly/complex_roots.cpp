#include "poly/complex_roots.h"

#include "frame/scratch.h"
#include "linalg/complex_functions.h"
#include "poly/complex_arithmetic.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

CDB Evaluate(const CDB *a, int32_t count, CDB z) {
    CDB value = a[count - 1];
    for (int32_t k = count - 2; k >= 0; --k)
        value = value * z + a[k];
    return value;
}

// The search for one root of a polynomial of degree 3 or more with a constant term other than 0.
class RootSearch {
public:
    // `derivative` has count - 1 elements.
    RootSearch(const CDB *a, int32_t count, CDB *derivative, int32_t maxIterations)
        : a_(a), derivative_(derivative), count_(count), maxIterations_(maxIterations) {
        for (int32_t k = 1; k < count; ++k)
            derivative[k - 1] = a[k] * double(k);
    }

    ErrorCode find(CDB *root) {
        // At the level of rounding errors the steps may cycle; the best point is then a root if its
        // value is small enough to count as zero.
        constexpr int32_t idleLimit = 100;
        Progress progress = takeFirstStep();
        Point best = at_;
        for (int32_t idle = 0; progress != Progress::Found && idle < idleLimit; ++idle) {
            progress = advance(progress);
            if (progress == Progress::Stuck)
                return ErrIterationLimit;
            if (progress == Progress::NotANumber)
                return ErrNonFiniteFunction;
            if (at_.size < best.size) {
                best = at_;
                idle = 0;
            }
        }
        *root = progress == Progress::Found ? at_.z : best.z;
        return progress == Progress::Found || best.size <= acceptance_ ? 0 : ErrIterationLimit;
    }

private:
    struct Point {
        CDB z, value;
        double size; // |value|
    };
    // MovedPlainly: by exactly the step of Newton's method. Turned: the next direction is already
    // set.
    enum class Progress { Moved, MovedPlainly, Turned, Found, Stuck, NotANumber };

    Point pointAt(CDB z) const {
        const CDB value = Evaluate(a_, count_, z);
        return {z, value, ScaledHypot(value)};
    }

    Progress takeFirstStep() {
        const double sizeAtZero = ScaledHypot(a_[0]);
        const CDB direction = IsZero(a_[1]) ? CDB{1.0, 0.0} : Quotient(-a_[0], a_[1]);
        // No root is nearer to 0 than half of `radius`, which is the length of the first step.
        double radius = 1.0;
        for (int32_t k = 1; k < count_; ++k)
            if (!IsZero(a_[k]))
                radius = std::min(radius, std::pow(ScaledHypot(Quotient(a_[0], a_[k])), 1.0 / k));
        lastStep_ = direction;
        acceptance_ = (count_ - 1) * 16.0 * sizeAtZero * 1e-10;
        at_ = pointAt(direction * (radius * 0.5 / ScaledHypot(direction)));
        return isRoot(at_, sizeAtZero) ? Progress::Found : Progress::Moved;
    }

    // Whether the value is 0, or no longer changes and is small enough to count as zero.
    bool isRoot(const Point &point, double sizeBefore) const {
        return point.size == 0.0 || (point.size == sizeBefore && point.size <= acceptance_);
    }
    bool isSettled(const Point &point, double sizeBefore, CDB step) const {
        return isRoot(point, sizeBefore) || ScaledHypot(step) < ScaledHypot(point.z) * 1e-10;
    }

    Progress advance(Progress before) {
        if (before == Progress::MovedPlainly)
            return newtonSteps();
        if (before != Progress::Turned && !setDirection())
            return Progress::NotANumber;
        return searchLine();
    }

    // Newton's direction; if it is longer than three times the last step, it is shortened to that
    // and rotated.
    bool setDirection() {
        const CDB slope = Evaluate(derivative_, count_ - 1, at_.z);
        if (IsNaN(slope) || IsNaN(at_.value))
            return false;
        if (IsZero(slope)) {
            direction_ = CDB{-0.4, -0.3} * lastStep_;
            return true;
        }
        direction_ = -Quotient(at_.value, slope);
        const double length = ScaledHypot(direction_), longest = 3.0 * ScaledHypot(lastStep_);
        if (length > longest)
            direction_ = CDB{0.8, 0.6} * (longest / length) * direction_;
        return true;
    }
    void turn() {
        direction_ = CDB{-0.4, -0.3} * lastStep_;
        // kept: both parts remember the real part.
        lastStep_ = {direction_.re, direction_.re};
    }

    Progress searchLine() {
        for (int32_t rejected = 0; rejected <= maxIterations_; ++rejected) {
            const double sizeBefore = at_.size;
            const Point start = at_, whole = pointAt(start.z + direction_);
            if (isRoot(whole, sizeBefore)) {
                at_ = whole;
                return Progress::Found;
            }
            if (whole.size < sizeBefore)
                return stretch(start, whole);
            const Point half = pointAt(start.z + direction_ * 0.5);
            if (isRoot(half, sizeBefore)) {
                at_ = half;
                return Progress::Found;
            }
            if (whole.size > half.size)
                return shorten(start, half);
            // If no direction is left, all further trials would be the same as this one.
            const double last = ScaledHypot(lastStep_);
            if (!(last > 0.0 && std::isfinite(last)))
                break;
            turn();
        }
        return Progress::Stuck;
    }

    // Takes multiples of the step as long as the value decreases.
    Progress stretch(const Point &start, const Point &whole) {
        CDB step = direction_;
        bool isStretched = false;
        at_ = whole;
        for (int32_t k = 2; k < count_; ++k) {
            const Point further = pointAt(start.z + direction_ * double(k));
            if (!(further.size < at_.size))
                break;
            at_ = further;
            step = direction_ * double(k);
            isStretched = true;
        }
        lastStep_ = direction_;
        if (isSettled(at_, start.size, step))
            return Progress::Found;
        return isStretched ? Progress::Moved : Progress::MovedPlainly;
    }

    // Takes half the step, or a smaller one that may be slightly rotated. The value may increase.
    Progress shorten(const Point &start, const Point &half) {
        const CDB quarterStep = direction_ * 0.25, turnedStep = CDB{0.2, 0.15} * direction_;
        CDB step = direction_ * 0.5;
        at_ = half;
        const Point quarter = pointAt(start.z + quarterStep);
        if (isRoot(quarter, start.size)) {
            at_ = quarter;
            return Progress::Found;
        }
        if (quarter.size < at_.size) {
            at_ = quarter;
            step = quarterStep;
            const Point turned = pointAt(start.z + turnedStep);
            if (turned.size < at_.size) {
                at_ = turned;
                step = turnedStep;
            }
        }
        lastStep_ = direction_;
        return isSettled(at_, start.size, step) ? Progress::Found : Progress::Moved;
    }

    // Newton steps near a root, as long as the value decreases.
    Progress newtonSteps() {
        while (true) {
            const CDB slope = Evaluate(derivative_, count_ - 1, at_.z);
            if (IsNaN(slope) || IsNaN(at_.value))
                return Progress::NotANumber;
            if (IsZero(slope))
                return Progress::Moved;
            const CDB step = -Quotient(at_.value, slope);
            const Point next = pointAt(at_.z + step);
            if (isSettled(next, at_.size, step)) {
                at_ = next;
                return Progress::Found;
            }
            if (!(next.size < at_.size)) {
                turn();
                return Progress::Turned;
            }
            at_ = next;
        }
    }

    const CDB *a_;
    CDB *derivative_;
    int32_t count_, maxIterations_;
    Point at_ = {};
    CDB direction_ = {}, lastStep_ = {};
    double acceptance_ = 0.0; // values up to it count as zero
};

// Division by x - root, from the top down; the quotient has one coefficient fewer.
void Deflate(CDB *a, int32_t count, CDB root) {
    CDB carried = a[count - 1];
    for (int32_t k = count - 2; k >= 0; --k) {
        const CDB next = a[k] + root * carried;
        a[k] = carried;
        carried = next;
    }
}

// Finds the roots and divides the polynomial by them one after the other; the last two are found
// together.
ErrorCode TakeRoots(CDB *a, int32_t count, CDB *derivative, int32_t maxIterations, CDB *roots) {
    while (count > 1) {
        if (count == 2) {
            *roots = Quotient(-a[0], a[1]);
            return 0;
        }
        if (IsZero(a[0])) {
            *roots = {0.0, 0.0};
            ++a;
        } else if (count == 3) {
            CxQuadraticRoots(a[0], a[1], a[2], roots);
            return 0;
        } else {
            if (const ErrorCode failed =
                    RootSearch(a, count, derivative, maxIterations).find(roots))
                return failed;
            Deflate(a, count, *roots);
        }
        --count;
        ++roots;
    }
    return 0;
}

} // namespace

void CxQuadraticRoots(CDB c, CDB b, CDB a, CDB *roots) {
    const CDB root = SquareRoot(b * b - a * 4.0 * c);
    const CDB sum = b + root, difference = b - root;
    const CDB larger = SquaredModulus(sum) >= SquaredModulus(difference) ? sum : difference;
    roots[0] = Quotient(larger * -0.5, a);
    roots[1] = Quotient(c * -2.0, larger);
}

ErrorCode CxPolynomialRoots(ConstComplexVector coef, int32_t maxIterations, ComplexVector roots,
                            int32_t *rootCount) {
    QX_EXPECTS(!coef.isEmpty() && roots.size() >= coef.size() - 1);
    for (const CDB coefficient : coef)
        if (IsNaN(coefficient))
            return ErrBadCoefficients;
    auto n = static_cast<int32_t>(coef.size());
    while (n > 0 && IsZero(coef[n - 1]))
        --n;
    if (n < 2)
        return ErrBadCoefficients;
    Scratch<ElementType::CDB> work;
    if (const ErrorCode failed = work.allocate(2 * int64_t{n}))
        return failed;
    for (int32_t k = 0; k < n; ++k)
        work[k] = coef[k];
    int32_t zeros = 0;
    while (IsZero(work[zeros])) // the top coefficient is not zero
        roots[zeros++] = {0.0, 0.0};
    *rootCount = n - 1;
    const ErrorCode status =
        TakeRoots(&work[zeros], n - zeros, &work[n], maxIterations, &roots[zeros]);
    return Merge(status, work.release());
}

} // namespace qx
