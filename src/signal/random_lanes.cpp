#include "frame/lane_masks.h"
#include "signal/random.h"

namespace qx::QX_WIDTH {

namespace {

// Eight consecutive numbers are computed at once, each eight steps ahead of the last one of its
// lane by s = s a^8 mod m. The remainder is computed exactly in double precision: a product is
// below 2^30, and the quotient, shifted by 1 / (2 m) - 1/2, stays far enough from the middle between
// two integers for its nearest integer to be the floor.
constexpr int block = 8;
constexpr double toInteger = 0x1.8p52; // adding and subtracting it rounds to an integer

struct Powers {
    double power[block]; // a, a^2, ... a^8, mod m
};
constexpr Powers PowersOf(const RandomSequence &sequence) {
    Powers powers = {};
    int64_t power = 1;
    for (double &next : powers.power) {
        power = power * sequence.multiplier % sequence.modulus;
        next = static_cast<double>(power);
    }
    return powers;
}
constexpr Powers powersOf[3] = {PowersOf(randomSequences[0]), PowersOf(randomSequences[1]),
                                PowersOf(randomSequences[2])};

typedef Lanes<nativeLanes> L;
constexpr int vectors = block / L::count;

// The magnitudes of a sequence within its modulus; the sign never changes and is part of the
// weight.
struct SequenceLanes {
    L s[vectors];
    double modulus;
    double weight;
};

__attribute__((always_inline)) inline L Times(L s, L power, double modulus) {
    const double inverse = 1.0 / modulus;
    const L quotient = s * (power * L(inverse)) + L(0.5 * inverse - 0.5);
    const L whole = (quotient + L(toInteger)) - L(toInteger);
    return s * power - whole * L(modulus);
}

// The first block after one value, lane by lane.
__attribute__((always_inline)) inline SequenceLanes Started(int32_t s, int which) {
    const RandomSequence &sequence = randomSequences[which];
    SequenceLanes lanes;
    lanes.modulus = sequence.modulus;
    lanes.weight = s < 0 ? -sequence.reciprocal : sequence.reciprocal;
    const L magnitude(static_cast<double>(s < 0 ? -s : s));
    for (int i = 0; i < vectors; ++i)
        lanes.s[i] = Times(magnitude, L::load(powersOf[which].power + i * L::count), lanes.modulus);
    return lanes;
}

__attribute__((always_inline)) inline void Advance(SequenceLanes &lanes, int which) {
    for (L &s : lanes.s)
        s = Times(s, L(powersOf[which].power[block - 1]), lanes.modulus);
}

__attribute__((always_inline)) inline void Store(const SequenceLanes (&lanes)[3], DBL *u) {
    for (int i = 0; i < vectors; ++i) {
        const L v = lanes[0].s[i] * L(lanes[0].weight) + lanes[1].s[i] * L(lanes[1].weight) +
                    lanes[2].s[i] * L(lanes[2].weight);
        const L nearest = (v + L(toInteger)) - L(toInteger);
        const L whole = Select(v < nearest, nearest - L(1.0), nearest);
        (v - whole).store(u + i * L::count);
    }
}

int32_t Value(const SequenceLanes &lanes, int lane) {
    const double magnitude = lanes.s[lane / L::count][lane % L::count];
    return static_cast<int32_t>(lanes.weight < 0 ? -magnitude : magnitude);
}

} // namespace

void RandomUniforms(RandomState &state, DBL *u, int32_t n) {
    if (n < 1)
        return;
    u[0] = RandomUniform(state); // a caller's state may exceed the moduli
    if (n == 1)
        return;
    SequenceLanes lanes[3] = {Started(state.s1, 0), Started(state.s2, 1), Started(state.s3, 2)};
    int32_t i = 1;
    for (; n - i > block; i += block) {
        Store(lanes, u + i);
        for (int which = 0; which < 3; ++which)
            Advance(lanes[which], which);
    }
    double last[block];
    Store(lanes, last);
    for (int lane = 0; lane < n - i; ++lane)
        u[i + lane] = last[lane];
    const int lane = n - i - 1;
    state = {Value(lanes[0], lane), Value(lanes[1], lane), Value(lanes[2], lane)};
}

} // namespace qx::QX_WIDTH
