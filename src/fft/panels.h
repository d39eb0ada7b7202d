#ifndef QX_FFT_PANELS_H
#define QX_FFT_PANELS_H

#include "fft/plan.h"
#include "frame/widths.h"

namespace qx {

// Long transforms of powers of two are worked in two sweeps over memory. The first transforms all
// sub-transforms of the third level. The second takes a panel at a time, some neighbouring columns of
// their results: it copies the rows of the panel to a small buffer, in which columns do not collide in the
// cache, runs the stages of the second and the first level there, and writes the rows back. The
// arithmetic of each value is the same in either order.

// The values in a row of a panel: neighbouring complex values, or as many real ones and their mirror
// images.
constexpr int panelRow = 32;

// The second sweep, on the results of the first in `out`. The buffer begins on a cache line.
QX_BY_WIDTH(void, ComplexPanels, (const FFTPlan &plan, DBL *out, DBL *panel))
QX_BY_WIDTH(void, RealPanels, (const FFTPlan &plan, DBL *out, DBL *panel))

} // namespace qx

#endif
