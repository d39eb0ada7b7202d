#include "filters/digital_sections.h"

#include "frame/constants.h"

#include <cmath>

namespace qx {

DigitalSections::DigitalSections(int32_t type, const FilterBand &band, DBL *a, DBL *b)
    : type_(type), a_(a), b_(b) {
    const double lower = std::tan(kPi * band.fl / band.fs);
    const double upper = std::tan(kPi * band.fh / band.fs);
    g_ = lower;
    A_ = lower * upper;
    B_ = upper - lower;
}

// Replaces S^k by (1 - z^-1)^k (1 + z^-1)^(m - k) in a polynomial of degree m.
DigitalSections::Polynomial<2> DigitalSections::Quadratic(double p2, double p1, double p0) {
    return {{p2 + p1 + p0, 2.0 * p0 - 2.0 * p2, p2 - p1 + p0}};
}
DigitalSections::Polynomial<4> DigitalSections::Quartic(double p4, double p3, double p2, double p1,
                                                        double p0) {
    return {{p4 + p2 + p0 + p3 + p1, 4.0 * p0 - (4.0 * p4 + 2.0 * (p3 - p1)),
             6.0 * p4 - 2.0 * p2 + 6.0 * p0, 2.0 * (p3 - p1) - 4.0 * p4 + 4.0 * p0,
             p2 + (p4 - p3) - p1 + p0}};
}

void DigitalSections::advance() {
    const bool isBand = type_ >= Bandpass;
    a_ += isBand ? 4 : 2;
    b_ += isBand ? 5 : 3;
}

template <int Order>
void DigitalSections::put(const Polynomial<Order> &numerator,
                          const Polynomial<Order> &denominator) {
    for (int k = 0; k < Order; ++k)
        a_[k] = denominator.z[k + 1] / denominator.z[0];
    for (int k = 0; k <= Order; ++k)
        b_[k] = numerator.z[k] / denominator.z[0];
}

void DigitalSections::add(const RealPole &section) {
    const double gain = section.gain, d0 = section.d0;
    const auto clear = [](DBL *values, int from, int to) {
        for (int k = from; k < to; ++k)
            values[k] = 0.0;
    };
    if (type_ == Lowpass || type_ == Highpass) {
        // p1 S + p0 becomes p0 + p1 and p0 - p1.
        const double p1 = type_ == Lowpass ? 1.0 : d0;
        const double p0 = type_ == Lowpass ? d0 * g_ : g_;
        const double leading = p0 + p1;
        a_[0] = (p0 - p1) / leading;
        b_[0] = type_ == Lowpass ? gain * g_ / leading : gain / leading;
        b_[1] = type_ == Lowpass ? b_[0] : -b_[0];
        clear(a_, 1, 2);
        clear(b_, 2, 3);
    } else {
        if (type_ == Bandpass)
            put(Quadratic(0.0, gain * B_, 0.0), Quadratic(1.0, d0 * B_, A_));
        else
            put(Quadratic(gain, 0.0, gain * A_), Quadratic(d0, B_, d0 * A_));
        clear(a_, 2, 4);
        clear(b_, 3, 5);
    }
    advance();
}

void DigitalSections::add(const PolePair &section) {
    const double n2 = section.n2, n0 = section.n0, d1 = section.d1, d0 = section.d0;
    const double A = A_, B = B_, square = B * B;
    const double c = d1 * B;
    switch (type_) {
    case Lowpass:
        put(Quadratic(n2, 0.0, n0 * (g_ * g_)), Quadratic(1.0, d1 * g_, d0 * (g_ * g_)));
        break;
    case Highpass:
        put(Quadratic(n0, 0.0, n2 * (g_ * g_)), Quadratic(d0, d1 * g_, g_ * g_));
        break;
    case Bandpass:
        put(Quartic(n2, 0.0, 2.0 * A * n2 + n0 * square, 0.0, n2 * (A * A)),
            Quartic(1.0, c, 2.0 * A + d0 * square, c * A, A * A));
        break;
    default:
        put(Quartic(n0, 0.0, 2.0 * A * n0 + n2 * square, 0.0, n0 * (A * A)),
            Quartic(d0, c, 2.0 * A * d0 + square, c * A, d0 * (A * A)));
    }
    advance();
}

} // namespace qx
