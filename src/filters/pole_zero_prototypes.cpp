#include "filters/pole_zero_prototypes.h"

#include "filters/jacobi_lattice.h"
#include "frame/complex.h"
#include "frame/constants.h"

#include <cmath>

namespace qx {

namespace {

constexpr double kLn10Over10 = 0x1.d791c5f888822p-3;

// 10^(decibels / 10) - 1, accurate for small levels.
double ExcessPower(double decibels) { return std::expm1(decibels * kLn10Over10); }

// The pole of a Butterworth filter in pair i of n, counted from the imaginary axis: its damping and
// frequency, both as sines of angles up to pi / 2.
struct PairAngle {
    double damping, frequency;
    PairAngle(int32_t n, int32_t i)
        : damping(std::sin(kHalfPi * (2 * i + 1) / n)),
          frequency(std::sin(kHalfPi * (n - 1 - 2 * i) / n)) {}
};

} // namespace

double GainAt0(int32_t n, double ripple) {
    return n % 2 != 0 ? 1.0 : std::exp(-0.5 * kLn10Over10 * ripple);
}

void ButterworthPoles(int32_t n, PoleZeroSections &sections) {
    if (n % 2 != 0)
        sections.add(-1.0);
    for (int32_t i = n / 2 - 1; i >= 0; --i) {
        const PairAngle angle(n, i);
        sections.add({-angle.damping, angle.frequency}, PoleZeroSections::noZero);
    }
}

namespace {

// For positive x. The system's function is not used because its last bits depend on the platform.
double Asinh(double x) {
    return x > 1e8 ? std::log(x) + std::log(2.0)
                   : std::log1p(x + x * x / (1.0 + std::sqrt(1.0 + x * x)));
}

} // namespace

void ChebyshevPoles(int32_t n, double ripple, PoleZeroSections &sections) {
    const double u = Asinh(1.0 / std::sqrt(ExcessPower(ripple))) / n;
    const double sh = std::sinh(u), ch = std::cosh(u);
    if (n % 2 != 0)
        sections.add(-sh);
    for (int32_t i = n / 2 - 1; i >= 0; --i) {
        const PairAngle angle(n, i);
        sections.add({-sh * angle.damping, ch * angle.frequency}, PoleZeroSections::noZero);
    }
}

// The reciprocals of the poles of a Chebyshev filter.
void InvChebyshevPoles(int32_t n, double attenuation, PoleZeroSections &sections) {
    const double u = Asinh(std::sqrt(ExcessPower(attenuation))) / n;
    const double sh = std::sinh(u), ch = std::cosh(u);
    if (n % 2 != 0)
        sections.add(-1.0 / sh);
    for (int32_t i = n / 2 - 1; i >= 0; --i) {
        const PairAngle angle(n, i);
        const double re = sh * angle.damping, im = ch * angle.frequency;
        const double size = re * re + im * im;
        sections.add({-re / size, im / size}, 1.0 / angle.frequency);
    }
}

// With the ripple factors e and es of the pass and stop bands, k1 = e / es. The degree equation
// K'/K = K1' / (n K1) gives the modulus k of the filter, whose zeros are at 1 / (k sn(u_i)). The
// arguments of the poles are shifted off the real axis by x with sc(x, k1') = 1 / e, and K1' - x
// has sc = es.
void EllipticPoles(int32_t n, double ripple, double attenuation, PoleZeroSections &sections) {
    const double e2 = ExcessPower(ripple), es2 = ExcessPower(attenuation);
    const double k1 = std::sqrt(e2 / es2);
    const double k1c = std::sqrt(ExcessPower(attenuation - ripple) * (1.0 + e2) / es2);
    const double shift = EllipticFOfTangent(1.0 / std::sqrt(e2), k1);
    const double rest = EllipticFOfTangent(std::sqrt(es2), k1);
    const double K1 = CompleteEllipticK(k1c), K1c = shift + rest;
    const JacobiLattice lattice(K1c / K1 / n), complementary(n * K1 / K1c);
    const JacobiFunctions at0 = complementary.at(shift / K1c, rest / K1c);
    if (n % 2 != 0)
        sections.add(-at0.sn / at0.cn);
    for (int32_t i = 0; i < n / 2; ++i) {
        const int32_t multiple = 2 * i + 1 + n % 2;
        const JacobiFunctions at =
            lattice.at(static_cast<double>(multiple) / n, static_cast<double>(n - multiple) / n);
        const double across = lattice.k * at.sn * at0.sn;
        const double below = at0.cn * at0.cn + across * across;
        sections.add({-at.cn * at.dn * at0.sn * at0.cn / below, at.sn * at0.dn / below},
                     1.0 / (lattice.k * at.sn));
    }
}

} // namespace qx
