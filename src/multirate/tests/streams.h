#ifndef QX_MULTIRATE_TESTS_STREAMS_H
#define QX_MULTIRATE_TESTS_STREAMS_H

#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"
#include "tests/support/test_data.h"

#include <complex>
#include <cstdlib>
#include <fstream>
#include <string>
#include <vector>

namespace qx::test {

// The signals of the tests, whatever the element type of the export.
typedef std::vector<std::complex<long double>> Signal;

template <ElementType Code>
constexpr bool isComplex = Code == ElementType::CDB || Code == ElementType::CSG;
template <ElementType Code>
constexpr bool isSingle = Code == ElementType::SGL || Code == ElementType::CSG;
template <ElementType Code>
constexpr long double epsilon = isSingle<Code> ? 0x1p-23L : 0x1p-52L;

template <ElementType Code>
void Set(Array1D<Code> &array, const Signal &signal) {
    for (std::size_t i = 0; i < signal.size(); ++i)
        if constexpr (isComplex<Code>) {
            array.data()[i].re = signal[i].real();
            array.data()[i].im = signal[i].imag();
        } else {
            array.data()[i] = signal[i].real();
        }
}
template <ElementType Code>
Signal Get(const Array1D<Code> &array) {
    Signal signal;
    for (int32_t i = 0; i < array.size(); ++i)
        if constexpr (isComplex<Code>)
            signal.emplace_back(+array.data()[i].re, +array.data()[i].im);
        else
            signal.emplace_back(+array.data()[i]);
    return signal;
}

// Noise that single precision represents exactly.
inline Signal NoiseSignal(int32_t n, uint64_t seed, bool complex) {
    Noise noise(seed);
    Signal signal;
    for (int32_t i = 0; i < n; ++i) {
        const auto re = static_cast<float>(noise.symmetric());
        const auto im = static_cast<float>(noise.symmetric());
        signal.emplace_back(re, complex ? im : 0.0F);
    }
    return signal;
}

inline Signal Part(const Signal &signal, std::size_t first, int32_t n) {
    const auto from = signal.begin() + static_cast<std::ptrdiff_t>(first);
    return Signal(from, from + n);
}
inline void Append(Signal &signal, const Signal &more) {
    signal.insert(signal.end(), more.begin(), more.end());
}

// Blocks of 0, 1, 2, prime and large sizes that make up n samples.
inline std::vector<int32_t> RandomBlocks(int32_t n, uint64_t seed) {
    static const int32_t sizes[] = {0, 1, 1, 2, 3, 7, 13, 31, 97, 251};
    Noise noise(seed);
    std::vector<int32_t> blocks;
    for (int32_t left = n; left > 0; left -= blocks.back())
        blocks.push_back(std::min(left, sizes[noise.bits() % std::size(sizes)]));
    blocks.push_back(0);
    return blocks;
}

// A case that make_scipy_rates.py wrote for a function of scipy.signal.
struct SciPyCase {
    int32_t up, down;
    Signal x, h, y;
};
inline std::vector<SciPyCase> SciPyCases(const std::string &function) {
    std::vector<SciPyCase> cases;
    std::ifstream file(TestData("scipy_rates.dat"));
    for (std::string name; file >> name;) {
        SciPyCase c;
        std::size_t sizes[3];
        file >> c.up >> c.down >> sizes[0] >> sizes[1] >> sizes[2];
        Signal *parts[] = {&c.x, &c.h, &c.y};
        for (int part = 0; part < 3; ++part)
            for (std::string number; parts[part]->size() < sizes[part] && file >> number;)
                parts[part]->emplace_back(std::strtod(number.c_str(), nullptr));
        if (name == function)
            cases.push_back(c);
    }
    return cases;
}

// u[i], and 0 outside.
inline std::complex<long double> At(const Signal &u, int64_t i) {
    return i >= 0 && i < static_cast<int64_t>(u.size()) ? u[static_cast<std::size_t>(i)] : 0;
}

// By definition: L - 1 zeros after each sample, then the full convolution with h.
inline Signal StuffedAndFiltered(const Signal &x, int32_t L, const Signal &h) {
    Signal stuffed(x.size() * static_cast<std::size_t>(L));
    for (std::size_t i = 0; i < x.size(); ++i)
        stuffed[i * static_cast<std::size_t>(L)] = x[i];
    Signal y(stuffed.size() + h.size());
    for (std::size_t i = 0; i < stuffed.size(); ++i)
        if (stuffed[i] != 0.0L)
            for (std::size_t k = 0; k < h.size(); ++k)
                y[i + k] += h[k] * stuffed[i];
    return y;
}

// A bound on the rounding error of a sum with these taps over samples below sqrt(2).
inline long double SumBound(const Signal &h, long double scale, long double epsilon) {
    long double sum = 0;
    for (const auto &tap : h)
        sum += std::abs(tap);
    return epsilon * std::abs(scale) * (1 + sum) * 2;
}

inline bool SameBits(const Signal &a, const Signal &b) {
    if (a.size() != b.size())
        return false;
    for (std::size_t i = 0; i < a.size(); ++i)
        if (a[i] != b[i] || std::signbit(a[i].real()) != std::signbit(b[i].real()))
            return false;
    return true;
}

} // namespace qx::test

#endif
