#include "frame/constants.h"
#include "frame/scratch.h"
#include "poly/arithmetic.h"
#include "poly/complex_arithmetic.h"
#include "poly/root_products.h"

#include <cmath>

namespace qx {

namespace {

// Equal roots count as very close to each other, so that the second occurrences follow Leja's order
// like the first ones.
double LogDistance(CDB a, CDB b) {
    constexpr double least = 0x1p-1022;
    const double distance = ScaledHypot(a - b);
    return std::log(distance > least ? distance : least);
}
double LogSize(CDB a) { return LogDistance(a, {}); }

// Whether a root is above the real axis, and so represents its conjugate, too; otherwise it is real.
bool IsPair(CDB root) { return root.im != 0.0; }

// The real roots, and for each conjugate pair the mean of the upper root and the conjugate of the
// lower one.
class ConjugatePairs {
public:
    // ErrOutOfMemory; ErrBadCoefficients.
    ErrorCode collect(ConstComplexVector roots) {
        ComplexVector below;
        if (const ErrorCode failed =
                memory_.take(Sized(factors_, roots.size()), Sized(below, roots.size())))
            return failed;
        int32_t belowCount = 0;
        for (const CDB root : roots) {
            if (2.0 * std::fabs(root.im) <= allowance(root))
                append({root.re, 0.0});
            else if (root.im < 0.0)
                below[belowCount++] = Conj(root);
        }
        for (const CDB root : roots) {
            if (!(root.im > 0.0) || 2.0 * root.im <= allowance(root))
                continue;
            const int32_t partner = nearest(below.part(0, belowCount), root);
            if (partner < 0)
                return ErrBadCoefficients;
            append(root * 0.5 + below[partner] * 0.5);
            below[partner] = below[--belowCount];
        }
        return belowCount == 0 ? 0 : ErrBadCoefficients;
    }
    int32_t count() const { return count_; }
    CDB operator[](int32_t i) const { return factors_[i]; }

private:
    static double allowance(CDB root) { return 1e-10 * ScaledHypot(root); }
    void append(CDB root) { factors_[count_++] = root; }
    static int32_t nearest(ComplexVector others, CDB root) {
        int32_t best = -1;
        double least = kInfinity;
        for (int32_t j = 0; j < others.size(); ++j) {
            const double distance = ScaledHypot(others[j] - root);
            if (distance <= allowance(root) && distance < least) {
                best = j;
                least = distance;
            }
        }
        return best;
    }

    ComplexVector factors_;
    ScratchParts memory_;
    int32_t count_ = 0;
};

// Multiplies descending coefficients a[0..degree] by x - root, or for a pair by
// (x - root) (x - conjugate).
void MultiplyByReal(DBL *a, int32_t degree, CDB root) {
    if (!IsPair(root)) {
        a[degree + 1] = 0.0;
        for (std::ptrdiff_t i = degree + 1; i > 0; --i)
            a[i] -= root.re * a[i - 1];
        return;
    }
    const double sum = 2.0 * root.re, product = SquaredModulus(root);
    a[degree + 1] = a[degree + 2] = 0.0;
    for (std::ptrdiff_t i = degree + 2; i > 1; --i)
        a[i] = (a[i] - sum * a[i - 1]) + product * a[i - 2];
    a[1] -= sum * a[0];
}

} // namespace

ErrorCode FromRoots(ConstComplexVector roots, RealVector p) {
    QX_EXPECTS(p.size() == roots.size() + 1);
    ConjugatePairs factors;
    if (const ErrorCode failed = factors.collect(roots))
        return failed;
    I32 *order;
    DBL *sums;
    ScratchParts memory;
    if (const ErrorCode failed =
            memory.take(Sized(order, factors.count()), Sized(sums, factors.count())))
        return failed;
    LejaOrder(
        factors.count(), [&](int32_t j) { return LogSize(factors[j]); },
        [&](int32_t j, int32_t i) {
            const double distance = LogDistance(factors[j], factors[i]);
            return IsPair(factors[i]) ? distance + LogDistance(factors[j], Conj(factors[i]))
                                      : distance;
        },
        order, sums);
    p[0] = 1.0;
    int32_t degree = 0;
    for (int32_t i = 0; i < factors.count(); ++i) {
        const CDB root = factors[order[i]];
        MultiplyByReal(p.data(), degree, root);
        degree += IsPair(root) ? 2 : 1;
    }
    Reverse(p.data(), p.size());
    return 0;
}

ErrorCode FromRoots(ConstComplexVector roots, ComplexVector p) {
    QX_EXPECTS(p.size() == roots.size() + 1);
    const auto n = static_cast<int32_t>(roots.size());
    I32 *order;
    DBL *sums;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(order, n), Sized(sums, n)))
        return failed;
    LejaOrder(
        n, [roots](int32_t j) { return LogSize(roots[j]); },
        [roots](int32_t j, int32_t i) { return LogDistance(roots[j], roots[i]); }, order, sums);
    GrowingProduct product(p.data());
    for (int32_t i = 0; i < n; ++i)
        product.multiply(roots[order[i]]);
    for (std::ptrdiff_t i = 0, j = n; i < j; ++i, --j)
        Swap(&p[i], &p[j]);
    return 0;
}

} // namespace qx
