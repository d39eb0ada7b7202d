#include "filters/fir_design.h"

#include "filters/remez.h"
#include "frame/constants.h"
#include "frame/scratch.h"

#include <cmath>

namespace qx {

ErrorCode DesignFIRWindowless(FilterType type, const FilterBand &band, RealVector h) {
    const auto taps = static_cast<int32_t>(h.size());
    const double fs = band.fs, fl = band.fl;
    const bool isBand = type == Bandpass || type == Bandstop;
    const bool passesNyquist = type == Highpass || type == Bandstop;
    const double fh = isBand ? band.fh : (fs * 0.5 + fl) * 0.5;
    if (fl > fs * 0.5 || fh > fs * 0.5)
        return ErrAboveNyquist;
    if (fs <= 0.0 || fl <= 0.0 || (isBand && (fh <= 0.0 || fl >= fh)))
        return ErrBadCutoff;
    if (passesNyquist && taps % 2 == 0)
        return ErrBadTapCount;

    // Accumulated sums: the phases of both edges, and pi times the distance from the middle.
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
                           RealVector h, double *ripple, int32_t maxIterations) {
    RealVector desired, weight, edges;
    ScratchParts memory;
    if (const ErrorCode failed = memory.take(Sized(desired, nBands), Sized(weight, nBands),
                                             Sized(edges, 2 * int64_t{nBands})))
        return failed;
    for (std::ptrdiff_t b = 0; b < nBands; ++b) {
        desired[b] = bands[b].desired;
        weight[b] = bands[b].weight;
        edges[2 * b] = bands[b].fLow;
        edges[2 * b + 1] = bands[b].fHigh;
    }
    const auto type = static_cast<RemezType>(kind < 0 || kind > 2 ? 0 : kind + 1);
    return RemezDesign({desired, weight, edges, fs, type}, h, ripple, maxIterations);
}

} // namespace qx
