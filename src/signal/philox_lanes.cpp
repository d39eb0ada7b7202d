#include "frame/lane_masks.h"
#include "signal/philox.h"

namespace qx::QX_WIDTH {

namespace {

typedef Lanes<nativeLanes> L;
typedef BitsOf<L> Bits;
constexpr int atOnce = 256;
constexpr int64_t lowerHalf = 0xffffffff;

Bits QX_INLINE Same(int64_t value) { return Bits{} + value; }

struct BlockLanes {
    Bits a, b;
};

// The state that all blocks of a place share: the keys of the rounds.
class PhiloxLanes {
public:
    explicit PhiloxLanes(const NoisePlace &place, uint32_t attempt = 0)
        : position_(place.position), attempt_(Same(attempt)),
          kind_(Same(static_cast<int64_t>(place.kind))) {
        uint32_t key0 = static_cast<uint32_t>(place.key),
                 key1 = static_cast<uint32_t>(place.stream);
        for (int round = 0; round < rounds; ++round) {
            keys_[round][0] = Same(key0);
            keys_[round][1] = Same(key1);
            key0 += 0x9e3779b9;
            key1 += 0xbb67ae85;
        }
        for (int lane = 0; lane < L::count; ++lane)
            lanes_[lane] = lane;
    }

    // The blocks of L::count values from position + offset on. The upper halves of the words are
    // not cleared: products and exclusive-ors of the lower halves do not depend on them.
    QX_INLINE BlockLanes at(int32_t offset) const {
        const Bits counter =
            Same(static_cast<int64_t>(position_ + static_cast<uint64_t>(offset))) + lanes_;
        Bits w0 = counter, w1 = ShiftedDown<L>(counter, 32), w2 = attempt_, w3 = kind_;
#pragma GCC unroll 10
        for (int round = 0; round < rounds; ++round) {
            const Bits p0 = ProductOfLowerHalves<L>(w0, Same(0xd2511f53)),
                       p1 = ProductOfLowerHalves<L>(w2, Same(0xcd9e8d57));
            w0 = ShiftedDown<L>(p1, 32) ^ (w1 ^ keys_[round][0]);
            w2 = ShiftedDown<L>(p0, 32) ^ (w3 ^ keys_[round][1]);
            w1 = p1;
            w3 = p0;
        }
        return {(w0 & lowerHalf) | (w1 << 32), (w2 & lowerHalf) | (w3 << 32)};
    }

private:
    static constexpr int rounds = 10;
    uint64_t position_;
    Bits attempt_, kind_, lanes_, keys_[rounds][2];
};

// (m + 1/2) / 2^52 - 1/2, exact, with m as the fraction of a number in [1, 2).
QX_INLINE L Centred(Bits a) {
    const L shifted = OfBits<L>(ShiftedDown<L>(a, 12) | Same(0x3ff0000000000000));
    return (shifted - L(1.5)) + L(0x1p-53);
}

void Store(Bits bits, uint64_t *to) {
    for (int lane = 0; lane < L::count; ++lane)
        to[lane] = static_cast<uint64_t>(bits[lane]);
}

template <int Count>
QX_INLINE L Polynomial(const double (&c)[Count], L x) { // ascending
    L sum(c[Count - 1]);
    for (int k = Count - 2; k >= 0; --k)
        sum = sum * x + L(c[k]);
    return sum;
}

// ln x of normal numbers, by the method of K. C. Ng in fdlibm (Sun Microsystems, 1993).
QX_INLINE L Logarithm(L x) {
    constexpr double c[] = {0x1.5555555555593p-1, 0x1.999999997fa04p-2, 0x1.2492494229359p-2,
                            0x1.c71c51d8e78afp-3, 0x1.7466496cb03dep-3, 0x1.39a09d078c69fp-3,
                            0x1.2f112df3e5244p-3};
    const Bits bits = ToBits(x);
    const L mantissa = OfBits<L>((bits & 0xfffffffffffff) | Same(0x3ff0000000000000));
    const L exponent =
        OfBits<L>(ShiftedDown<L>(bits, 52) | Same(0x4330000000000000)) - L(0x1p52 + 1023);
    const LaneMask<L> isUpper = L(0x1.6a09e667f3bcdp+0) < mantissa;
    const L f = Select(isUpper, mantissa * L(0.5), mantissa) - L(1.0);
    const L e = Select(isUpper, exponent + L(1.0), exponent);
    const L s = f / (L(2.0) + f), square = s * s;
    const L half = L(0.5) * f * f;
    const L rest = square * Polynomial(c, square);
    return e * L(0x1.62e42feep-1) -
           ((half - (s * (half + rest) + e * L(0x1.a39ef35793c76p-33))) - f);
}

// M. J. Wichura, "Algorithm AS 241: The percentage points of the normal distribution", 1988.
constexpr double middle = 0.425;
QX_INLINE L MiddleQuantile(L q) {
    constexpr double above[] = {3.3871328727963666080e0,  1.3314166789178437745e+2,
                                1.9715909503065514427e+3, 1.3731693765509461125e+4,
                                4.5921953931549871457e+4, 6.7265770927008700853e+4,
                                3.3430575583588128105e+4, 2.5090809287301226727e+3};
    constexpr double below[] = {1.0,
                                4.2313330701600911252e+1,
                                6.8718700749205790830e+2,
                                5.3941960214247511077e+3,
                                2.1213794301586595867e+4,
                                3.9307895800092710610e+4,
                                2.8729085735721942674e+4,
                                5.2264952788528545610e+3};
    const L r = L(0.180625) - q * q;
    return q * Polynomial(above, r) / Polynomial(below, r);
}
QX_INLINE L OuterQuantile(L q) {
    constexpr double above[] = {1.42343711074968357734e0,  4.63033784615654529590e0,
                                5.76949722146069140550e0,  3.64784832476320460504e0,
                                1.27045825245236838258e0,  2.41780725177450611770e-1,
                                2.27238449892691845833e-2, 7.74545014278341407640e-4};
    constexpr double below[] = {1.0,
                                2.05319162663775882187e0,
                                1.67638483018380384940e0,
                                6.89767334985100004550e-1,
                                1.48103976427480074590e-1,
                                1.51986665636164571966e-2,
                                5.47593808499534494600e-4,
                                1.05075007164441684324e-9};
    const L r = Sqrt(-Logarithm(L(0.5) - Magnitude(q))) - L(1.6);
    return CopySign(Polynomial(above, r) / Polynomial(below, r), q);
}

// Quantiles of n numbers, where n is a multiple of the number of lanes and at most atOnce. Those
// outside the middle, 15 of 100, are collected and computed together.
void Quantiles(const double *u, int n, double *x) {
    double outer[atOnce + L::count];
    int where[atOnce + L::count], count = 0;
    for (int i = 0; i < n; i += L::count)
        MiddleQuantile(L::load(u + i)).store(x + i);
    for (int i = 0; i < n; ++i) {
        outer[count] = u[i];
        where[count] = i;
        count += static_cast<int>(u[i] > middle) | static_cast<int>(u[i] < -middle);
    }
    for (int i = count; i < count + L::count; ++i)
        outer[i] = 0.49;
    for (int i = 0; i < count; i += L::count) {
        const L found = OuterQuantile(L::load(outer + i));
        for (int lane = 0; lane < L::count && i + lane < count; ++lane)
            x[where[i + lane]] = found[lane];
    }
}

} // namespace

void PhiloxBlocks(const NoisePlace &place, uint32_t attempt, int32_t n, uint64_t *a, uint64_t *b) {
    const PhiloxLanes blocks(place, attempt);
    for (int32_t i = 0; i < n; i += L::count) {
        const BlockLanes block = blocks.at(i);
        Store(block.a, a + i);
        Store(block.b, b + i);
    }
}

void PhiloxUniforms(const NoisePlace &place, double amplitude, DBL *x, int32_t n) {
    const PhiloxLanes blocks(place);
    const L scale(amplitude);
    const auto at = [&](int32_t i) { return L(2.0) * Centred(blocks.at(i).a) * scale; };
    int32_t i = 0;
    for (; i + 2 * L::count <= n; i += 2 * L::count) { // two at once hide the latency of products
        const L first = at(i), second = at(i + L::count);
        first.store(x + i);
        second.store(x + i + L::count);
    }
    for (; i < n; i += L::count) {
        const L last = at(i);
        for (int lane = 0; lane < L::count && i + lane < n; ++lane)
            x[i + lane] = last[lane];
    }
}

void PhiloxGaussians(const NoisePlace &place, double sigma, DBL *x, int32_t n) {
    const PhiloxLanes blocks(place);
    const L tail(0.5 - 0x1p-12);
    double u[atOnce], found[atOnce];
    for (int32_t start = 0; start < n; start += atOnce) {
        const int count = n - start < atOnce ? n - start : atOnce;
        bool hasTail = false;
        for (int i = 0; i < count; i += L::count) {
            const L q = Centred(blocks.at(start + i).a);
            q.store(u + i);
            hasTail |= Any(tail < Magnitude(q));
        }
        Quantiles(u, (count + L::count - 1) / L::count * L::count, found);
        for (int i = 0; hasTail && i < count; ++i)
            if (u[i] > tail[0] || u[i] < -tail[0])
                found[i] =
                    NormalTailQuantile(PhiloxBlock(place, static_cast<uint64_t>(start + i), 0));
        for (int i = 0; i < count; ++i)
            x[start + i] = found[i] * sigma;
    }
}

void NormalQuantiles(const DBL *u, int32_t n, DBL *x) {
    double arguments[atOnce], found[atOnce];
    for (int32_t start = 0; start < n; start += atOnce) {
        const int count = n - start < atOnce ? n - start : atOnce;
        for (int i = 0; i < count; ++i)
            arguments[i] = u[start + i];
        Quantiles(arguments, count, found);
        for (int i = 0; i < count; ++i)
            x[start + i] = found[i];
    }
}

} // namespace qx::QX_WIDTH
