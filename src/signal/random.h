#ifndef QX_SIGNAL_RANDOM_H
#define QX_SIGNAL_RANDOM_H

#include "frame/widths.h"
#include "qx/noise.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// The generator of Wichmann and Hill (1982). Its three sequences are s = a s mod m, in 32-bit
// arithmetic, where the remainder has the sign of the dividend: a seed above 2^31 / 170 wraps in
// the first product, and a sequence that becomes negative by this stays negative.
struct RandomSequence {
    int32_t multiplier;
    int32_t modulus;
    double reciprocal; // of the modulus, rounded
};
inline constexpr RandomSequence randomSequences[3] = {
    {171, 30269, 3.3037100664045725e-05},
    {172, 30307, 3.2995677566238825e-05},
    {170, 30323, 3.297826732183491e-05},
};

// A seed of 0 does nothing: the stream continues.
void RandomSeed(int32_t seed, RandomState &state);
// The next number: a double in [0, 1), or an integer in [0, 32768).
double RandomUniform(RandomState &state);
int32_t RandomInt15(RandomState &state);

// Advances the state by `count` numbers, count >= 0, without drawing them.
void RandomSkip(RandomState &state, int64_t count);

// Whether every number of the stream is 0.
bool RandomIsStill(const RandomState &state);

// The next n numbers at once, the same as those of RandomUniform.
QX_BY_WIDTH(void, RandomUniforms, (RandomState & state, DBL *u, int32_t n))

// Numbers that are drawn in blocks and returned one by one. When the stream is destroyed, the state
// is set to the position after the last number used.
class RandomStream {
public:
    // `expected` is roughly how many numbers will be drawn.
    RandomStream(RandomState &state, int64_t expected)
        : state_(state), atBlock_(state), behind_(state), expected_(expected) {}
    ~RandomStream() { state_ = here(); }
    RandomStream(const RandomStream &) = delete;
    RandomStream &operator=(const RandomStream &) = delete;

    double next() {
        if (next_ == size_)
            refill();
        return numbers_[next_++];
    }

    // Several at a time: numbers() has available(least) numbers, at least `least` of them, and
    // use() reports how many were taken. `least` is at most 2.
    int32_t available(int32_t least) {
        if (size_ - next_ < least)
            refill();
        return size_ - next_;
    }
    const double *numbers() const { return numbers_ + next_; }
    void use(int32_t count) { next_ += count; }

private:
    static constexpr int32_t smallest = 16;
    static constexpr int32_t largest = 512;

    void refill();
    RandomState here() const {
        RandomState state = next_ < size_ ? atBlock_ : behind_;
        RandomSkip(state, next_ < size_ ? next_ : 0);
        return state;
    }

    RandomState &state_;
    RandomState atBlock_; // the state in which numbers_[0] is the next number
    RandomState behind_;  // and that in which the one after numbers_[size_ - 1] is
    int64_t expected_;
    int32_t next_ = 0;
    int32_t size_ = 0;
    double numbers_[largest];
};

} // namespace qx

#endif
