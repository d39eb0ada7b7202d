#ifndef QX_FILTERS_DIGITAL_SECTIONS_H
#define QX_FILTERS_DIGITAL_SECTIONS_H

#include "filters/filter_band.h"
#include "frame/elements.h"

namespace qx {

// One section of an analog filter with its cut-off at 1 rad/s.
struct RealPole { // gain / (s + d0)
    double gain, d0;
};
struct PolePair { // (n2 s^2 + n0) / (s^2 + d1 s + d0)
    double n2, n0, d1, d0;
};

// Converts the sections of an analog filter, in the order in which they are added, to those of the
// digital filter: s is replaced by a function of S = (1 - z^-1) / (1 + z^-1),
//
//     lowpass S / g    highpass g / S    bandpass (S^2 + A) / (B S)    bandstop B S / (S^2 + A)
//
// with prewarped cut-offs: g = tan(pi fl / fs), and A is the product and B the difference of the
// two tangents. A section of a lowpass or highpass takes 2 values in a and 3 in b, a section of the
// other types 4 and 5; a real pole leaves the upper ones zero.
class DigitalSections {
public:
    DigitalSections(int32_t type, const FilterBand &band, DBL *a, DBL *b);

    void add(const RealPole &section);
    void add(const PolePair &section);

private:
    // In ascending powers of z^-1.
    template <int Order>
    struct Polynomial {
        double z[Order + 1];
    };
    // p2 S^2 + p1 S + p0 and p4 S^4 + ... + p0, times the denominator of S to the power of their
    // order.
    static Polynomial<2> Quadratic(double p2, double p1, double p0);
    static Polynomial<4> Quartic(double p4, double p3, double p2, double p1, double p0);
    template <int Order>
    void put(const Polynomial<Order> &numerator, const Polynomial<Order> &denominator);
    void advance();

    int32_t type_;
    double g_, A_, B_;
    DBL *a_, *b_;
};

} // namespace qx

#endif
