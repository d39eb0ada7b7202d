#include "poly/simultaneous_roots.h"

#include "frame/constants.h"
#include "frame/scratch.h"
#include "poly/complex_arithmetic.h"

#include <algorithm>
#include <cmath>
#include <limits>

namespace qx {
namespace {

typedef VectorView<ElementType::I32> Integers;

constexpr double ln2 = 0x1.62e42fefa39efp-1;

// a b = product + error, without a fused operation (T. J. Dekker, 1971).
struct Split {
    explicit Split(double a) {
        const double scaled = a * 134217729.0; // 2^27 + 1
        high = scaled - (scaled - a);
        low = a - high;
    }
    double high, low;
};
double ErrorOfProduct(double product, const Split &a, const Split &b) {
    return a.low * b.low - (((product - a.high * b.high) - a.low * b.high) - a.high * b.low);
}
// a + b = sum + error (D. E. Knuth).
double ErrorOfSum(double sum, double a, double b) {
    const double other = sum - a;
    return (a - (sum - other)) + (b - other);
}

double Size(CDB z) { return ScaledHypot(z); }
CDB Reciprocal(CDB z) {
    const double squares = z.re * z.re + z.im * z.im;
    if (squares > 0x1p-900 && squares < 0x1p900)
        return {z.re / squares, -z.im / squares};
    return Quotient(CDB{1.0, 0.0}, z);
}
CDB TimesPower(CDB z, int k) { return {std::ldexp(z.re, k), std::ldexp(z.im, k)}; }

// The value of the scaled polynomial at t, its derivative, and the sum of |b[i]| |t|^i.
struct Value {
    CDB p, slope;
    double sum;
};

// b[0] + b[1] t + ... with t = z / 2^k: the coefficients a[i] 2^(k i), all times one power of two
// that brings the largest near 1.
class ScaledPolynomial {
public:
    // `exponents` holds the binary exponents of the coefficients; b and sizes are work memory.
    ScaledPolynomial(ConstComplexVector a, Integers exponents, ComplexVector b, RealVector sizes)
        : a_(a), exponents_(exponents), b_(b), sizes_(sizes), n_(int32_t(a.size()) - 1) {}

    int32_t degree() const { return n_; }

    // Returns t for z, and scales the coefficients accordingly.
    CDB at(CDB z) {
        int k;
        const double fraction = std::frexp(Size(z), &k);
        k -= fraction < kRootHalf ? 1 : 0;
        if (k != k_)
            scale(k);
        return TimesPower(z, -k);
    }
    int power() const { return k_; }
    CDB coefficient(int32_t i) const { return b_[i]; }
    double sizeOf(int32_t i) const { return sizes_[i]; }

    Value value(CDB t) const {
        const double r = Size(t);
        Value v = {b_[n_], {0.0, 0.0}, sizes_[n_]};
        for (int32_t i = n_ - 1; i >= 0; --i) {
            v.slope = v.slope * t + v.p;
            v.p = v.p * t + b_[i];
            v.sum = v.sum * r + sizes_[i];
        }
        return v;
    }

    // The value as if computed in twice the precision and then rounded.
    Value accurateValue(CDB t) const {
        const double r = Size(t);
        const Split re(t.re), im(t.im);
        Value v = {b_[n_], {0.0, 0.0}, sizes_[n_]};
        CDB error = {0.0, 0.0};
        for (int32_t i = n_ - 1; i >= 0; --i) {
            v.slope = v.slope * t + v.p;
            v.sum = v.sum * r + sizes_[i];
            const Split pRe(v.p.re), pIm(v.p.im);
            const double rr = v.p.re * t.re, ii = v.p.im * t.im;
            const double ri = v.p.re * t.im, ir = v.p.im * t.re;
            const double real = rr - ii, imag = ri + ir;
            const CDB rounding = {
                ErrorOfProduct(rr, pRe, re) - ErrorOfProduct(ii, pIm, im) +
                    ErrorOfSum(real, rr, -ii) + ErrorOfSum(real + b_[i].re, real, b_[i].re),
                ErrorOfProduct(ri, pRe, im) + ErrorOfProduct(ir, pIm, re) +
                    ErrorOfSum(imag, ri, ir) + ErrorOfSum(imag + b_[i].im, imag, b_[i].im)};
            v.p = {real + b_[i].re, imag + b_[i].im};
            error = error * t + rounding;
        }
        v.p = v.p + error;
        return v;
    }

    // Whether rounding errors of the coefficients can explain the value.
    bool isRoot(const Value &v) const { return Size(v.p) <= 4.0 * n_ * epsilon * v.sum; }

    // The error bound of accurateValue.
    double uncertainty(const Value &v) const {
        return epsilon * Size(v.p) + 8.0 * n_ * n_ * (epsilon * epsilon) * v.sum;
    }

private:
    void scale(int k) {
        k_ = k;
        int64_t largest = std::numeric_limits<int64_t>::min();
        for (int32_t i = 0; i <= n_; ++i)
            if (exponents_[i] != nothing)
                largest = std::max(largest, exponents_[i] + int64_t{k} * i);
        for (int32_t i = 0; i <= n_; ++i) {
            const int64_t power = int64_t{k} * i - largest;
            b_[i] = TimesPower(a_[i], int(std::clamp<int64_t>(power, -4000, 4000)));
            sizes_[i] = Size(b_[i]);
        }
    }

public:
    static constexpr int32_t nothing = std::numeric_limits<int32_t>::min(); // exponent of 0

private:
    ConstComplexVector a_;
    Integers exponents_;
    ComplexVector b_;
    RealVector sizes_;
    int32_t n_;
    int k_ = std::numeric_limits<int>::min();
};

// The binary exponent and the base-2 logarithm of a modulus that may overflow.
int ExponentOf(CDB z) {
    int exponent;
    std::frexp(std::max(std::fabs(z.re), std::fabs(z.im)), &exponent);
    return exponent;
}
double Log2(CDB z) {
    const int exponent = ExponentOf(z);
    return exponent + std::log(Size(TimesPower(z, -exponent))) * (1.0 / ln2);
}

// Points on circles whose radii follow from the slopes of the upper convex hull of log |a[i]| over
// i.
class Start {
public:
    // `logs` and `hull` are work memory with as many elements as there are coefficients.
    Start(ConstComplexVector a, RealVector logs, Integers hull)
        : n_(int32_t(a.size()) - 1), logs_(logs), hull_(hull) {
        for (int32_t i = 0; i <= n_; ++i)
            logs_[i] = IsZero(a[i]) ? -kInfinity : Log2(a[i]);
    }

    ErrorCode place(ComplexVector z) {
        const int32_t corners = findHull();
        for (int32_t edge = 0; edge + 1 < corners; ++edge) {
            const int32_t first = hull_[edge], count = hull_[edge + 1] - first;
            const double log = (logs_[first] - logs_[first + count]) / count;
            if (!(std::fabs(log) < 1020.0))
                return ErrOverflow;
            const double whole = std::floor(log);
            const double radius = std::ldexp(std::exp((log - whole) * ln2), int(whole));
            for (int32_t i = 0; i < count; ++i) {
                constexpr double turned = 0.7;
                const double angle = kTwoPi * (double(i) / count + double(first) / n_) + turned;
                z[first + i] = {radius * std::cos(angle), radius * std::sin(angle)};
            }
        }
        return 0;
    }

private:
    int32_t findHull() {
        int32_t corners = 0;
        for (int32_t i = 0; i <= n_; ++i) {
            if (logs_[i] == -kInfinity)
                continue;
            while (corners > 1 && !isAbove(hull_[corners - 2], hull_[corners - 1], i))
                --corners;
            hull_[corners++] = i;
        }
        return corners;
    }
    // Whether point b is above the line from a to c.
    bool isAbove(int32_t a, int32_t b, int32_t c) const {
        return (logs_[b] - logs_[a]) * (c - a) > (logs_[c] - logs_[a]) * (b - a);
    }

    int32_t n_;
    RealVector logs_;
    Integers hull_;
};

class Iteration {
public:
    Iteration(ScaledPolynomial &polynomial, ComplexVector z, Integers isDone)
        : polynomial_(polynomial), z_(z), isDone_(isDone), n_(polynomial.degree()) {}

    ErrorCode run() {
        constexpr int32_t sweeps = 600;
        if (!sweep(sweeps, [this](int32_t i) { return improve(i); }))
            return ErrIterationLimit;
        // Clusters may not have converged yet, which is not a failure.
        sweep(accurateSweeps, [this](int32_t i) { return refine(i); });
        return 0;
    }
    // Finishes the iteration after roots in clusters have been made conjugate; partner[i] is the
    // partner of root i.
    void settle(Integers partner) {
        sweep(accurateSweeps, [this, partner](int32_t i) {
            const CDB t = polynomial_.at(z_[i]);
            const Value v = polynomial_.accurateValue(t);
            if (Size(v.p) <= n_ * epsilon * v.sum)
                return true;
            move(i, step(i, v), v);
            if (partner[i] == i)
                z_[i].im = 0.0;
            else
                z_[partner[i]] = {z_[i].re, -z_[i].im};
            return false;
        });
    }

private:
    static constexpr int32_t accurateSweeps = 60;

    template <class Step>
    bool sweep(int32_t limit, Step step) {
        for (int32_t i = 0; i < n_; ++i)
            isDone_[i] = 0;
        int32_t left = n_;
        for (int32_t round = 0; round < limit && left > 0; ++round)
            for (int32_t i = 0; i < n_; ++i)
                if (isDone_[i] == 0 && step(i)) {
                    isDone_[i] = 1;
                    --left;
                }
        return left == 0;
    }

    // A step for which plain precision suffices; returns true if the value is within rounding
    // errors.
    bool improve(int32_t i) {
        const CDB t = polynomial_.at(z_[i]);
        const Value v = polynomial_.value(t);
        if (Size(v.p) <= 2.0 * n_ * epsilon * v.sum)
            return true;
        move(i, step(i, v), v);
        return false;
    }
    bool refine(int32_t i) {
        const CDB t = polynomial_.at(z_[i]);
        const Value v = polynomial_.accurateValue(t);
        if (Size(v.p) <= polynomial_.uncertainty(v))
            return true;
        const CDB change = step(i, v);
        move(i, change, v);
        return Size(change) <= 0.5 * epsilon * Size(z_[i]) && polynomial_.isRoot(v);
    }

    // 1 / (p' / p - sum of 1 / (z[i] - z[j])).
    CDB step(int32_t i, const Value &v) const {
        const CDB z = z_[i];
        CDB sum = {0.0, 0.0};
        for (int32_t j = 0; j < n_; ++j)
            if (j != i) {
                const CDB difference = z - z_[j];
                if (IsZero(difference))
                    return z * 0x1p-30; // moves away from the other root
                sum = sum + Reciprocal(difference);
            }
        const CDB slope = TimesPower(Quotient(v.slope, v.p), -polynomial_.power());
        return Reciprocal(slope - sum);
    }
    // Moves the point by the step, or aside if it lies between two roots or too near another point.
    void move(int32_t i, CDB change, const Value &v) {
        if (!IsFinite(change))
            change = CDB{0.0, 0.125} * z_[i];
        else if (Size(change) <= epsilon * Size(z_[i]) && !polynomial_.isRoot(v))
            change = CDB{0x1p-20, 0x1p-21} * z_[i];
        z_[i] = z_[i] - change;
    }

    ScaledPolynomial &polynomial_;
    ComplexVector z_;
    Integers isDone_;
    int32_t n_;
};

// Makes the roots of a real polynomial real or conjugate pairs: starting with those farthest from the
// real axis, each is paired with the root nearest to its conjugate, or made real if the axis is
// nearer. partners[i] is the other root of a pair, or i.
void MakeConjugate(ComplexVector z, Integers partners) {
    constexpr int32_t none = -1;
    const auto n = static_cast<int32_t>(z.size());
    for (int32_t i = 0; i < n; ++i)
        partners[i] = none;
    for (;;) {
        int32_t farthest = -1;
        for (int32_t i = 0; i < n; ++i)
            if (partners[i] == none &&
                (farthest < 0 || std::fabs(z[i].im) > std::fabs(z[farthest].im)))
                farthest = i;
        if (farthest < 0)
            return;
        const CDB root = z[farthest];
        partners[farthest] = farthest;
        int32_t partner = none;
        double nearest = 2.0 * std::fabs(root.im);
        for (int32_t j = 0; j < n; ++j)
            if (partners[j] == none) {
                const double distance = Size(z[j] - CDB{root.re, -root.im});
                if (distance < nearest) {
                    nearest = distance;
                    partner = j;
                }
            }
        if (partner == none) {
            z[farthest].im = 0.0;
            continue;
        }
        partners[farthest] = partner;
        partners[partner] = farthest;
        z[partner] = {root.re, -root.im};
    }
}

// A radius around z in which the polynomial has a root: the least of (binomial(n, k) |p| / |p^(k) /
// k!|)^(1/k) over the derivatives (P. Henrici, "Applied and Computational Complex Analysis", 1974).
// For a simple root the first derivative suffices; the others are used where its radius is large.
class Radius {
public:
    // taylor and sizes are work memory with as many elements as there are coefficients.
    Radius(ScaledPolynomial &polynomial, ComplexVector taylor, RealVector sizes)
        : polynomial_(polynomial), taylor_(taylor), sizes_(sizes), n_(polynomial.degree()) {}

    // ErrIterationLimit if z is not a root.
    ErrorCode around(CDB z, DBL *result) {
        const CDB t = polynomial_.at(z);
        const Value v = polynomial_.accurateValue(t);
        if (!polynomial_.isRoot(v))
            return ErrIterationLimit;
        const double size = Size(v.p) + polynomial_.uncertainty(v);
        const double slope = Size(v.slope) - 8.0 * n_ * n_ * epsilon * v.sum;
        double radius = slope > 0.0 ? n_ * size / slope : kInfinity;
        constexpr double small = 1e-6;
        if (!(radius < small))
            radius = std::min(radius, byHigherDerivatives(t, size));
        *result = std::ldexp(radius, polynomial_.power());
        return 0;
    }

private:
    double byHigherDerivatives(CDB t, double size) {
        constexpr int32_t most = 12;
        const double r = Size(t);
        double least = std::pow(size / polynomial_.sizeOf(n_), 1.0 / n_);
        for (int32_t i = 0; i <= n_; ++i) {
            taylor_[i] = polynomial_.coefficient(i);
            sizes_[i] = polynomial_.sizeOf(i);
        }
        double logBinomial = 0.0;
        for (int32_t k = 0; k <= std::min(most, n_ - 1); ++k) {
            for (int32_t i = n_ - 1; i >= k; --i) {
                taylor_[i] = taylor_[i] + taylor_[i + 1] * t;
                sizes_[i] = sizes_[i] + sizes_[i + 1] * r;
            }
            if (k == 0)
                continue;
            logBinomial += std::log(double(n_ - k + 1) / k);
            // Subtracts what rounding may have added to it.
            const double derivative = Size(taylor_[k]) - 8.0 * n_ * epsilon * sizes_[k];
            if (derivative > 0.0)
                least = std::min(least, std::exp((std::log(size / derivative) + logBinomial) / k));
        }
        return least;
    }

    ScaledPolynomial &polynomial_;
    ComplexVector taylor_;
    RealVector sizes_;
    int32_t n_;
};

// Sorts by ascending modulus; the conjugates of a pair, which have the same modulus, stay together.
void SortByModulus(ComplexVector z, RealVector moduli) {
    const auto n = static_cast<int32_t>(z.size());
    const auto isBefore = [&](int32_t i, CDB root, double modulus) {
        if (moduli[i] != modulus)
            return moduli[i] < modulus;
        return z[i].re != root.re ? z[i].re > root.re : z[i].im >= root.im;
    };
    for (int32_t i = 0; i < n; ++i)
        moduli[i] = Size(z[i]);
    for (int32_t i = 1; i < n; ++i) {
        const CDB root = z[i];
        const double modulus = moduli[i];
        int32_t at = i;
        for (; at > 0 && !isBefore(at - 1, root, modulus); --at) {
            z[at] = z[at - 1];
            moduli[at] = moduli[at - 1];
        }
        z[at] = root;
        moduli[at] = modulus;
    }
}

} // namespace

int32_t DegreeOf(ConstComplexVector coef) {
    for (const CDB &coefficient : coef)
        if (!IsFinite(coefficient))
            return -1;
    auto n = static_cast<int32_t>(coef.size());
    while (n > 0 && IsZero(coef[n - 1]))
        --n;
    return n < 2 ? -1 : n - 1;
}

ErrorCode SimultaneousRoots(ConstComplexVector coef, bool isReal, ComplexVector roots,
                            RealVector radii) {
    const auto degree = static_cast<int32_t>(roots.size());
    QX_EXPECTS(degree == DegreeOf(coef) && radii.size() == degree);
    int32_t zeros = 0;
    for (; IsZero(coef[zeros]); ++zeros) {
        roots[zeros] = {0.0, 0.0};
        radii[zeros] = 0.0;
    }
    if (zeros == degree)
        return 0;
    const int32_t n = degree - zeros;
    const ConstComplexVector a = coef.part(zeros, n + 1);
    const ComplexVector z = roots.part(zeros, n);
    ComplexVector scaled, taylor;
    RealVector sizes, logs;
    Integers exponents, work, partners;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(
            Sized(scaled, n + 1), Sized(taylor, n + 1), Sized(sizes, n + 1), Sized(logs, n + 1),
            Sized(exponents, n + 1), Sized(work, n + 1), Sized(partners, isReal ? n : 0)))
        return failed;
    for (int32_t i = 0; i <= n; ++i)
        exponents[i] = IsZero(a[i]) ? ScaledPolynomial::nothing : ExponentOf(a[i]);
    if (const ErrorCode failed = Start(a, logs, work).place(z))
        return failed;
    ScaledPolynomial polynomial(a, exponents, scaled, sizes);
    Iteration iteration(polynomial, z, work.part(0, n));
    if (const ErrorCode failed = iteration.run())
        return failed;
    if (isReal) {
        MakeConjugate(z, partners);
        iteration.settle(partners);
    }
    SortByModulus(z, logs.part(0, n));
    Radius radius(polynomial, taylor, logs);
    for (int32_t i = 0; i < n; ++i)
        if (const ErrorCode failed = radius.around(z[i], &radii[zeros + i]))
            return failed;
    return 0;
}

} // namespace qx
