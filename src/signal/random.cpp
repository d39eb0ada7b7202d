#include "signal/random.h"

#include <algorithm>
#include <cmath>

namespace qx {

namespace {

// One step of one sequence. The product wraps on purpose.
int32_t Step(int32_t s, const RandomSequence &sequence) {
    const uint32_t product = static_cast<uint32_t>(sequence.multiplier) * static_cast<uint32_t>(s);
    return static_cast<int32_t>(product) % sequence.modulus;
}

// s a^count mod m for a sequence within its modulus; no product wraps.
int32_t Skip(int32_t s, const RandomSequence &sequence, int64_t count) {
    int32_t power = sequence.multiplier;
    int32_t result = s;
    for (; count > 0; count >>= 1) {
        if ((count & 1) != 0)
            result = result * power % sequence.modulus;
        power = power * power % sequence.modulus;
    }
    return result;
}

void Advance(RandomState &state) {
    state.s1 = Step(state.s1, randomSequences[0]);
    state.s2 = Step(state.s2, randomSequences[1]);
    state.s3 = Step(state.s3, randomSequences[2]);
}

// Between -3 and 3.
double SumOf(const RandomState &state) {
    return state.s1 * randomSequences[0].reciprocal + state.s2 * randomSequences[1].reciprocal +
           state.s3 * randomSequences[2].reciprocal;
}

} // namespace

void RandomSeed(int32_t seed, RandomState &state) {
    if (seed == 0)
        return;
    constexpr uint32_t factor = 8191;
    constexpr uint32_t mask = 0x3FFF;
    const uint32_t s2 = static_cast<uint32_t>(seed) * factor & mask;
    state.s1 = seed;
    state.s2 = static_cast<int32_t>(s2);
    state.s3 = static_cast<int32_t>(s2 * factor & mask);
}

double RandomUniform(RandomState &state) {
    Advance(state);
    const double v = SumOf(state);
    return v - std::floor(v);
}

int32_t RandomInt15(RandomState &state) {
    Advance(state);
    const double v = SumOf(state);
    return static_cast<int32_t>((v - std::trunc(v)) * 32768.0);
}

void RandomSkip(RandomState &state, int64_t count) {
    if (count < 1)
        return;
    Advance(state); // from here on all sequences are within their moduli
    state.s1 = Skip(state.s1, randomSequences[0], count - 1);
    state.s2 = Skip(state.s2, randomSequences[1], count - 1);
    state.s3 = Skip(state.s3, randomSequences[2], count - 1);
}

bool RandomIsStill(const RandomState &state) {
    RandomState next = state;
    Advance(next);
    return next.s1 == 0 && next.s2 == 0 && next.s3 == 0;
}

// If one number is left when two are needed, it moves to the front.
void RandomStream::refill() {
    const int32_t left = size_ - next_;
    atBlock_ = here();
    std::copy(numbers_ + next_, numbers_ + size_, numbers_);
    size_ = static_cast<int32_t>(std::clamp(expected_, int64_t{smallest}, int64_t{largest}));
    expected_ -= size_;
    next_ = 0;
    RandomUniforms(behind_, numbers_ + left, size_ - left);
}

} // namespace qx
