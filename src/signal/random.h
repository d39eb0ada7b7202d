#ifndef QX_SIGNAL_RANDOM_H
#define QX_SIGNAL_RANDOM_H

#include "frame/widths.h"
#include "qx/noise.h"
#include "qx/types.h"

#include <cstdint>

namespace qx {

// The generator of Wichmann and Hill (1982). Its three sequences are s = a s mod m, in 32-bit
// arithmetic with the remainder of the sign of the dividend: a seed above 2^31 / 170 wraps in the
// first product, and a sequence that has become negative by that stays negative.
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

// A seed of 0 does nothing: the stream goes on.
void RandomSeed(int32_t seed, RandomState &state);
// The next number: a double in [0, 1), or an integer in [0, 32768).
double RandomUniform(RandomState &state);
int32_t RandomInt15(RandomState &state);

// The state after `count` more numbers, count >= 0, without drawing them.
void RandomSkip(RandomState &state, int64_t count);

// Whether every number of the stream is 0.
bool RandomIsStill(const RandomState &state);

// The next n numbers at once, the same as RandomUniform gives.
QX_BY_WIDTH(void, RandomUniforms, (RandomState & state, DBL *u, int32_t n))

// Numbers one after the other, drawn in blocks and given out singly. The state is brought to where
// the numbers in use end when the stream does.
class RandomStream {
public:
    // `expected`: about how many numbers will be drawn.
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

    // Several at a time: `available` numbers stand at `numbers`, at least `least` of them, and
    // `use` says how many are taken. `least` is at most 2.
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
    RandomState atBlock_; // where numbers_[0] is the next number
    RandomState behind_;  // where the one behind numbers_[size_ - 1] is
    int64_t expected_;
    int32_t next_ = 0;
    int32_t size_ = 0;
    double numbers_[largest];
};

} // namespace qx

#endif
