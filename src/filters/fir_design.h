#ifndef QX_FILTERS_FIR_DESIGN_H
#define QX_FILTERS_FIR_DESIGN_H

#include "filters/filter_band.h"
#include "frame/views.h"
#include "qx/errors.h"
#include "qx/fir_design.h"

namespace qx {

// The ideal response of the given type, truncated to the length of h, without a window. For lowpass
// and highpass fh may have any value. ErrAboveNyquist; ErrBadCutoff; ErrBadTapCount (an even number
// with a gain at the Nyquist frequency).
ErrorCode DesignFIRWindowless(FilterType type, const FilterBand &band, RealVector h);

// An equiripple filter from records; the kind is a RemezKind; any other gives ErrBadDesignField.
// Codes: those of RemezDesign.
ErrorCode DesignEquiripple(int32_t nBands, const RemezBand *bands, double fs, int32_t kind,
                           RealVector h, double *ripple, int32_t maxIterations);

} // namespace qx

#endif
