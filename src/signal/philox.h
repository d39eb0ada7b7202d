#ifndef QX_SIGNAL_PHILOX_H
#define QX_SIGNAL_PHILOX_H

#include "frame/widths.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// The generator Philox4x32-10: J. K. Salmon, M. A. Moraes, R. O. Dror and D. E. Shaw, "Parallel
// random numbers: as easy as 1, 2, 3", 2011. A block of four words is a function of a counter of
// four words and a key of two; here the key is (key, stream), and the counter is (position, its
// upper half, attempt, kind). Each value of each stream and kind of noise therefore has its own
// blocks.

enum class NoiseKind : uint32_t { Uniform = 1, Gaussian, Gamma, Poisson, Binomial, Order };

struct NoisePlace {
    int32_t key, stream;
    uint64_t position;
    NoiseKind kind;
};

// The words of a block, 0 and 1 in a, 2 and 3 in b, the lower one first.
struct NoiseBlock {
    uint64_t a, b;
};

// The block of the value at position + offset.
NoiseBlock PhiloxBlock(const NoisePlace &place, uint64_t offset, uint32_t attempt);

// The blocks of one attempt of n values, n >= 1. The sizes of a and b are n rounded up to a multiple
// of 4.
QX_BY_WIDTH(void, PhiloxBlocks,
            (const NoisePlace &place, uint32_t attempt, int32_t n, uint64_t *a, uint64_t *b))

// A number in (-1/2, 1/2) from the upper 52 bits: (m + 1/2) / 2^52 - 1/2.
inline double CentredUniform(uint64_t bits) {
    return (static_cast<double>(bits >> 12) + 0.5) * 0x1p-52 - 0.5;
}

// x[i] = amplitude (2 u - 1), and quantiles of the normal distribution times sigma.
QX_BY_WIDTH(void, PhiloxUniforms, (const NoisePlace &place, double amplitude, DBL *x, int32_t n))
QX_BY_WIDTH(void, PhiloxGaussians, (const NoisePlace &place, double sigma, DBL *x, int32_t n))
// The quantiles at 1/2 + u for numbers u of CentredUniform; n is a multiple of 4.
QX_BY_WIDTH(void, NormalQuantiles, (const DBL *u, int32_t n, DBL *x))

// The quantile of a tail below 2^-12, from the bits of a, followed by those of b.
double NormalTailQuantile(const NoiseBlock &block);

} // namespace qx

#endif
