#ifndef QX_TESTS_TRANSFORM_REFERENCE_H
#define QX_TESTS_TRANSFORM_REFERENCE_H

#include "qx/fft.h"
#include "tests/support/hostile_host.h"

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <cstdint>
#include <cstring>
#include <vector>

// Shared by the tests of the transform families: transforms by their definition in long double,
// signals, and the memory of a node.

namespace qx::test {

typedef long double Long;
typedef std::complex<Long> LongComplex;
typedef std::vector<double> Signal;
typedef std::vector<LongComplex> LongSpectrum;

inline constexpr Long LongPi = 3.141592653589793238462643383279502884L;

// exp(2 pi i numerator / denominator), with exact argument reduction.
inline LongComplex Turn(int64_t numerator, int64_t denominator) {
    const Long angle = 2 * LongPi * static_cast<Long>(numerator % denominator) / denominator;
    return {std::cos(angle), std::sin(angle)};
}

// sum over j of x[j] exp(sign 2 pi i j k / n) for each k, unscaled.
inline LongSpectrum Dft(const LongSpectrum &x, int sign = -1) {
    const auto n = static_cast<int64_t>(x.size());
    LongSpectrum sums(x.size());
    for (int64_t k = 0; k < n; ++k)
        for (int64_t j = 0; j < n; ++j)
            sums[k] += x[j] * Turn(sign * (j * k % n), n);
    return sums;
}

// Pseudo-random values in [-1, 1).
inline Signal RandomSignal(int32_t n, uint64_t seed = 1) {
    Signal x;
    for (int32_t i = 0; i < n; ++i) {
        seed = seed * 6364136223846793005U + 1442695040888963407U;
        x.push_back(static_cast<double>(seed >> 11) * 0x1p-52 - 1.0);
    }
    return x;
}

inline std::vector<CDB> RandomComplex(int32_t n, uint64_t seed = 1) {
    const Signal parts = RandomSignal(2 * n, seed);
    std::vector<CDB> x;
    for (int32_t i = 0; i < n; ++i)
        x.push_back({parts[2 * i], parts[2 * i + 1]});
    return x;
}

inline LongComplex ToLong(const CDB &value) { return {value.re, value.im}; }
inline LongComplex ToLong(double value) { return {value, 0}; }
template <class Values>
LongSpectrum ToLong(const Values &values) {
    LongSpectrum result;
    for (const auto &value : values)
        result.push_back(ToLong(value));
    return result;
}

// The largest error against the reference, relative to its largest value.
template <class Values>
double MaxError(const Values &values, const LongSpectrum &reference) {
    if (values.size() != reference.size())
        return HUGE_VAL;
    Long error = 0;
    Long scale = 0;
    for (std::size_t i = 0; i < reference.size(); ++i) {
        const Long difference = std::abs(ToLong(values[i]) - reference[i]);
        if (!(difference <= error))
            error = difference; // also where the difference is NaN
        scale = std::max(scale, std::abs(reference[i]));
    }
    return static_cast<double>(scale > 0 ? error / scale : error);
}

template <class T>
bool SameBits(const std::vector<T> &a, const std::vector<T> &b) {
    return a.size() == b.size() &&
           (a.empty() || std::memcmp(a.data(), b.data(), a.size() * sizeof(T)) == 0);
}

// The words in which a node keeps its plans: slots, and the host's instance data. The destructor
// acts as the host's clean-up.
struct Node {
    PlanSlot slot = nullptr;
    PlanSlot second = nullptr;
    InstanceWord instance = nullptr;

    Node() = default;
    ~Node() {
        RunSweepOf(slot);
        RunSweepOf(second);
        TransformUnreserveProc(&instance);
    }
    Node(const Node &) = delete;
    Node &operator=(const Node &) = delete;
};

} // namespace qx::test

#endif
