#include "fft/factorise.h"

#include "fft/kernels/kernels.h"

#include <cstdint>
#include <utility>

namespace qx {
namespace {

void Append(FFTPlan *plan, int32_t factor, int32_t kind) {
    plan->factors[plan->factorCount] = factor;
    plan->kinds[plan->factorCount] = kind;
    ++plan->factorCount;
}

// Estimated times, in tenths of a nanosecond on the machine that fft/README.md names. They are whole
// numbers, so that every target makes the same choices.

// The cost of one value in one stage.
int64_t KernelCost(int32_t p) {
    if (p % 2 != 0 && p > 10)
        return 3 * p / 5;
    int64_t cost = 2;
    for (; p > 1; p /= 2)
        ++cost;
    return cost;
}

int64_t RaderCost(int32_t p);

// The cost of one transform.
int64_t Cost(int32_t length) {
    FFTPlan plan = {};
    plan.length = length;
    Factorise(&plan);
    int64_t cost = 0;
    for (int32_t s = 0; s < plan.factorCount; ++s) {
        const int32_t p = plan.factors[s];
        if (plan.kinds[s] == RaderPrime)
            cost += length / p * RaderCost(p);
        else
            cost += length * (plan.kinds[s] == DirectPrime ? 2 * p : KernelCost(p));
    }
    return cost;
}

// The cost of the transform of a prime by a convolution of that length: its two transforms and the
// passes over the data.
int64_t CostByLength(int32_t p, int32_t length) { return 2 * Cost(length) + 30 * int64_t{p}; }

// The cheapest length for the padded convolution.
int32_t PaddedLength(int32_t p) {
    const int32_t least = 2 * p - 3;
    int32_t best = 0;
    int64_t bestCost = 0;
    for (int32_t threes = 1; threes < 2 * least; threes *= 3) {
        for (int32_t fives = threes; fives < 2 * least; fives *= 5) {
            for (int32_t length = fives; length < 2 * least; length *= 2) {
                if (length < least || length % 2 != 0)
                    continue;
                const int64_t cost = Cost(length);
                if (best == 0 || cost < bestCost) {
                    best = length;
                    bestCost = cost;
                }
            }
        }
    }
    return best;
}

int64_t RaderCost(int32_t p) { return CostByLength(p, RaderLength(p)); }

} // namespace

void Factorise(FFTPlan *plan) {
    int32_t n = plan->length;
    for (const int32_t radix : kernelRadices)
        for (; n % radix == 0; n /= radix)
            Append(plan, radix, KernelFactor);
    for (int32_t d = 3; int64_t{d} * d <= n; d += 2)
        for (; n % d == 0; n /= d)
            Append(plan, d, d < 50 ? DirectPrime : RaderPrime);
    if (n > 1)
        Append(plan, n, n <= 49 ? DirectPrime : RaderPrime);
    // The smallest factor becomes stage 0, the largest the leaf.
    for (int32_t i = 0; i < plan->factorCount; ++i) {
        for (int32_t j = i + 1; j < plan->factorCount; ++j) {
            if (plan->factors[j] < plan->factors[i]) {
                std::swap(plan->factors[i], plan->factors[j]);
                std::swap(plan->kinds[i], plan->kinds[j]);
            }
        }
    }
}

int32_t RaderLength(int32_t p) {
    constexpr int32_t smallestPadded = 128;    // below, all convolutions have length p - 1
    constexpr int32_t largestPadded = 1 << 24; // its work memory fits int32
    if (p < smallestPadded || p > largestPadded)
        return p - 1;
    const int32_t padded = PaddedLength(p);
    return CostByLength(p, padded) < CostByLength(p, p - 1) ? padded : p - 1;
}

} // namespace qx
