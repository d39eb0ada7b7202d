#include "fft/plan.h"

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <cstdint>
#include <vector>

namespace {

using qx::PlanReference;

typedef std::complex<long double> Complex;

std::vector<double> Noise(std::size_t n, uint64_t seed = 1) {
    std::vector<double> x(n);
    for (double &value : x) {
        seed = seed * 6364136223846793005U + 1442695040888963407U;
        value = static_cast<double>(seed >> 11) * 0x1p-52 - 1.0;
    }
    return x;
}

// The definition. Roots are taken from a table of exact angles.
std::vector<Complex> Definition(const std::vector<double> &interleaved) {
    const std::size_t n = interleaved.size() / 2;
    std::vector<Complex> roots(n);
    std::vector<Complex> spectrum(n);
    for (std::size_t k = 0; k < n; ++k)
        roots[k] = std::polar(1.0L, -8 * std::atan(1.0L) * k / n);
    for (std::size_t k = 0; k < n; ++k)
        for (std::size_t j = 0; j < n; ++j)
            spectrum[k] += Complex(interleaved[2 * j], interleaved[2 * j + 1]) * roots[j * k % n];
    return spectrum;
}

double WorstComplex(const std::vector<Complex> &expected, const DBL *re, const DBL *im,
                    std::ptrdiff_t stride) {
    double worst = 0;
    for (std::size_t k = 0; k < expected.size(); ++k) {
        const Complex found(re[k * stride], im[k * stride]);
        worst = std::max(worst, static_cast<double>(std::abs(found - expected[k])));
    }
    return worst;
}

double WorstHalf(const std::vector<Complex> &expected, const DBL *h, std::ptrdiff_t stride) {
    const std::size_t n = expected.size();
    double worst = 0;
    for (std::size_t k = 0; k < n; ++k) {
        const long double wanted = 2 * k <= n ? expected[k].real() : expected[n - k].imag();
        worst = std::max(worst, static_cast<double>(std::abs(h[k * stride] - wanted)));
    }
    return worst;
}

void CheckLength(int32_t n) {
    SCOPED_TRACE(n);
    const double tolerance = 8e-15 * std::sqrt(n);
    const PlanReference plan(n);
    std::vector<double> x = Noise(2 * n, n);
    std::vector<double> y(2 * n), back(2 * n);
    const std::vector<Complex> expected = Definition(x);
    ASSERT_EQ(0, qx::FFTComplexForward(plan.get(), &x[0], &x[1], &y[0], &y[1], 2, 2, n));
    EXPECT_LT(WorstComplex(expected, &y[0], &y[1], 2), tolerance);
    ASSERT_EQ(0, qx::FFTComplexInverse(plan.get(), &y[0], &y[1], &back[0], &back[1], 2, 2, n));
    for (int32_t i = 0; i < 2 * n; ++i)
        ASSERT_NEAR(back[i], x[i], 2e-14);

    for (int32_t i = 0; i < n; ++i)
        x[2 * i + 1] = 0;
    const std::vector<Complex> expectedReal = Definition(x);
    ASSERT_EQ(0, qx::FFTRealForward(plan.get(), x.data(), y.data(), 2, 1, n));
    EXPECT_LT(WorstHalf(expectedReal, y.data(), 1), tolerance);
    ASSERT_EQ(0, qx::FFTRealInverse(plan.get(), y.data(), back.data(), 1, 1, n));
    for (int32_t i = 0; i < n; ++i)
        ASSERT_NEAR(back[i], x[2 * i], 2e-14);
}

TEST(Transform, FollowsTheDefinition) {
    for (int32_t n = 1; n <= 300; ++n)
        CheckLength(n);
    for (const int32_t n : {1000, 1024, 1058, 1081, 2048, 2209, 2809, 43 * 41, 37 * 31, 1021, 1283})
        CheckLength(n);
}

} // namespace
