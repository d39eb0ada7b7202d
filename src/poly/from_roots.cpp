#include "frame/constants.h"
#include "frame/scratch.h"
#include "poly/arithmetic.h"
#include "poly/complex_arithmetic.h"
#include "poly/root_products.h"

#include <cmath>

namespace qx {

namespace {

constexpr auto Complex = ElementType::CDB;

// Equal roots are as good as next to each other: then the second round of each follows Leja's order
// like the first.
double LogDistance(CDB a, CDB b) {
    constexpr double least = 0x1p-1022;
    const double distance = ScaledHypot(a - b);
    return std::log(distance > least ? distance : least);
}
double LogSize(CDB a) { return LogDistance(a, {}); }

// A real root, or one above the real axis that stands for its conjugate, too.
bool IsPair(CDB root) { return root.im != 0.0; }

// Real roots, and the means of conjugates with the imaginary part above 0.
class ConjugatePairs {
public:
    // ErrOutOfMemory; ErrBadCoefficients.
    ErrorCode collect(const CDB *roots, int32_t n) {
        if (const ErrorCode failed = factors_.allocate(n))
            return failed;
        Scratch<Complex> below;
        if (const ErrorCode failed = below.allocate(n))
            return failed;
        int32_t belowCount = 0;
        for (int32_t i = 0; i < n; ++i) {
            if (2.0 * std::fabs(roots[i].im) <= allowance(roots[i]))
                append({roots[i].re, 0.0});
            else if (roots[i].im < 0.0)
                below[belowCount++] = Conj(roots[i]);
        }
        for (int32_t i = 0; i < n; ++i) {
            if (!(roots[i].im > 0.0) || 2.0 * roots[i].im <= allowance(roots[i]))
                continue;
            const int32_t partner = nearest(below.data(), belowCount, roots[i]);
            if (partner < 0)
                return ErrBadCoefficients;
            append(roots[i] * 0.5 + below[partner] * 0.5);
            below[partner] = below[--belowCount];
        }
        return belowCount == 0 ? below.release() : ErrBadCoefficients;
    }
    int32_t count() const { return count_; }
    CDB operator[](int32_t i) const { return factors_[i]; }

private:
    static double allowance(CDB root) { return 1e-10 * ScaledHypot(root); }
    void append(CDB root) { factors_[count_++] = root; }
    static int32_t nearest(const CDB *others, int32_t count, CDB root) {
        int32_t best = -1;
        double least = kInfinity;
        for (int32_t j = 0; j < count; ++j) {
            const double distance = ScaledHypot(others[j] - root);
            if (distance <= allowance(root) && distance < least) {
                best = j;
                least = distance;
            }
        }
        return best;
    }

    Scratch<Complex> factors_;
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

ErrorCode FromRoots(const CDB *roots, int32_t n, DBL *p) {
    ConjugatePairs factors;
    if (const ErrorCode failed = factors.collect(roots, n))
        return failed;
    Scratch<ElementType::I32> order;
    if (const ErrorCode failed = order.allocate(factors.count()))
        return failed;
    Scratch<ElementType::DBL> sums;
    if (const ErrorCode failed = sums.allocate(factors.count()))
        return failed;
    LejaOrder(
        factors.count(), [&](int32_t j) { return LogSize(factors[j]); },
        [&](int32_t j, int32_t i) {
            const double distance = LogDistance(factors[j], factors[i]);
            return IsPair(factors[i]) ? distance + LogDistance(factors[j], Conj(factors[i]))
                                      : distance;
        },
        order.data(), sums.data());
    p[0] = 1.0;
    int32_t degree = 0;
    for (int32_t i = 0; i < factors.count(); ++i) {
        const CDB root = factors[order[i]];
        MultiplyByReal(p, degree, root);
        degree += IsPair(root) ? 2 : 1;
    }
    Reverse(p, std::ptrdiff_t{n} + 1);
    return Merge(order.release(), sums.release());
}

ErrorCode FromRoots(const CDB *roots, int32_t n, CDB *p) {
    Scratch<ElementType::I32> order;
    if (const ErrorCode failed = order.allocate(n))
        return failed;
    Scratch<ElementType::DBL> sums;
    if (const ErrorCode failed = sums.allocate(n))
        return failed;
    LejaOrder(
        n, [roots](int32_t j) { return LogSize(roots[j]); },
        [roots](int32_t j, int32_t i) { return LogDistance(roots[j], roots[i]); }, order.data(),
        sums.data());
    GrowingProduct product(p);
    for (int32_t i = 0; i < n; ++i)
        product.multiply(roots[order[i]]);
    for (std::ptrdiff_t i = 0, j = n; i < j; ++i, --j)
        Swap(&p[i], &p[j]);
    return Merge(order.release(), sums.release());
}

} // namespace qx
