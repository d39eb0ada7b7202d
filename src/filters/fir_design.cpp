#include "filters/fir_design.h"

#include "filters/remez.h"
#include "frame/constants.h"
#include "frame/scratch.h"

#include <cmath>

namespace qx {

ErrorCode DesignFIRWindowless(int32_t type, double fs, double fl, double fh, int32_t taps, DBL *h) {
    const bool isBand = type == Bandpass || type == Bandstop;
    const bool passesNyquist = type == Highpass || type == Bandstop;
    if (!isBand)
        fh = (fs * 0.5 + fl) * 0.5;
    if (fl > fs * 0.5 || fh > fs * 0.5)
        return ErrAboveNyquist;
    if (fs <= 0.0 || fl <= 0.0 || (isBand && (fh <= 0.0 || fl >= fh)))
        return ErrBadCutoff;
    if (passesNyquist && taps % 2 == 0)
        return ErrBadTapCount;

    // Running sums: the phases of both edges, and pi times the distance to the middle.
    const double w1 = kTwoPi * fl / fs, w2 = isBand ? kTwoPi * fh / fs : 0.0;
    double p1 = -0.5 * (taps - 1) * w1, p2 = -0.5 * (taps - 1) * w2;
    double v = -0.5 * kPi * (taps - 1);
    for (int32_t i = 0; i < taps / 2; ++i) {
        const double inside = isBand ? std::sin(p2) - std::sin(p1) : std::sin(p1);
        h[i] = h[taps - 1 - i] = (passesNyquist ? -inside : inside) / v;
        p1 += w1;
        p2 += w2;
        v += kPi;
    }
    if (taps % 2 != 0) {
        const double share = (isBand ? w2 - w1 : w1) / kPi;
        h[taps / 2] = passesNyquist ? 1.0 - share : share;
    }
    return 0;
}

ErrorCode DesignEquiripple(int32_t nBands, const RemezBand *bands, double fs, int32_t kind,
                           int32_t n, DBL *h, double *ripple, int32_t maxIterations) {
    Scratch<ElementType::DBL> desired, weight, edges;
    const int64_t count = nBands > 0 ? nBands : 0;
    if (desired.allocate(count) != 0 || weight.allocate(count) != 0 ||
        edges.allocate(2 * count) != 0)
        return ErrOutOfMemory;
    for (std::ptrdiff_t b = 0; b < count; ++b) {
        desired[b] = bands[b].desired;
        weight[b] = bands[b].weight;
        edges[2 * b] = bands[b].fLow;
        edges[2 * b + 1] = bands[b].fHigh;
    }
    const int32_t type = kind < 0 || kind > 2 ? 0 : kind + 1;
    return RemezDesign(nBands, desired.data(), weight.data(), fs, edges.data(), type, n, h, ripple,
                       maxIterations);
}

} // namespace qx
