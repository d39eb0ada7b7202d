#ifndef QX_SIGNAL_NOISE_H
#define QX_SIGNAL_NOISE_H

#include "frame/views.h"
#include "qx/errors.h"
#include "qx/noise.h"

namespace qx {

// Fills x, which is not empty, from the state as it is; seeds are the exports' business.
// include/qx/noise.h says what the numbers are.
void UniformNoise(RealVector x, double amplitude, RandomState &state);
void GaussianNoise(RealVector x, double sigma, RandomState &state, GaussSpare &spare);
// ErrOutOfMemory: work memory or the transform's plan.
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
