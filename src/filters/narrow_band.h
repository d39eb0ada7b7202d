#ifndef QX_FILTERS_NARROW_BAND_H
#define QX_FILTERS_NARROW_BAND_H

#include "frame/scratch.h"
#include "frame/views.h"

namespace qx {

// Narrow bands with few multiplications, after Y. Neuvo, C.-Y. Dong and S. K. Mitra, "Interpolated
// finite impulse response filters", 1984: a model filter for a band M times as wide, stretched by
// inserting M - 1 zeros between its taps, repeats its response M times, and a short interpolator
// removes all but one image.

enum NarrowKind : int32_t {
    NarrowLowpass = 0,
    NarrowHighpass = 1,
    NarrowBandpass = 2,
    NarrowBandstop = 3, // the complement of a bandpass
    WideLowpass = 4,    // the complement of a highpass
    WideHighpass = 5,   // the complement of a lowpass
};

struct NarrowFIRBlock {
    int32_t kind = 0, M = 0;
    int32_t modelCount = 0, interpolatorCount = 0; // no interpolator for M = 1
    Scratch<ElementType::DBL> model, interpolator;
};

struct NarrowFIRGoal {
    double fs, fPass, fStop, fCenter; // for bands, fPass and fStop are widths about fCenter
    double passRipple;                // linear
    double stopAttenuation;           // in decibels
    int32_t type;
};

// ErrBadDesignField: an unknown type; an edge, width or ripple that is out of order; or lengths
// below those that RemezDesign accepts. Otherwise the codes of RemezDesign.
ErrorCode DesignNarrowFIR(const NarrowFIRGoal &goal, NarrowFIRBlock &block);

struct NarrowFIRFilter {
    int32_t kind, M; // an M below 2 means that there is no interpolator
    ConstRealVector model, interpolator;

    // Whether there is a model and, for M above 1, an interpolator.
    bool isComplete() const;
    // The length of the output for n values: that of the full convolution with both.
    int64_t outputCount(std::ptrdiff_t n) const;
};

// Filters x, which must not be empty, with a complete filter. ErrOutOfMemory.
template <ElementType E>
ErrorCode FilterNarrowFIR(ConstVectorView<E> x, const NarrowFIRFilter &filter, VectorView<E> y);

} // namespace qx

#endif
