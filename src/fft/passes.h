#ifndef QX_FFT_PASSES_H
#define QX_FFT_PASSES_H

#include "frame/widths.h"
#include "qx/types.h"

#include <cstddef>
#include <cstdint>

namespace qx {

// The passes over whole arrays before and after the transforms, for contiguous values.

// Sums and differences of mirrored values: half-complex form to Hartley form and back. For k from 1
// to (n - 1) / 2, value k becomes itself less value n - k, and value n - k their sum.
QX_BY_WIDTH(void, MirrorSums, (DBL * values, int32_t n))
// The same, with all values multiplied by `scale` first.
QX_BY_WIDTH(void, ScaledMirrorSums, (DBL * values, double scale, int32_t n))

// n interleaved complex values times `scale`, k and n - k exchanged: a forward transform becomes an
// inverse one.
QX_BY_WIDTH(void, ScaleReversed, (DBL * values, double scale, int32_t n))

// Complex value k becomes (up[k], down[-k]), for k from 0 to count - 1.
QX_BY_WIDTH(void, JoinMirrored, (const DBL *up, const DBL *down, DBL *complex, int32_t count))
// The conjugate of complex value k of `from` becomes value -k of `to`, for k from 0 to count - 1.
QX_BY_WIDTH(void, ConjugateBackward, (const DBL *from, DBL *to, int32_t count))

// Rows of `count` complex values: row r is copied to `to` + r toPitch, and the conjugates of `conjugates`
// values from number `skip` on go to `opposite` + r oppositePitch and downward. All in DBL units.
struct RowsToSpread {
    const DBL *from;
    std::ptrdiff_t fromPitch;
    DBL *to;
    std::ptrdiff_t toPitch;
    DBL *opposite;
    std::ptrdiff_t oppositePitch;
    int32_t rows, count, skip, conjugates;
};
QX_BY_WIDTH(void, SpreadRows, (const RowsToSpread &job))

} // namespace qx

#endif
