#include "poly/newton_bairstow.h"

#include "frame/scratch.h"

#include <cmath>

namespace qx {
namespace {

// Horner's rule; a polynomial without coefficients is 0.
double Evaluate(ConstRealVector coef, double x) {
    double value = coef.isEmpty() ? 0.0 : coef[coef.size() - 1];
    for (std::ptrdiff_t k = coef.size() - 2; k >= 0; --k)
        value = value * x + coef[k];
    return value;
}

// The quadratic factor x^2 - r x - s of a polynomial, and its iteration.
class QuadraticFactor {
public:
    QuadraticFactor(CDB first, CDB second)
        : r_(first.re + second.re), s_(-(first.re * second.re - first.im * second.im)) {
        limitR_ = std::fabs(r_) * 1e12 < std::fabs(s_) ? 1.2 : 0.1;
        limitS_ = std::fabs(r_) * 1e-12 > std::fabs(s_) ? 1.2 : 0.1;
    }

    // a has at least 4 coefficients; b and c have as many elements.
    void refine(ConstRealVector a, const RootLimits &limits, RealVector b, RealVector c) {
        for (int32_t left = limits.iterations; left > 0; --left) {
            divide(a, b, c);
            double dr = 1.0, ds = 1.0;
            const double determinant = c[2] * c[2] - c[3] * c[1];
            if (determinant != 0.0) {
                dr = (c[3] * b[0] - c[2] * b[1]) / determinant;
                ds = (c[1] * b[1] - c[2] * b[0]) / determinant;
            }
            const double changeR = change(dr, r_, limitR_), changeS = change(ds, s_, limitS_);
            const bool shrinks = changeR < limitR_ && changeS < limitS_;
            if (shrinks) {
                r_ += dr;
                s_ += ds;
            }
            if (!shrinks || (changeR < limits.tolerance && changeS < limits.tolerance))
                return;
            limitR_ = changeR;
            limitS_ = changeS;
        }
    }

    // True for two real roots, false for a conjugate pair.
    bool solve(CDB *roots) const {
        const double discriminant = 4.0 * s_ + r_ * r_;
        if (!(discriminant < 0.0)) {
            const double root = std::sqrt(discriminant);
            roots[0] = {(r_ + root) * 0.5, 0.0};
            roots[1] = {0.5 * (r_ - root), 0.0};
            return true;
        }
        const double part = std::sqrt(-discriminant) * -0.5;
        roots[0] = {r_ * 0.5, part};
        roots[1] = {r_ * 0.5, -part};
        return false;
    }

private:
    // b becomes the quotient by the factor, with the remainder in its first two elements, and c the
    // same for b; it contains the derivatives of the remainder.
    void divide(ConstRealVector a, RealVector b, RealVector c) const {
        const std::ptrdiff_t n = a.size();
        b[n - 1] = a[n - 1];
        b[n - 2] = a[n - 2] + r_ * b[n - 1];
        c[n - 1] = b[n - 1];
        c[n - 2] = b[n - 2] + r_ * c[n - 1];
        for (std::ptrdiff_t j = n - 3; j >= 0; --j) {
            b[j] = a[j] + r_ * b[j + 1] + s_ * b[j + 2];
            c[j] = b[j] + r_ * c[j + 1] + s_ * c[j + 2];
        }
    }
    static double change(double difference, double value, double limit) {
        if (value != 0.0)
            return std::fabs(difference / value);
        return difference != 0.0 ? limit : 0.0;
    }

    double r_, s_, limitR_, limitS_;
};

} // namespace

void PolyDerivative(ConstRealVector coef, RealVector derivative) {
    for (int32_t k = 1; k < coef.size(); ++k)
        derivative[k - 1] = k * coef[k];
}

double NewtonRoot(ConstRealVector coef, ConstRealVector derivative, double guess,
                  const RootLimits &limits) {
    constexpr int32_t stallLimit = 5;
    double root = guess, x = guess, best = 1e30;
    double value = Evaluate(coef, x);
    if (value == 0.0)
        return root;
    double slope = Evaluate(derivative, x);
    double step = slope != 0.0 ? value / slope : 1.0;
    double size = std::fabs(step);
    int32_t stalled = 0;
    for (int32_t left = limits.iterations; left > 0; --left) {
        value = Evaluate(coef, x);
        if (value == 0.0)
            return x;
        slope = Evaluate(derivative, x);
        if (best > std::fabs(value)) {
            root = x;
            best = std::fabs(value);
            stalled = 0;
        }
        // A step of at least five times the length of the last one is refused, and the last one is
        // repeated.
        if (slope != 0.0 && std::fabs(value / slope) < 5.0 * size) {
            step = value / slope;
            size = std::fabs(step);
        }
        if (x != 0.0 && (size / std::fabs(x) < limits.tolerance || stalled == stallLimit))
            return root;
        x -= step;
        ++stalled;
    }
    return root;
}

ErrorCode BairstowRoots(ConstRealVector coef, ConstComplexVector guesses, const RootLimits &limits,
                        ComplexVector roots) {
    const std::ptrdiff_t n = coef.size(), count = guesses.size();
    QX_EXPECTS(roots.size() == count);
    if (n < 4 || count < 2) {
        for (std::ptrdiff_t i = 0; i < count; ++i)
            roots[i] = guesses[i];
        return 0;
    }
    RealVector b, c;
    ComplexVector pairs;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(b, n), Sized(c, n), Sized(pairs, count)))
        return failed;
    // Real pairs are written to the output directly; conjugate pairs are stored until they can
    // follow them.
    std::ptrdiff_t realCount = 0, complexCount = 0;
    for (std::ptrdiff_t i = 0; i + 1 < count; i += 2) {
        QuadraticFactor factor(guesses[i], guesses[i + 1]);
        factor.refine(coef, limits, b, c);
        CDB solved[2];
        const bool isReal = factor.solve(solved);
        CDB *const to = isReal ? &roots[realCount] : &pairs[complexCount];
        to[0] = solved[0];
        to[1] = solved[1];
        (isReal ? realCount : complexCount) += 2;
    }
    for (std::ptrdiff_t i = 0; i < complexCount; ++i)
        roots[realCount + i] = pairs[i];
    if (count % 2 != 0)
        roots[count - 1] = guesses[count - 1];
    return 0;
}

} // namespace qx
