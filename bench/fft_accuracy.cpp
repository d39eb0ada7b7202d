// The errors of the transforms and of FFTW on the same data, for the table of
// src/fft/README.md. The reference is a transform in long double, 11 bits more precise than double:
// of mixed radix for small factors, by Bluestein's algorithm for large ones.

#include "fft/plan.h"

#include <algorithm>
#include <cmath>
#include <complex>
#include <cstdint>
#include <cstdio>
#include <functional>
#include <string>
#include <vector>

#ifdef QX_PEER_FFTW3
#include <fftw3.h>
#endif

namespace {

using qx::PlanReference;

typedef std::complex<long double> Complex;
typedef std::vector<Complex> Signal;

// exp(-2 pi i k / n), k below n, by an angle of at most an eighth of a turn.
Complex Root(int64_t k, int64_t n) {
    const long double turn = 6.283185307179586476925286766559005768L;
    const int64_t octant = 8 * k / n;
    const int64_t quarter = (octant + 1) / 2;
    const long double angle = turn * static_cast<long double>(4 * k - quarter * n) / (4 * n);
    const Complex w(std::cos(angle), -std::sin(angle));
    const Complex turned[] = {w, {w.imag(), -w.real()}, -w, {-w.imag(), w.real()}};
    return turned[quarter % 4];
}

int64_t SmallestFactor(int64_t n) {
    for (int64_t d = 2; d * d <= n; ++d)
        if (n % d == 0)
            return d;
    return n;
}

Signal Reference(const Signal &x);

Signal Bluestein(const Signal &x) {
    const auto n = static_cast<int64_t>(x.size());
    int64_t padded = 1;
    while (padded < 2 * n)
        padded *= 2;
    Signal a(padded), b(padded);
    for (int64_t j = 0; j < n; ++j) {
        const Complex chirp = Root(j * j % (2 * n), 2 * n);
        a[j] = x[j] * chirp;
        b[j] = b[(padded - j) % padded] = std::conj(chirp);
    }
    a = Reference(a);
    b = Reference(b);
    for (int64_t k = 0; k < padded; ++k)
        a[k] = std::conj(a[k] * b[k]);
    a = Reference(a);
    Signal spectrum(n);
    for (int64_t k = 0; k < n; ++k)
        spectrum[k] =
            std::conj(a[k]) * Root(k * k % (2 * n), 2 * n) / static_cast<long double>(padded);
    return spectrum;
}

Signal Reference(const Signal &x) {
    const auto n = static_cast<int64_t>(x.size());
    const int64_t p = SmallestFactor(n);
    if (n == 1)
        return x;
    if (p > 64)
        return Bluestein(x);
    const int64_t m = n / p;
    std::vector<Signal> parts;
    for (int64_t j = 0; j < p; ++j) {
        Signal part;
        for (int64_t i = j; i < n; i += p)
            part.push_back(x[i]);
        parts.push_back(m == 1 ? part : Reference(part));
    }
    Signal roots(p), spectrum(n);
    for (int64_t q = 0; q < p; ++q)
        roots[q] = Root(q, p);
    for (int64_t k = 0; k < m; ++k) {
        Signal turned(p);
        for (int64_t j = 0; j < p; ++j)
            turned[j] = parts[j][k] * Root(j * k, n);
        for (int64_t q = 0; q < p; ++q)
            for (int64_t j = 0; j < p; ++j)
                spectrum[k + q * m] += turned[j] * roots[j * q % p];
    }
    return spectrum;
}

std::vector<double> Noise(std::size_t n) {
    std::vector<double> x(n);
    uint64_t state = n;
    for (double &value : x) {
        state = state * 6364136223846793005U + 1442695040888963407U;
        value = static_cast<double>(state >> 11) * 0x1p-52 - 1.0;
    }
    return x;
}

// The root mean square of the error divided by that of the spectrum.
double RelativeError(const Signal &expected, const std::function<Complex(std::size_t)> &found) {
    long double error = 0;
    long double size = 0;
    for (std::size_t k = 0; k < expected.size(); ++k) {
        error += std::norm(found(k) - expected[k]);
        size += std::norm(expected[k]);
    }
    return static_cast<double>(std::sqrt(error / size));
}

struct Errors {
    double complex, real, peer;
};

Errors Measure(int32_t n) {
    std::vector<double> x = Noise(2 * n);
    std::vector<double> y(2 * n);
    Signal signal;
    for (int32_t j = 0; j < n; ++j)
        signal.emplace_back(x[2 * j], x[2 * j + 1]);
    const Signal expected = Reference(signal);
    const PlanReference plan(n);
    Errors errors = {};
    qx::FFTComplexForward(plan.get(), &x[0], &x[1], &y[0], &y[1], 2, 2, n);
    const auto interleaved = [&](std::size_t k) { return Complex(y[2 * k], y[2 * k + 1]); };
    errors.complex = RelativeError(expected, interleaved);
#ifdef QX_PEER_FFTW3
    auto *const in = reinterpret_cast<fftw_complex *>(x.data());
    auto *const out = reinterpret_cast<fftw_complex *>(y.data());
    const fftw_plan peer = fftw_plan_dft_1d(n, in, out, FFTW_FORWARD, FFTW_ESTIMATE);
    fftw_execute(peer);
    errors.peer = RelativeError(expected, interleaved);
    fftw_destroy_plan(peer);
#endif
    // The spectrum of the real parts is the even part of that of the complex values.
    Signal even(n);
    for (int32_t k = 0; k < n; ++k)
        even[k] = (expected[k] + std::conj(expected[(n - k) % n])) / 2.0L;
    qx::FFTRealForward(plan.get(), x.data(), y.data(), 2, 1, n);
    errors.real = RelativeError(even, [&](std::size_t k) {
        const std::size_t mirrored = (n - k) % n;
        const std::size_t low = std::min(k, mirrored);
        const double im = 2 * low == std::size_t(n) || low == 0 ? 0 : y[n - low];
        return Complex(y[low], k == low ? im : -im);
    });
    return errors;
}

bool KernelsOnly(int32_t n) {
    const PlanReference plan(n);
    return std::all_of(plan.get()->kinds, plan.get()->kinds + plan.get()->factorCount,
                       [](int32_t kind) { return kind == qx::KernelFactor; });
}

// A row of the table for a set of lengths: the largest errors, and the largest errors over log2(n).
class Row {
public:
    explicit Row(std::string name) : name_(std::move(name)) {}
    void add(int32_t n) {
        const Errors errors = Measure(n);
        const double ours[] = {errors.complex, errors.real, errors.peer};
        for (int i = 0; i < 3; ++i) {
            worst_[i] = std::max(worst_[i], ours[i]);
            perLog_[i] = std::max(perLog_[i], ours[i] / std::max(1.0, std::log2(n)));
        }
    }
    void print() const {
        std::printf("| %s | %.2g | %.2g | %.2g | %.2g | %.2g | %.2g |\n", name_.c_str(), worst_[0],
                    worst_[1], worst_[2], perLog_[0], perLog_[1], perLog_[2]);
        std::fflush(stdout);
    }

private:
    std::string name_;
    double worst_[3] = {};
    double perLog_[3] = {};
};

bool IsPrime(int32_t n) { return SmallestFactor(n) == n; }

} // namespace

int main() {
    std::printf(
        "| lengths | complex | real | FFTW | complex / log2 N | real / log2 N | FFTW / log2 N "
        "|\n|---|---|---|---|---|---|---|\n");
    Row kernels("2 to 1024, kernels only");
    Row others("2 to 1024, with other primes");
    for (int32_t n = 2; n <= 1024; ++n)
        (KernelsOnly(n) ? kernels : others).add(n);
    kernels.print();
    others.print();
    for (int power = 11; power <= 20; ++power) {
        Row row("2^" + std::to_string(power));
        row.add(1 << power);
        row.print();
    }
    Row primes("40 primes from 1031 to 99991");
    for (int32_t i = 0; i < 40; ++i) {
        auto n = static_cast<int32_t>(1030 * std::pow(97.0, i / 39.0));
        while (!IsPrime(n))
            ++n;
        primes.add(n);
    }
    primes.add(99991);
    primes.print();
    Row products("60 products of two primes from 53 to 311");
    const int32_t factors[] = {53, 59, 83, 107, 127, 167, 193, 227, 251, 283, 311};
    int32_t count = 0;
    for (const int32_t a : factors)
        for (const int32_t b : factors)
            if (a <= b && count++ < 60)
                products.add(a * b);
    products.print();
    Row tens("10^4 to 10^6");
    for (const int32_t n : {10000, 100000, 1000000})
        tens.add(n);
    tens.print();
}
