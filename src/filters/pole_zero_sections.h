#ifndef QX_FILTERS_POLE_ZERO_SECTIONS_H
#define QX_FILTERS_POLE_ZERO_SECTIONS_H

#include "filters/filter_band.h"
#include "frame/views.h"

namespace qx {

// The output of a design with poles and zeros: sections of second order, and the poles and zeros of
// the digital filter, section by section, with conjugates adjacent.
struct PoleZeroDesign {
    RealVector a, b;
    ComplexVector zeros, poles;
};

// The number of sections, and the number of poles (and of zeros), for an order of the prototype.
constexpr int32_t SectionsOf(int32_t type, int32_t order) {
    return type == Lowpass || type == Highpass ? (order + 1) / 2 : order;
}
constexpr int32_t PolesOf(int32_t type, int32_t order) {
    return type == Lowpass || type == Highpass ? order : 2 * order;
}

// Converts the poles and zeros of an analog lowpass with its edge at 1 rad/s to sections of the
// digital filter. With S = (z - 1) / (z + 1) and s the variable of the analog filter,
//
//     lowpass s = S / g    highpass s = g / S    bandpass s = (S^2 + A) / (B S)
//     bandstop s = B S / (S^2 + A)
//
// where g = tan(pi fl / fs), A is the product and B the difference of the tangents of both edges.
// No polynomial is multiplied out and no difference of nearly equal numbers is formed: B is
// computed from the sine of the difference; of the two roots of S^2 - 2 q S + A = 0 the larger one
// is computed as a sum and the other one as A divided by it; and 1 - |z|^2 = -4 Re S / |1 - S|^2.
// Therefore the distances of the poles from the unit circle have small relative errors.
//
// In a band filter, the outer pole is combined with the outer zero. Each section has gain 1 in the
// middle of the pass band (at 0 Hz, at half the sampling rate, or at S = i sqrt(A)); the first
// section also has the gain of the analog filter at 0.
class PoleZeroSections {
public:
    // The edges must be between 0 and half the sampling rate, in ascending order.
    PoleZeroSections(int32_t type, const FilterBand &band, double gainAt0,
                     const PoleZeroDesign &design);

    void add(double pole); // real and negative; its zero is at infinity
    // A conjugate pair, given by the pole above the real axis, with zeros at +-i zero, or at
    // infinity if `zero` is noZero. To be added from the real axis outwards.
    static constexpr double noZero = 0.0;
    void add(CDB pole, double zero);

    struct Denominator { // 1 + z1 / z + z2 / z^2
        double z1, z2;
    };

    // k in H(z) = k (product of z - zeros) / (product of z - poles); 0 if it underflows.
    double gain() const { return gain_; }

private:
    bool isBand() const { return type_ == Bandpass || type_ == Bandstop; }
    void put(double lead, double b1, double b2, const Denominator &a);
    void putPoles(CDB pole);    // in S, with its conjugate
    void putZeros(double zero); // at +-i zero in S
    // A section from a pair of poles in S and the zeros +-i zero in S.
    void putPair(double lead, CDB pole, double zero);
    void putAllPole(double lead, CDB pole); // with the zeros of the type

    int32_t type_;
    double g_, A_, B_, pending_, gain_ = 1.0;
    PoleZeroDesign design_;
    std::ptrdiff_t section_ = 0, pole_ = 0, zero_ = 0;
};

} // namespace qx

#endif
