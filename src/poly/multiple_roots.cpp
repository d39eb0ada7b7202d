#include "poly/multiple_roots.h"

#include "frame/constants.h"
#include "frame/scratch.h"
#include "poly/complex_arithmetic.h"
#include "poly/complex_roots.h"
#include "poly/root_structure.h"

#include <cmath>

namespace qx {
namespace {

void Append(MultipleRoots &roots, CDB root, int32_t times) {
    roots.refined[roots.count] = roots.simple[roots.count] = root;
    roots.multiplicity[roots.count] = times;
    ++roots.count;
}

int32_t DegreeOf(const MultipleRoots &roots) {
    int64_t sum = 0;
    for (int32_t i = 0; i < roots.count; ++i)
        sum += roots.multiplicity[i];
    return static_cast<int32_t>(sum);
}

void Scale(MultipleRoots &roots, double factor) {
    for (int32_t i = 0; i < roots.count; ++i) {
        roots.simple[i] = roots.simple[i] * factor;
        roots.refined[i] = roots.refined[i] * factor;
    }
}

bool ComesBefore(int32_t timesA, CDB a, int32_t timesB, CDB b) {
    return timesA != timesB ? timesA < timesB : ScaledHypot(a) > ScaledHypot(b);
}

// Sorts by ascending multiplicity and descending modulus; equal roots keep their order.
void Sort(MultipleRoots &roots) {
    for (int32_t i = 1; i < roots.count; ++i) {
        const CDB root = roots.simple[i];
        const int32_t times = roots.multiplicity[i];
        int32_t j = i;
        for (; j > 0 && ComesBefore(times, root, roots.multiplicity[j - 1], roots.simple[j - 1]);
             --j) {
            roots.simple[j] = roots.simple[j - 1];
            roots.multiplicity[j] = roots.multiplicity[j - 1];
        }
        roots.simple[j] = root;
        roots.multiplicity[j] = times;
    }
}

// p[k] / sigma^k, the polynomial whose roots are sigma times smaller; returns false on overflow.
bool DividePowers(const CDB *p, int32_t degree, double sigma, CDB *scaled) {
    double power = 1.0;
    for (int32_t k = 0; k <= degree; ++k) {
        scaled[k] = p[k] / power;
        if (!IsFinite(scaled[k]))
            return false;
        power *= sigma;
    }
    return true;
}

// A monic polynomial with descending coefficients whose roots have magnitudes near 1, and the
// factor by which they are smaller than the original roots.
class NormalisedPolynomial {
public:
    ErrorCode assign(const CDB *ascending, int32_t degree) {
        if (const ErrorCode failed = work_.allocate(2 * (int64_t{degree} + 1)))
            return failed;
        CDB *const monic = work_.data(), *const scaled = monic + degree + 1;
        for (int32_t k = 0; k <= degree; ++k)
            monic[k] = Quotient(ascending[degree - k], ascending[degree]);
        monic[0] = {1.0, 0.0};
        coefficients_ = monic;
        sigma_ = std::pow(ScaledHypot(monic[degree]), 1.0 / degree);
        if (sigma_ != 1.0 && DividePowers(monic, degree, sigma_, scaled))
            coefficients_ = scaled;
        else
            sigma_ = 1.0;
        return 0;
    }
    const CDB *coefficients() const { return coefficients_; }
    double sigma() const { return sigma_; }

private:
    Scratch<ElementType::CDB> work_;
    const CDB *coefficients_ = nullptr;
    double sigma_ = 1.0;
};

// Roots count as distinct unless they are exactly equal.
void TakeEigenvalues(const CDB *values, int32_t degree, MultipleRoots &roots) {
    roots.count = 0;
    for (int32_t i = 0; i < degree; ++i) {
        const CDB value = values[i];
        int32_t same = 0;
        while (same < roots.count &&
               !(roots.simple[same].re == value.re && roots.simple[same].im == value.im))
            ++same;
        if (same < roots.count)
            ++roots.multiplicity[same];
        else
            Append(roots, value, 1);
    }
}

// ErrIterationLimit if the steps do not converge.
ErrorCode Refine(const CDB *p, int32_t degree, double tolerance, MultipleRoots &roots) {
    Sort(roots);
    for (int32_t i = 0; i < roots.count; ++i)
        roots.refined[i] = roots.simple[i];
    return PejorativeRefine(p, degree, tolerance, roots.refined.data(), roots.multiplicity.data(),
                            roots.count);
}

// Real roots stay real if the refinement moved them off the axis only by rounding errors.
void DropRoundingErrors(int32_t degree, MultipleRoots &roots) {
    for (int32_t i = 0; i < roots.count; ++i)
        if (roots.simple[i].im == 0.0 && std::fabs(roots.refined[i].im) < degree * kEpsilon)
            roots.refined[i].im = 0.0;
}

// For degree 3 and above, without roots at 0.
ErrorCode FindStructure(const CDB *ascending, int32_t degree, bool refines, double tolerance,
                        MultipleRoots &roots) {
    NormalisedPolynomial normalised;
    if (const ErrorCode failed = normalised.assign(ascending, degree))
        return failed;
    const CDB *const p = normalised.coefficients();
    Scratch<ElementType::CDB> eigenvalues;
    if (const ErrorCode failed = eigenvalues.allocate(degree))
        return failed;
    if (const ErrorCode failed = GCDRootStructure(p, degree, tolerance, roots.simple.data(),
                                                  roots.multiplicity.data(), &roots.count))
        return failed;
    bool isFound = DegreeOf(roots) == degree;
    // If all roots are simple, they are the eigenvalues, in the order in which those were found.
    const bool areEigenvalues = roots.count == degree;
    for (int32_t i = 0; areEigenvalues && i < degree; ++i)
        eigenvalues[i] = roots.simple[i];
    if (isFound && refines) {
        const ErrorCode status = Refine(p, degree, tolerance, roots);
        if (status != 0 && status != ErrIterationLimit)
            return status;
        isFound = status == 0;
    } else if (isFound) {
        for (int32_t i = 0; i < roots.count; ++i)
            roots.refined[i] = roots.simple[i];
    }
    if (!isFound) {
        if (!areEigenvalues)
            if (const ErrorCode failed = CompanionRoots(p, degree, eigenvalues.data()))
                return failed;
        TakeEigenvalues(eigenvalues.data(), degree, roots);
    }
    Scale(roots, normalised.sigma());
    if (isFound && refines)
        DropRoundingErrors(degree, roots);
    return 0;
}

// kept: a double root of a quadratic counts as two roots.
void SolveDirectly(const CDB *a, int32_t degree, MultipleRoots &roots) {
    CDB found[2] = {};
    if (degree == 1)
        found[0] = Quotient(-a[0], a[1]);
    else if (degree == 2)
        CxQuadraticRoots(a[0], a[1], a[2], found);
    for (int32_t i = 0; i < degree; ++i)
        Append(roots, found[i], 1);
}

} // namespace

ErrorCode FindMultipleRoots(ConstComplexVector coef, bool refines, double tolerance,
                            MultipleRoots *roots) {
    QX_EXPECTS(!coef.isEmpty() && roots->simple.size() >= coef.size());
    for (const CDB coefficient : coef)
        if (!IsFinite(coefficient))
            return ErrBadCoefficients;
    if (!(tolerance > 0.0))
        tolerance = 1e-10;
    auto degree = static_cast<int32_t>(coef.size()) - 1;
    while (degree >= 0 && IsZero(coef[degree]))
        --degree;
    if (degree < 1)
        return degree < 0 ? ErrAllCoefficientsZero : ErrOrderNotPositive;
    int32_t zeros = 0;
    while (IsZero(coef[zeros]))
        ++zeros;
    const CDB *const rest = &coef[zeros];
    roots->count = 0;
    if (degree - zeros < 3)
        SolveDirectly(rest, degree - zeros, *roots);
    else if (const ErrorCode failed =
                 FindStructure(rest, degree - zeros, refines, tolerance, *roots))
        return failed;
    if (zeros > 0)
        Append(*roots, {0.0, 0.0}, zeros);
    return 0;
}

} // namespace qx
