#include "qx/chirp_z.h"

#include "qx/errors.h"
#include "tests/support/hostile_host.h"
#include "tests/support/transform_reference.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>

namespace qx::test {
namespace {

// z^p in polar form in long double.
LongComplex Power(const CDB &z, Long p) {
    const LongComplex value = ToLong(z);
    return std::polar(std::pow(std::abs(value), p), p * std::arg(value));
}

template <class Values>
LongSpectrum OnSpiral(const Values &x, const CDB &a, const CDB &w, int32_t count) {
    LongSpectrum sums(static_cast<std::size_t>(count));
    for (std::size_t m = 0; m < sums.size(); ++m)
        for (std::size_t k = 0; k < x.size(); ++k)
            sums[m] += ToLong(x[k]) * Power(a, -Long(k)) * Power(w, Long(k) * Long(m));
    return sums;
}

CDB OnCircle(Long turns) {
    return {static_cast<double>(std::cos(2 * LongPi * turns)),
            static_cast<double>(std::sin(2 * LongPi * turns))};
}

struct Spiral {
    CDB a, w;
};
const Spiral spirals[] = {{{1, 0}, OnCircle(-0.02L)},
                          {{0.9, 0.3}, {0.998, -0.05}},
                          {{-1.02, 0.2}, {0.9944, 0.11}},
                          {{0.3, -1.0}, {-0.6, 0.801}}};

TEST(ChirpZ, BothMethodsFollowTheDefinition) {
    for (const Spiral &s : spirals)
        for (const int32_t n : {1, 2, 7, 60})
            for (const int32_t count : {0, 1, 5, 90}) {
                SCOPED_TRACE(testing::Message() << s.w.re << " n " << n << " count " << count);
                const auto x = RandomSignal(n, 1);
                const auto z = RandomComplex(n, 2);
                const DBLArray real(x);
                const CDBArray complex(z);
                const int32_t points = count < 1 ? n : count;
                const LongSpectrum expected = OnSpiral(x, s.a, s.w, points);
                const LongSpectrum expectedOfComplex = OnSpiral(z, s.a, s.w, points);
                for (const uint32_t method : {0U, 1U}) {
                    CDBArray out(2);
                    const double bound = method == 0 ? 2e-12 : 3e-12;
                    ASSERT_EQ(ChirpZT_head(real.handle(), &s.a, &s.w, count, method, out.handle()),
                              0);
                    EXPECT_LT(MaxError(out.values(), expected), bound);
                    ASSERT_EQ(
                        CxChirpZT_head(complex.handle(), &s.a, &s.w, count, method, out.handle()),
                        0);
                    EXPECT_LT(MaxError(out.values(), expectedOfComplex), bound);
                }
            }
}

TEST(ChirpZ, OnTheWholeCircleItIsTheTransform) {
    const CDB one = {1, 0};
    for (const int32_t n : {1, 2, 5, 53, 64}) {
        const CDB w = OnCircle(-1.0L / n);
        const auto z = RandomComplex(n);
        const CDBArray in(z);
        for (const uint32_t method : {0U, 1U}) {
            const CDBArray out;
            ASSERT_EQ(CxChirpZT_head(in.handle(), &one, &w, n, method, out.handle()), 0);
            EXPECT_LT(MaxError(out.values(), Dft(ToLong(z))), 4e-13);
        }
    }
}

// The squares of the chirp's indices exceed int32.
TEST(ChirpZ, LongSignalsKeepTheirChirp) {
    constexpr int32_t n = 50000;
    const CDB one = {1, 0}, w = OnCircle(-1.0L / (2 * n));
    std::vector<double> x(n);
    x[1] = 1.0;
    x[n - 1] = 1.0;
    const DBLArray in(x);
    const CDBArray out;
    ASSERT_EQ(ChirpZT_head(in.handle(), &one, &w, n, 1, out.handle()), 0);
    for (const int32_t m : {0, 1, 777, n - 1}) {
        const LongComplex expected = Power(w, m) + Power(w, Long(n - 1) * m);
        EXPECT_NEAR(out[m].re, static_cast<double>(expected.real()), 2e-7);
        EXPECT_NEAR(out[m].im, static_cast<double>(expected.imag()), 1.7e-10);
    }
}

double ErrorOfInverse(int32_t n, const CDB &a, const CDB &w) {
    const auto x = RandomComplex(n, static_cast<uint64_t>(n));
    std::vector<CDB> points;
    for (const LongComplex &value : OnSpiral(x, a, w, n))
        points.push_back({static_cast<double>(value.real()), static_cast<double>(value.imag())});
    const CDBArray in(points);
    const CDBArray out;
    EXPECT_EQ(InvChirpZT_head(in.handle(), &a, &w, 0, out.handle()), 0);
    return MaxError(out.values(), ToLong(x));
}

TEST(InverseChirpZ, RecoversTheSequence) {
    const CDB one = {1, 0};
    for (const int32_t n : {1, 2, 3, 10, 64, 100, 301})
        EXPECT_LT(ErrorOfInverse(n, one, OnCircle(-1.0L / n)), 3e-12) << n;
    EXPECT_LT(ErrorOfInverse(30, {0.9, 0.3}, OnCircle(1.0L / 30)), 3.3e-13);
    EXPECT_LT(ErrorOfInverse(12, {1.1, -0.2}, {0.9, -0.5}), 4e-14);
    EXPECT_LT(ErrorOfInverse(8, one, OnCircle(-0.05L)), 3.4e-12)
        << "an arc of less than half a turn";
}

// Products of thousands of differences leave the range of double; the result does not.
TEST(InverseChirpZ, ManyPointsDoNotOverflow) {
    constexpr int32_t n = 5000;
    const CDB one = {1, 0}, w = OnCircle(-1.0L / n);
    std::vector<CDB> points(n);
    for (int32_t m = 0; m < n; ++m)
        points[static_cast<std::size_t>(m)] = OnCircle(-3.0L * m / n);
    const CDBArray in(points);
    const CDBArray out;
    ASSERT_EQ(InvChirpZT_head(in.handle(), &one, &w, 0, out.handle()), 0);
    for (int32_t k = 0; k < n; ++k) {
        ASSERT_NEAR(out[k].re, k == 3 ? 1.0 : 0.0, 2e-12);
        ASSERT_NEAR(out[k].im, 0.0, 4.4e-10);
    }
}

// Points 0.8 1.05^k: the sixth is nearest to the unit circle, so the range of four begins at the
// fourth.
TEST(InverseChirpZ, FewerValuesUseTheRangeNearestToTheCircle) {
    const CDB a = {0, 1.25}, w = {1.05 * std::cos(0.9), 1.05 * std::sin(0.9)};
    const auto whole = RandomComplex(4);
    std::vector<CDB> points;
    for (const LongComplex &value : OnSpiral(whole, a, w, 12))
        points.push_back({static_cast<double>(value.real()), static_cast<double>(value.imag())});
    for (std::size_t k = 0; k < points.size(); ++k)
        if (k < 3 || k > 6)
            points[k] = {std::nan(""), 0};
    const CDBArray in(points);
    const CDBArray out;
    ASSERT_EQ(InvChirpZT_head(in.handle(), &a, &w, 4, out.handle()), 0);
    EXPECT_LT(MaxError(out.values(), ToLong(whole)), 4.2e-15);
    // All distances are equal on the circle, so the first points are used.
    const CDB one = {1, 0}, turn = {0, 1};
    const CDBArray three({{6, 0}, {-2, -2}, {2, 0}});
    ASSERT_EQ(InvChirpZT_head(three.handle(), &one, &turn, 2, out.handle()), 0);
    EXPECT_EQ(out.size(), 2);
    EXPECT_NEAR(out[0].re + out[1].re, 6, 3.6e-15);
}

TEST(ChirpZ, ChecksComeInOrderAndEmptyTheOutput) {
    const double nan = std::nan(""), inf = std::numeric_limits<double>::infinity();
    const CDB one = {1, 0}, zero = {0, 0}, broken = {0, nan}, endless = {inf, 1}, i = {0, 1};
    const DBLArray x(RandomSignal(4)), none;
    const CDBArray z(RandomComplex(5)), noneComplex;
    const auto forward = [&](const DBLArray &in, const CDB &a, const CDB &w, uint32_t method) {
        const CDBArray out(2);
        const ErrorCode status = ChirpZT_head(in.handle(), &a, &w, 3, method, out.handle());
        EXPECT_EQ(out.size(), 0);
        return status;
    };
    EXPECT_EQ(forward(none, zero, zero, 2), ErrEmptyInput);
    EXPECT_EQ(forward(x, zero, zero, 2), ErrInvalidSelector);
    EXPECT_EQ(forward(x, zero, broken, 1), ErrTooFewWeights);
    EXPECT_EQ(forward(x, endless, zero, 0), ErrNonFiniteInput);
    EXPECT_EQ(forward(x, one, broken, 0), ErrNonFiniteInput);
    EXPECT_EQ(forward(x, one, zero, 1), ErrTooFewWeights);
    const auto inverse = [&](const CDBArray &in, const CDB &a, const CDB &w, int32_t count) {
        const CDBArray out(2);
        const ErrorCode status = InvChirpZT_head(in.handle(), &a, &w, count, out.handle());
        EXPECT_EQ(out.size(), 0);
        return status;
    };
    EXPECT_EQ(inverse(noneComplex, zero, zero, 9), ErrEmptyInput);
    EXPECT_EQ(inverse(z, zero, zero, 6), ErrSizesDisagree);
    EXPECT_EQ(inverse(z, broken, zero, 5), ErrNonFiniteInput);
    EXPECT_EQ(inverse(z, one, zero, 5), ErrTooFewWeights);
    EXPECT_EQ(inverse(z, one, one, 2), ErrDegenerateValue);
    EXPECT_EQ(inverse(z, one, i, 5), ErrDegenerateValue) << "the fifth point is the first";
}

} // namespace
} // namespace qx::test
