#include "poly/simple_roots.h"

#include "frame/complex.h"
#include "frame/constants.h"
#include "linalg/scalar.h"

#include <algorithm>
#include <cmath>

namespace qx {
namespace {

constexpr double smallest = 0x1p-500, largest = 0x1p500; // of what is multiplied here

bool IsInRange(double x) { return x > smallest && x < largest; }

// What a coefficient may change by, in tolerances.
double Allowance(CDB coefficient) { return std::max(1.0, AbsSum(coefficient)); }

bool AreConjugate(CDB a, CDB b) { return a.re == b.re && a.im == -b.im; }

bool IsReal(const CDB *p, int32_t n) {
    return std::all_of(p, p + n + 1, [](CDB coefficient) { return coefficient.im == 0.0; });
}

// More than what the derivative of a polynomial of degree n within the tolerance of p may be at a
// common root of this modulus.
double LargestSlope(const CDB *p, int32_t n, double tolerance, double modulus) {
    double sum = 0.0;
    for (int32_t k = 0; k < n; ++k)
        sum = sum * modulus + Allowance(p[k] * (double(n - k) / n));
    return n * tolerance * sum;
}

} // namespace

ErrorCode SimpleRootsProof::allocate(int32_t maxDegree) {
    return memory_.take(Sized(product_, maxDegree), Sized(inverses_, maxDegree),
                        Sized(least_, maxDegree), Sized(radius_, maxDegree));
}

// Returns false if roots coincide, or lie too close together or too far apart for the range.
bool SimpleRootsProof::measureDistances(const CDB *roots, int32_t n) {
    for (int32_t i = 0; i < n; ++i) {
        double product = 1.0, inverses = 0.0, least = kInfinity;
        for (int32_t j = 0; j < i; ++j) {
            const double distance = std::sqrt(SquaredModulus(roots[i] - roots[j]));
            const double inverse = 1.0 / distance;
            product *= distance;
            inverses += inverse;
            least = std::min(least, distance);
            product_[j] *= distance;
            inverses_[j] += inverse;
            least_[j] = std::min(double(least_[j]), distance);
            if (!IsInRange(distance) || !IsInRange(product) || !IsInRange(product_[j]))
                return false;
        }
        product_[i] = product;
        inverses_[i] = inverses;
        least_[i] = least;
    }
    return true;
}

// A bound for the values at the root of all polynomials within the tolerance of p.
double SimpleRootsProof::backwardError(const CDB *p, int32_t n, double tolerance, CDB root) const {
    const double modulus = std::sqrt(SquaredModulus(root));
    CDB value = {};
    double sum = 0.0;
    for (int32_t k = 0; k <= n; ++k) {
        value = value * root + p[k];
        sum = sum * modulus + Allowance(p[k]);
    }
    return AbsSum(value) + (tolerance + 8.0 * n * kEpsilon) * sum;
}

// With P the product of all x - z[i], a polynomial q within the tolerance of p is, by Lagrange's
// interpolation, P(x) (q[0] + the sum of c[i] / (x - z[i])), where |c[i]| <= W[i], the bound of
// |q(z[i])| divided by |P'(z[i])|. So a root x of q satisfies |q[0]| <= the sum of W[i] / |x -
// z[i]|. With s the sum of W[i] / (distance of z[i] from its nearest neighbour), no root is then
// outside all discs around z[i] with a quarter of that distance as radius if 4 s < |q[0]|, and a
// root in disc i is within r = W[i] / (|q[0]| - s / (1 - 1/4)) of z[i]. There, with Q the product of
// all factors but x - z[i],
//     |p'(x)| >= |Q(x)| (|p[0]| - (1 + 1/3) a - (r (1 + a) + W[i]) |Q'(x) / Q(x)|)
// where a bounds the sum of all other W[j] / |x - z[j]|. A common root of u v and u w would have
// to lie there, and |p'| would be below LargestSlope.
bool SimpleRootsProof::holds(const CDB *p, int32_t n, double tolerance, const CDB *roots) {
    // For the rounding errors of the search, whose residuals are computed, and of this proof.
    const double widened = 1.5 * tolerance + 64.0 * n * kEpsilon;
    if (!(widened < 1e-3) || !(std::fabs(p[0].re - 1.0) + std::fabs(p[0].im) < 1e-3))
        return false;
    if (!measureDistances(roots, n))
        return false;
    const bool isReal = IsReal(p, n);
    double s = 0.0;
    for (int32_t i = 0; i < n; ++i) {
        const bool isConjugate = isReal && i > 0 && AreConjugate(roots[i], roots[i - 1]);
        radius_[i] = isConjugate ? double(radius_[i - 1])
                                 : backwardError(p, n, widened, roots[i]) / product_[i];
        s += radius_[i] / least_[i];
    }
    constexpr double leading = 0.98; // less than |p[0]| and |q[0]|
    if (!(4.0 * s < leading))
        return false;
    for (int32_t i = 0; i < n; ++i) {
        if (isReal && i > 0 && AreConjugate(roots[i], roots[i - 1]))
            continue;
        const double r =
            std::min(radius_[i] / (leading - s * (4.0 / 3.0)), 0.25 * double(least_[i]));
        const double closer = 1.0 / (1.0 - r / least_[i]); // than z[i] to the others
        const double a = s * closer;
        const double left =
            leading - a * (4.0 / 3.0) - (r * (1.0 + a) + radius_[i]) * inverses_[i] * closer;
        const double modulus = std::sqrt(SquaredModulus(roots[i])) + r;
        if (!(left > 0.0) ||
            !(product_[i] * (1.0 - r * inverses_[i]) * left > LargestSlope(p, n, widened, modulus)))
            return false;
    }
    return true;
}

} // namespace qx
