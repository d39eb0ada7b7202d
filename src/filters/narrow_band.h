#ifndef QX_FILTERS_NARROW_BAND_H
#define QX_FILTERS_NARROW_BAND_H

#include "frame/scratch.h"
#include "frame/views.h"

namespace qx {

// Narrow bands in few multiplications, after Y. Neuvo, C.-Y. Dong and S. K. Mitra, "Interpolated
// finite impulse response filters", 1984: a model filter for the band M times as wide, stretched
// by M zeros between its taps, repeats its response M times, and a short interpolator leaves one
// image.

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
    int32_t modelCount = 0, interpolatorCount = 0; // none for M = 1
    Scratch<ElementType::DBL> model, interpolator;
};

struct NarrowFIRGoal {
    double fs, fPass, fStop, fCenter; // of bands, fPass and fStop are widths about fCenter
    double passRipple;                // linear
    double stopAttenuation;           // in decibels
    int32_t type;
};

// ErrBadDesignField: a type that does not exist, an edge, a width or a ripple that is out of order,
// lengths below what RemezDesign takes. Else the codes of RemezDesign.
ErrorCode DesignNarrowFIR(const NarrowFIRGoal &goal, NarrowFIRBlock &block);

struct NarrowFIRFilter {
    int32_t kind, M; // an M below 2 means no interpolator
    ConstRealVector model, interpolator;

    // Has a model and, with M above 1, an interpolator.
    bool isComplete() const;
    // Of the output for n values: the full convolution with both.
    int64_t outputCount(std::ptrdiff_t n) const;
};

// x, which is not empty, through a filter that is complete. ErrOutOfMemory.
template <ElementType E>
ErrorCode FilterNarrowFIR(ConstVectorView<E> x, const NarrowFIRFilter &filter, VectorView<E> y);

} // namespace qx

#endif
