#include "signal/philox.h"

#include <cmath>

namespace qx {

NoiseBlock PhiloxBlock(const NoisePlace &place, uint64_t offset, uint32_t attempt) {
    const uint64_t position = place.position + offset;
    uint32_t w[4] = {static_cast<uint32_t>(position), static_cast<uint32_t>(position >> 32),
                     attempt, static_cast<uint32_t>(place.kind)};
    uint32_t key0 = static_cast<uint32_t>(place.key), key1 = static_cast<uint32_t>(place.stream);
    for (int round = 0; round < 10; ++round) {
        const uint64_t p0 = uint64_t{0xd2511f53} * w[0], p1 = uint64_t{0xcd9e8d57} * w[2];
        w[0] = static_cast<uint32_t>(p1 >> 32) ^ w[1] ^ key0;
        w[2] = static_cast<uint32_t>(p0 >> 32) ^ w[3] ^ key1;
        w[1] = static_cast<uint32_t>(p1);
        w[3] = static_cast<uint32_t>(p0);
        key0 += 0x9e3779b9;
        key1 += 0xbb67ae85;
    }
    return {w[0] | uint64_t{w[1]} << 32, w[2] | uint64_t{w[3]} << 32};
}

// The lower tail has the probability (m + (b + 1/2) / 2^64) / 2^52 for the m of CentredUniform, and
// the upper one mirrors it. Uses the quotients of Wichura, as in philox_lanes.cpp, and his quotient
// for tails below exp(-25).
double NormalTailQuantile(const NoiseBlock &block) {
    constexpr uint64_t highest = (uint64_t{1} << 52) - 1;
    const uint64_t m = block.a >> 12;
    const bool isUpper = m > highest / 2;
    const double steps = static_cast<double>(isUpper ? highest - m : m);
    const double tail = (steps + (static_cast<double>(block.b) + 0.5) * 0x1p-64) * 0x1p-52;
    double r = std::sqrt(-std::log(tail)), above, below;
    if (r <= 5.0) {
        r -= 1.6;
        above = (((((((7.74545014278341407640e-4 * r + 2.27238449892691845833e-2) * r +
                      2.41780725177450611770e-1) *
                         r +
                     1.27045825245236838258e0) *
                        r +
                    3.64784832476320460504e0) *
                       r +
                   5.76949722146069140550e0) *
                      r +
                  4.63033784615654529590e0) *
                     r +
                 1.42343711074968357734e0);
        below = (((((((1.05075007164441684324e-9 * r + 5.47593808499534494600e-4) * r +
                      1.51986665636164571966e-2) *
                         r +
                     1.48103976427480074590e-1) *
                        r +
                    6.89767334985100004550e-1) *
                       r +
                   1.67638483018380384940e0) *
                      r +
                  2.05319162663775882187e0) *
                     r +
                 1.0);
    } else {
        r -= 5.0;
        above = (((((((2.01033439929228813265e-7 * r + 2.71155556874348757815e-5) * r +
                      1.24266094738807843860e-3) *
                         r +
                     2.65321895265761230930e-2) *
                        r +
                    2.96560571828504891230e-1) *
                       r +
                   1.78482653991729133580e0) *
                      r +
                  5.46378491116411436990e0) *
                     r +
                 6.65790464350110377720e0);
        below = (((((((2.04426310338993978564e-15 * r + 1.42151175831644588870e-7) * r +
                      1.84631831751005468180e-5) *
                         r +
                     7.86869131145613259100e-4) *
                        r +
                    1.48753612908506148525e-2) *
                       r +
                   1.36929880922735805310e-1) *
                      r +
                  5.99832206555887937690e-1) *
                     r +
                 1.0);
    }
    return isUpper ? above / below : -above / below;
}

} // namespace qx
