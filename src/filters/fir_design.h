#ifndef QX_FILTERS_FIR_DESIGN_H
#define QX_FILTERS_FIR_DESIGN_H

#include "filters/filter_band.h"
#include "qx/errors.h"
#include "qx/fir_design.h"

namespace qx {

// The ideal response of a type of FilterType, cut off after so many taps, with no window.
// ErrAboveNyquist; ErrBadCutoff; ErrBadTapCount (an even number with a gain at the Nyquist
// frequency).
ErrorCode DesignFIRWindowless(int32_t type, double fs, double fl, double fh, int32_t taps, DBL *h);

// An equiripple filter from records; the kind is RemezKind. Codes: those of RemezDesign.
ErrorCode DesignEquiripple(int32_t nBands, const RemezBand *bands, double fs, int32_t kind,
                           int32_t n, DBL *h, double *ripple, int32_t maxIterations);

} // namespace qx

#endif
