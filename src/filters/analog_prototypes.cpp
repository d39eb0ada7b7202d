#include "filters/analog_prototypes.h"

#include "filters/elliptic_functions.h"
#include "frame/constants.h"

#include <cmath>

namespace qx {

namespace {

// The angles of the pole pairs of a Butterworth filter, from the imaginary axis towards the real
// axis. The poles of the other families have the same angles on other curves.
class PairAngles {
public:
    explicit PairAngles(int32_t n) : step_(kPi / n), theta_((kPi + step_) * 0.5) {}
    double next() {
        const double theta = theta_;
        theta_ = theta + step_;
        return theta;
    }

private:
    double step_, theta_;
};

// Half axes of the ellipse of the poles: cosh and sinh of acosh(..) / n, from x to the power 1 / n.
struct Ellipse {
    double sh, ch;
    Ellipse(double x, int32_t n) {
        const double u = std::pow(x, 1.0 / n);
        sh = (u - 1.0 / u) * 0.5;
        ch = (u + 1.0 / u) * 0.5;
    }
};

double FromDecibels(double power) { return std::pow(10.0, 0.1 * power); }

// The number of the zero for pair i (n odd: even multiples, n even: odd multiples).
int32_t ZeroNumber(int32_t n, int32_t i) { return 2 * i + 1 + n % 2; }

} // namespace

void ButterworthPrototype(int32_t n, DigitalSections &sections) {
    if (n % 2 != 0)
        sections.add(RealPole{1.0, 1.0});
    PairAngles angles(n);
    for (int32_t i = 0; i < n / 2; ++i)
        sections.add(PolePair{0.0, 1.0, -2.0 * std::cos(angles.next()), 1.0});
}

void ChebyshevPrototype(int32_t n, double ripple, GainIn gainIn, DigitalSections &sections) {
    const double power = FromDecibels(ripple);
    const double amplitude = std::sqrt(power);
    const Ellipse ellipse((amplitude + 1.0) / std::sqrt(power - 1.0), n);
    const double sh = ellipse.sh, ch = ellipse.ch;
    const int32_t pairs = n / 2;
    const int32_t scaled = n % 2 != 0 ? -1 : gainIn == GainIn::FirstSection ? 0 : pairs - 1;
    if (n % 2 != 0)
        sections.add(RealPole{sh, sh});
    PairAngles angles(n);
    for (int32_t i = 0; i < pairs; ++i) {
        const double theta = angles.next();
        const double cosine = std::cos(theta);
        const double modulus2 =
            gainIn == GainIn::FirstSection
                ? ((sh * sh - ch * ch) * std::cos(2.0 * theta) + (sh * sh + ch * ch)) * 0.5
                : (sh * sh - ch * ch) * (cosine * cosine) + ch * ch;
        const double gain = i == scaled ? modulus2 * (1.0 / amplitude) : modulus2;
        sections.add(PolePair{0.0, gain, -2.0 * (sh * cosine), modulus2});
    }
}

// The poles are the reciprocals of those of a Chebyshev filter.
void InvChebyshevPrototype(int32_t n, double attenuation, DigitalSections &sections) {
    const double e = 1.0 / std::sqrt(FromDecibels(attenuation) - 1.0);
    const Ellipse ellipse((std::sqrt(1.0 + e * e) + 1.0) / e, n);
    if (n % 2 != 0)
        sections.add(RealPole{1.0 / ellipse.sh, 1.0 / ellipse.sh});
    PairAngles angles(n);
    for (int32_t i = 0; i < n / 2; ++i) {
        const double theta = angles.next();
        const double sigma = ellipse.sh * std::cos(theta), omega = ellipse.ch * std::sin(theta);
        const double P = sigma * sigma + omega * omega;
        const double zero = 1.0 / std::sin(kPi * ZeroNumber(n, i) / (2.0 * n));
        const double scale = 1.0 / (P * (zero * zero));
        sections.add(PolePair{scale, scale * (zero * zero), -2.0 * (sigma / P), 1.0 / P});
    }
}

void EllipticPrototype(int32_t n, double ripple, double attenuation, DigitalSections &sections) {
    const EllipticParameters parameters(ripple, attenuation, n);
    const double sn0 = parameters.at0.sn, cn0 = parameters.at0.cn, dn0 = parameters.at0.dn;
    if (n % 2 != 0) {
        const double sigma0 = sn0 * cn0 / (1.0 - sn0 * sn0);
        sections.add(RealPole{sigma0, sigma0});
    }
    const double step = parameters.K / n;
    for (int32_t i = 0; i < n / 2; ++i) {
        const JacobiFunctions at = JacobiElliptic(ZeroNumber(n, i) * step, parameters.kc);
        const double below = 1.0 - at.dn * at.dn * (sn0 * sn0);
        const double re = at.dn * at.cn * sn0 * cn0 / below;
        const double im = at.sn * dn0 / below;
        const double modulus2 = re * re + im * im;
        const double zero = 1.0 / (parameters.k * at.sn);
        const double gain =
            i == 0 && n % 2 == 0 ? 1.0 / std::sqrt(parameters.e * parameters.e + 1.0) : 1.0;
        const double scale = gain * modulus2 / (zero * zero);
        sections.add(PolePair{scale, scale * (zero * zero), 2.0 * re, modulus2});
    }
}

} // namespace qx
