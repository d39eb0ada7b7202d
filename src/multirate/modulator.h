#ifndef QX_MULTIRATE_MODULATOR_H
#define QX_MULTIRATE_MODULATOR_H

#include "frame/elements.h"

#include <cstdint>

namespace qx {

// y[i] = x[i] exp(i (phase + i step)) with step = 2 pi ratio, by rotation from sample to sample;
// *phase is set to the phase of the sample after the last, in 0 to 2 pi. y may be x. With a ratio
// of exactly 0 the samples are unchanged, whatever *phase is. Instances for DBL and CDB.
template <ElementType Code>
void Modulate(const typename Element<Code>::type *x, int32_t n, double ratio, double *phase,
              CDB *y);

} // namespace qx

#endif
