#ifndef QX_MATHLIB_ELEMENTARY_H
#define QX_MATHLIB_ELEMENTARY_H

#include "frame/widths.h"
#include "qx/types.h"

namespace qx {

// Elementary functions of n numbers, with the bits of std::sin, std::cos, std::atan2 and
// std::hypot. Results may overwrite the arguments.
QX_BY_WIDTH_TO_8(void, Sines, (const DBL *x, int32_t n, DBL *sines))
QX_BY_WIDTH_TO_8(void, SinesAndCosines, (const DBL *x, int32_t n, DBL *sines, DBL *cosines))
QX_BY_WIDTH(void, ArcTangents, (const DBL *y, const DBL *x, int32_t n, DBL *angles))
QX_BY_WIDTH(void, Hypotenuses, (const DBL *x, const DBL *y, int32_t n, DBL *lengths))

} // namespace qx

#endif
