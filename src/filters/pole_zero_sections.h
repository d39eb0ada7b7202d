#ifndef QX_FILTERS_POLE_ZERO_SECTIONS_H
#define QX_FILTERS_POLE_ZERO_SECTIONS_H

#include "filters/filter_band.h"
#include "frame/views.h"

namespace qx {

// What a design by poles and zeros fills: sections of second order, and the poles and zeros of the
// digital filter, section by section, conjugates next to each other.
struct PoleZeroDesign {
    RealVector a, b;
    ComplexVector zeros, poles;
};

// How many sections, and how many poles and as many zeros, an order of the prototype gives.
constexpr int32_t SectionsOf(int32_t type, int32_t order) {
    return type == Lowpass || type == Highpass ? (order + 1) / 2 : order;
}
constexpr int32_t PolesOf(int32_t type, int32_t order) {
    return type == Lowpass || type == Highpass ? order : 2 * order;
}

// Turns poles and zeros of an analog lowpass, whose edge is at 1 rad/s, into sections of the
// digital filter. With S = (z - 1) / (z + 1) and s the variable of the analog filter,
//
//     lowpass s = S / g    highpass s = g / S    bandpass s = (S^2 + A) / (B S)
//     bandstop s = B S / (S^2 + A)
//
// where g = tan(pi fl / fs), A is the product and B the difference of the tangents of both edges.
// No polynomial is multiplied out and no difference of near numbers is formed: B comes from the
// sine of the difference, of the two roots of S^2 - 2 q S + A = 0 the larger one comes from a sum
// and the other one is A divided by it, and 1 - |z|^2 = -4 Re S / |1 - S|^2. So the distances of
// the poles from the unit circle have small relative errors.
//
// In a band, the pole farther out goes with the zero farther out. Each section has gain 1 in the
// middle of the pass band (at 0 Hz, at half the sampling rate, at S = i sqrt(A)); the first one
// also has the gain that the analog filter has at 0.
class PoleZeroSections {
public:
    // The edges lie between 0 and half the sampling rate and rise.
    PoleZeroSections(int32_t type, const FilterBand &band, double gainAt0,
                     const PoleZeroDesign &design);

    void add(double pole); // real, below 0; its zero is at infinity
    // A conjugate pair, of which the one above the real axis is given, with zeros at +-i zero;
    // noZero: at infinity. From the real axis outwards.
    static constexpr double noZero = 0.0;
    void add(CDB pole, double zero);

    struct Denominator { // 1 + z1 / z + z2 / z^2
        double z1, z2;
    };

    // k of H(z) = k (product of z - zeros) / (product of z - poles); 0 where it underflows.
    double gain() const { return gain_; }

private:
    bool isBand() const { return type_ == Bandpass || type_ == Bandstop; }
    void put(double lead, double b1, double b2, const Denominator &a);
    void putPoles(CDB pole);    // in S, with its conjugate
    void putZeros(double zero); // at +-i zero in S
    // A section from a pair of poles in S and the zeros +-i zero in S.
    void putPair(double lead, CDB pole, double zero);
    void putAllPole(double lead, CDB pole); // zeros where the type has them

    int32_t type_;
    double g_, A_, B_, pending_, gain_ = 1.0;
    PoleZeroDesign design_;
    std::ptrdiff_t section_ = 0, pole_ = 0, zero_ = 0;
};

} // namespace qx

#endif
