#include "linalg/lapack.h"
#include "linalg/matrix.h"
#include "linalg/products/products.h"
#include "linalg/tests/matrices.h"

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <thread>
#include <vector>

namespace qx::test {
namespace {

typedef std::complex<long double> Exact;

Exact Of(CDB z) { return {z.re, z.im}; }

// The largest difference from the definition (summed in descending order in long double), divided
// by the largest sum of moduli.
template <class T>
double ErrorOfProduct(const std::vector<T> &a, const std::vector<T> &b, const std::vector<T> &c,
                      int m, int k, int n) {
    long double error = 0, scale = 0;
    for (int i = 0; i < m; ++i)
        for (int j = 0; j < n; ++j) {
            Exact sum = 0;
            long double moduli = 0;
            for (int p = k - 1; p >= 0; --p) {
                sum += Of(a[i * k + p]) * Of(b[p * n + j]);
                moduli += std::abs(Of(a[i * k + p]) * Of(b[p * n + j]));
            }
            error = std::max(error, std::abs(sum - Of(c[i * n + j])));
            scale = std::max(scale, moduli);
        }
    return static_cast<double>(error / scale);
}

constexpr auto Multiply = &qx::MatrixProduct<qx::ElementType::DBL>;

TEST(Products, TransposesAndConjugates) {
    const int m = 37, n = 21;
    const auto a = Complexes(m * n, 1);
    std::vector<CDB> t(m * n), product(m * m);
    qx::CopyTransposed<qx::ElementType::CDB>(View(a, m, n), View(t, n, m));
    for (int i = 0; i < m; ++i)
        for (int j = 0; j < n; ++j)
            EXPECT_EQ(t[j * m + i].im, a[i * n + j].im);
    qx::ProductWithConjugate(View(a, m, n), View(a, m, n), View(product, m, m));
    for (CDB &z : t)
        z = qx::Conj(z);
    EXPECT_LT(ErrorOfProduct(a, t, product, m, n, m), 8e-16);
}

TEST(Lapack, BandAndTridiagonalDriversSolve) {
    // The complex band matrix of (i, 2, i) of order 4; x = 1.
    const int n = 4;
    CDB band[4 * 4], b[4];
    for (int j = 0; j < n; ++j) {
        band[4 * j + 1] = band[4 * j + 3] = {0.0, 1.0};
        band[4 * j + 2] = {2.0, 0.0};
        b[j] = {2.0, j == 0 || j == n - 1 ? 1.0 : 2.0};
    }
    int32_t pivots[4];
    ASSERT_EQ(qx::lapack::SolveBand(n, 1, 1, 1, band, pivots, b), 0);
    for (const CDB &x : b) {
        EXPECT_NEAR(x.re, 1.0, 1e-15);
        EXPECT_NEAR(x.im, 0.0, 1e-15);
    }
}

TEST(Products, ConcurrentThreadsGetTheBitsOfOneAlone) {
    const int n = 150;
    const auto a = Reals(n * n, 1), b = Reals(n * n, 2);
    std::vector<double> expected(n * n);
    Multiply(View(a, n, n), View(b, n, n), View(expected, n, n));
    std::vector<std::vector<double>> results(8, std::vector<double>(n * n));
    std::vector<std::thread> threads;
    for (auto &c : results)
        threads.emplace_back([&] {
            for (int round = 0; round < 20; ++round)
                Multiply(View(a, n, n), View(b, n, n), View(c, n, n));
        });
    for (std::thread &thread : threads)
        thread.join();
    for (const auto &c : results)
        EXPECT_EQ(c, expected);
}

} // namespace
} // namespace qx::test
