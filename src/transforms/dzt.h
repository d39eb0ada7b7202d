#ifndef QX_TRANSFORMS_DZT_H
#define QX_TRANSFORMS_DZT_H

#include "fft/plan.h"
#include "frame/views.h"
#include "qx/errors.h"

#include <cstdint>

namespace qx {

// A band of bins of one long transform from short transforms: with L = sections * subLength,
// out[i] = sum over u of x[u] exp(-2 pi i u (start + i) / L) for the values of out, from the
// transforms of the `sections` interleaved sub-sequences. Frequencies run past L cyclically; an
// input shorter than L counts as zero-padded, a longer one is folded, in place.
//
// ErrEmptyInput, ErrFFTSizeNotPositive, ErrInternal for a plan of another length than subLength,
// ErrOutOfMemory, ErrLengthTooLarge where an index would exceed int32.
template <ElementType E>
ErrorCode BandTransform(const FFTPlan *plan, VectorView<E> x, int32_t sections, int32_t subLength,
                        int32_t start, ComplexVector out);

} // namespace qx

#endif
