#include "poly/polished_roots.h"

#include "frame/scratch.h"

#include <cmath>

namespace qx {
namespace {

double Evaluate(const DBL *coef, int32_t n, double x) {
    double value = 0.0;
    PolyEvaluateReal(&x, 1, coef, n, &value);
    return value;
}

// The quadratic factor x^2 - r x - s of a polynomial, and what changes it.
class QuadraticFactor {
public:
    QuadraticFactor(const CDB *guesses)
        : r_(guesses[0].re + guesses[1].re),
          s_(-(guesses[0].re * guesses[1].re - guesses[0].im * guesses[1].im)) {
        limitR_ = std::fabs(r_) * 1e12 < std::fabs(s_) ? 1.2 : 0.1;
        limitS_ = std::fabs(r_) * 1e-12 > std::fabs(s_) ? 1.2 : 0.1;
    }

    // b and c have n places each, n at least 4.
    void refine(const DBL *a, int32_t n, int32_t maxIterations, double tolerance, DBL *b, DBL *c) {
        for (int32_t left = maxIterations; left > 0; --left) {
            divide(a, n, b, c);
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
            if (!shrinks || (changeR < tolerance && changeS < tolerance))
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
    // b becomes the quotient by the factor, with the remainder in its first two places, and c the
    // same for b, which holds the derivatives of the remainder.
    void divide(const DBL *a, int32_t n, DBL *b, DBL *c) const {
        b[n - 1] = a[n - 1];
        b[n - 2] = a[n - 2] + r_ * b[n - 1];
        c[n - 1] = b[n - 1];
        c[n - 2] = b[n - 2] + r_ * c[n - 1];
        for (int32_t j = n - 3; j >= 0; --j) {
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

void PolyEvaluateReal(const DBL *x, int32_t count, const DBL *coef, int32_t n, DBL *out) {
    for (int32_t i = 0; i < count; ++i) {
        double value = n > 0 ? coef[n - 1] : 0.0;
        for (int32_t k = n - 2; k >= 0; --k)
            value = value * x[i] + coef[k];
        out[i] = value;
    }
}

void PolyDerivative(const DBL *coef, int32_t n, DBL *derivative) {
    for (int32_t k = 1; k < n; ++k)
        derivative[k - 1] = k * coef[k];
}

void NewtonRoot(const DBL *coef, int32_t n, double guess, int32_t maxIterations, double tolerance,
                DBL *root, const DBL *derivative) {
    constexpr int32_t stallLimit = 5;
    *root = guess;
    double x = guess, best = 1e30;
    double value = Evaluate(coef, n, x);
    if (value == 0.0)
        return;
    double slope = Evaluate(derivative, n - 1, x);
    double step = slope != 0.0 ? value / slope : 1.0;
    double size = std::fabs(step);
    int32_t stalled = 0;
    for (int32_t left = maxIterations; left > 0; --left) {
        value = Evaluate(coef, n, x);
        if (value == 0.0) {
            *root = x;
            return;
        }
        slope = Evaluate(derivative, n - 1, x);
        if (best > std::fabs(value)) {
            *root = x;
            best = std::fabs(value);
            stalled = 0;
        }
        // A step five times as long as the last one is refused, and that is taken again.
        if (slope != 0.0 && std::fabs(value / slope) < 5.0 * size) {
            step = value / slope;
            size = std::fabs(step);
        }
        if (x != 0.0 && (size / std::fabs(x) < tolerance || stalled == stallLimit))
            return;
        x -= step;
        ++stalled;
    }
}

ErrorCode BairstowRoots(const DBL *coef, int32_t n, const CDB *guesses, int32_t guessCount,
                        int32_t maxIterations, double tolerance, CDB *roots, int32_t *rootCount) {
    *rootCount = guessCount;
    if (n < 4 || guessCount < 2) {
        for (int32_t i = 0; i < guessCount; ++i)
            roots[i] = guesses[i];
        return 0;
    }
    Scratch<ElementType::DBL> work;
    if (const ErrorCode failed = work.allocate(2 * int64_t{n}))
        return failed;
    Scratch<ElementType::CDB> pairs;
    if (const ErrorCode failed = pairs.allocate(guessCount))
        return failed;
    // Real pairs go straight to the output and conjugate ones wait for their place behind them.
    int32_t realCount = 0, complexCount = 0;
    for (int32_t i = 0; i + 1 < guessCount; i += 2) {
        QuadraticFactor factor(guesses + i);
        factor.refine(coef, n, maxIterations, tolerance, work.data(), work.data() + n);
        CDB solved[2];
        const bool isReal = factor.solve(solved);
        CDB *const to = isReal ? roots + realCount : pairs.data() + complexCount;
        to[0] = solved[0];
        to[1] = solved[1];
        (isReal ? realCount : complexCount) += 2;
    }
    for (int32_t i = 0; i < complexCount; ++i)
        roots[realCount + i] = pairs[i];
    if (guessCount % 2 != 0)
        roots[guessCount - 1] = guesses[guessCount - 1];
    return Merge(work.release(), pairs.release());
}

} // namespace qx
