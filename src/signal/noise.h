#ifndef QX_SIGNAL_NOISE_H
#define QX_SIGNAL_NOISE_H

#include "qx/errors.h"
#include "qx/noise.h"
#include "qx/types.h"

namespace qx {

// n samples, n >= 1, from the state as it is; seeds are the frames' business. include/qx/noise.h
// tells what the numbers are.
void UniformNoise(DBL *x, int32_t n, double amplitude, RandomState &state);
void GaussianNoise(DBL *x, int32_t n, double sigma, RandomState &state, GaussSpare &spare);
// ErrOutOfMemory: work memory or the transform's plan.
ErrorCode PeriodicNoise(DBL *x, int32_t n, double amplitude, RandomState &state);
// order >= 1.
void GammaNoise(DBL *x, int32_t n, int32_t order, RandomState &state);
// mean >= 0 or NaN.
void PoissonNoise(DBL *x, int32_t n, double mean, RandomState &state);
// trials >= 0, p from 0 to 1.
void BinomialNoise(U32 *x, int32_t n, int32_t trials, double p, RandomState &state,
                   BinomialCache &cache);

} // namespace qx

#endif
