#include "filters/pole_zero_prototypes.h"

#include "frame/complex.h"
#include "frame/constants.h"
#include "frame/scratch.h"
#include "linalg/systems/lu.h"

#include <cmath>

namespace qx {

namespace {

constexpr double kLn2 = 0x1.62e42fefa39efp-1;

CDB Root(CDB x) { // for positive real parts
    const double re = std::sqrt(0.5 * (std::hypot(x.re, x.im) + x.re));
    return {re, x.im / (2.0 * re)};
}
CDB Logarithm(CDB x) { return {std::log(std::hypot(x.re, x.im)), std::atan2(x.im, x.re)}; }
double Size(CDB x) { return std::fabs(x.re) + std::fabs(x.im); }

// The zeros of the reverse Bessel polynomial, with those above the real axis followed by their
// conjugates, from the expansion of K_nu(nu w) for large nu = n + 1/2 (NIST Digital Library of
// Mathematical Functions, 10.41(ii), and 10.34.2 for the left half plane): s = -nu w with
//     sqrt(1 + w^2) + ln(w / (1 + sqrt(1 + w^2))) = i pi (n + 1 - 2 m) / (2 n + 1).
// Computed in steps along the curve, starting on the real axis; accurate to 1 % for all n.
void StartValues(int32_t n, ComplexVector s) {
    const double nu = n + 0.5;
    CDB w = {0.6627434193491815, 0.0};
    std::ptrdiff_t filled = 0;
    for (int32_t multiple = 1 - n % 2; multiple < n; multiple += 2) {
        const double target = kPi * multiple / (2.0 * n + 1.0);
        for (int round = 0; round < 8; ++round) {
            const CDB root = Root(w * w + 1.0);
            const CDB miss = root + Logarithm(w / (root + 1.0)) - CDB{0.0, target};
            w = w - miss * w / root;
        }
        s[filled++] = w * -nu;
        if (multiple > 0)
            s[filled++] = {-nu * w.re, nu * w.im};
    }
}

// Newton's method for the relations of T. J. Stieltjes: s theta'' - 2 (s + n) theta' +
// 2 n theta = 0 gives sum over j != i of 1 / (s_i - s_j) = 1 + n / s_i. The condition number of
// this system is about 1.4 n, while that of the coefficients of the polynomial grows exponentially.
ErrorCode Refine(int32_t n, ComplexVector s) {
    ComplexMatrix slopes;
    ComplexVector miss, step;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(slopes, n, n), Sized(miss, n), Sized(step, n)))
        return failed;
    constexpr int mostRounds = 12;
    for (int round = 0; round < mostRounds; ++round) {
        for (std::ptrdiff_t i = 0; i < n; ++i) {
            const CDB own = CDB{1.0, 0.0} / s[i];
            CDB sum = CDB{1.0, 0.0} + own * static_cast<double>(n);
            CDB diagonal = own * own * static_cast<double>(n);
            for (std::ptrdiff_t j = 0; j < n; ++j) {
                if (j == i)
                    continue;
                const CDB one = CDB{1.0, 0.0} / (s[i] - s[j]);
                sum -= one;
                slopes(i, j) = one * one;
                diagonal -= one * one;
            }
            slopes(i, i) = diagonal;
            miss[i] = sum;
        }
        if (const ErrorCode failed = SolveByLU<ElementType::CDB>(slopes, miss, step))
            return failed;
        double largest = 0.0;
        for (std::ptrdiff_t i = 0; i < n; ++i) {
            s[i] += step[i];
            largest = std::fmax(largest, Size(step[i]) / Size(s[i]));
        }
        if (largest < 1e-12) // the next step would be about its square
            break;
    }
    return 0;
}

// The frequency at which the gain is 3 dB down: the logarithm of |theta(i w) / theta(0)|^2, which
// is a sum over the poles, equals ln 2. By Newton's method in w^2.
double HalfPowerFrequency(int32_t n, ConstComplexVector s) {
    double x = (2.0 * n - 1.0) * kLn2;
    for (int round = 0; round < 30; ++round) {
        double value = 0.0, slope = 0.0;
        for (std::ptrdiff_t i = 0; i < n; ++i) {
            const double re2 = s[i].re * s[i].re, im2 = s[i].im * s[i].im;
            // A pair has two poles, which contribute half of its logarithm each.
            const double size2 = (re2 + im2) * (re2 + im2), twist = 2.0 * (re2 - im2);
            const double excess = x * (x + twist) / size2;
            value += 0.5 * std::log1p(excess);
            slope += 0.5 * ((2.0 * x + twist) / size2) / (1.0 + excess);
        }
        const double step = (kLn2 - value) / slope;
        x += step;
        if (std::fabs(step) < 1e-15 * x)
            break;
    }
    return std::sqrt(x);
}

} // namespace

ErrorCode BesselPoles(int32_t n, PoleZeroSections &sections) {
    ComplexVector s;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(s, n)))
        return failed;
    StartValues(n, s);
    if (const ErrorCode failed = Refine(n, s))
        return failed;
    const double scale = 1.0 / HalfPowerFrequency(n, s);
    std::ptrdiff_t i = 0;
    if (n % 2 != 0)
        sections.add(s[i++].re * scale);
    for (; i < n; i += 2)
        sections.add({s[i].re * scale, std::fabs(s[i].im) * scale}, PoleZeroSections::noZero);
    return 0;
}

} // namespace qx
