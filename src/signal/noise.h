#ifndef QX_SIGNAL_NOISE_H
#define QX_SIGNAL_NOISE_H

#include "frame/views.h"
#include "qx/errors.h"
#include "qx/noise.h"

namespace qx {

// Each fills x, which is not empty, from the current state; the exports handle seeds.
// include/qx/noise.h documents the numbers.
void UniformNoise(RealVector x, double amplitude, RandomState &state);
void GaussianNoise(RealVector x, double sigma, RandomState &state, GaussSpare &spare);
// ErrOutOfMemory (no work memory, or no plan of the transform).
ErrorCode PeriodicNoise(RealVector x, double amplitude, RandomState &state);
// order >= 1.
void GammaNoise(RealVector x, int32_t order, RandomState &state);
// mean >= 0 or NaN.
void PoissonNoise(RealVector x, double mean, RandomState &state);
// trials >= 0, p from 0 to 1.
void BinomialNoise(VectorView<ElementType::U32> x, int32_t trials, double p, RandomState &state,
                   BinomialCache &cache);

} // namespace qx

#endif
