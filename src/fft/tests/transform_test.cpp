#include "fft/half_complex.h"
#include "fft/plan.h"
#include "frame/workspace.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <complex>
#include <cstdint>
#include <cstring>
#include <thread>
#include <vector>

namespace qx::test {
namespace {

typedef std::complex<long double> Complex;

std::vector<double> Noise(std::size_t n, uint64_t seed = 1) {
    std::vector<double> x(n);
    for (double &value : x) {
        seed = seed * 6364136223846793005U + 1442695040888963407U;
        value = static_cast<double>(seed >> 11) * 0x1p-52 - 1.0;
    }
    return x;
}

// The definition, with roots from a table of exact angles.
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
    for (const int32_t n :
         {1000, 1024, 1058, 1081, 2048, 2209, 2809, 43 * 41, 37 * 31, 1021, 1283, 2 * 383})
        CheckLength(n);
}

// Single frequencies of long transforms, in which columns are copied and processed in bundles.
TEST(Transform, FollowsTheDefinitionAtGreatLengths) {
    for (const int32_t n : {16384, 32768, 65536, 131072, 100000, 46656, 53 * 4096, 23 * 2048, 10007,
                            24469, 32 * 719}) {
        SCOPED_TRACE(n);
        const PlanReference plan(n);
        const std::vector<double> x = Noise(2 * n, n);
        std::vector<double> y(2 * n), h(n);
        ASSERT_EQ(0, qx::FFTComplexForward(plan.get(), &x[0], &x[1], &y[0], &y[1], 2, 2, n));
        ASSERT_EQ(0, qx::FFTRealForward(plan.get(), x.data(), h.data(), 2, 1, n));
        std::vector<Complex> roots(n);
        for (int32_t k = 0; k < n; ++k)
            roots[k] = std::polar(1.0L, -8 * std::atan(1.0L) * k / n);
        for (const int64_t k : {0, 1, 7, n / 32 + 1, n / 3, n / 2 - 1, n / 2, n - 1}) {
            Complex complex, real;
            for (int64_t j = 0; j < n; ++j) {
                complex += Complex(x[2 * j], x[2 * j + 1]) * roots[j * k % n];
                real += Complex(x[2 * j]) * roots[j * k % n];
            }
            const double tolerance = 2e-14 * std::sqrt(n);
            EXPECT_NEAR(y[2 * k], complex.real(), tolerance) << k;
            EXPECT_NEAR(y[2 * k + 1], complex.imag(), tolerance) << k;
            EXPECT_NEAR(h[k], 2 * k <= n ? real.real() : -real.imag(), tolerance) << k;
        }
    }
}

// Strided values at addresses that are 4 modulo 16, as in the host, with guarded memory between
// them.
class Strided {
public:
    Strided(std::size_t n, std::ptrdiff_t stride)
        : stride_(stride), bytes_(8 * n * stride + 32, 0x5A) {}
    DBL *data() {
        const auto address = reinterpret_cast<std::uintptr_t>(bytes_.data());
        return reinterpret_cast<DBL *>(bytes_.data() + (20 - address % 16) % 16);
    }
    DBL &operator[](std::size_t i) { return data()[i * stride_]; }
    int32_t stride() const { return static_cast<int32_t>(stride_); }
    bool gapsUntouched(std::size_t n) {
        for (std::size_t i = 0; i + 1 < n * stride_; ++i)
            for (std::size_t byte = 0; byte < 8; ++byte)
                if (i % stride_ != 0 && reinterpret_cast<unsigned char *>(data() + i)[byte] != 0x5A)
                    return false;
        return true;
    }

private:
    std::ptrdiff_t stride_;
    std::vector<unsigned char> bytes_;
};

// A transform gives the same bits at other strides and alignments, with separate parts, and while
// another transform uses the plan's buffer.
void CheckStrides(int32_t n) {
    SCOPED_TRACE(n);
    const PlanReference plan(n);
    const std::vector<double> x = Noise(2 * n, n);
    std::vector<double> y(2 * n), h(n), unbufferedY(2 * n), unbufferedH(n);
    ASSERT_EQ(0, qx::FFTComplexForward(plan.get(), &x[0], &x[1], &y[0], &y[1], 2, 2, n));
    ASSERT_EQ(0, qx::FFTRealForward(plan.get(), x.data(), h.data(), 2, 1, n));
    void *const buffer = plan.get()->buffer.exchange(nullptr);
    EXPECT_EQ(buffer != nullptr, n % 1024 == 0 && n > 4096 && n <= 1 << 17)
        << "only long transforms whose columns collide in the cache have a buffer";
    qx::FFTComplexForward(plan.get(), &x[0], &x[1], &unbufferedY[0], &unbufferedY[1], 2, 2, n);
    qx::FFTRealForward(plan.get(), x.data(), unbufferedH.data(), 2, 1, n);
    EXPECT_EQ(plan.get()->buffer.exchange(buffer), nullptr);
    EXPECT_EQ(y, unbufferedY);
    EXPECT_EQ(h, unbufferedH);
    for (const int32_t stride : {1, 2, 3}) {
        Strided inRe(n, stride), inIm(n, stride), re(n, 4 - stride), im(n, 4 - stride);
        Strided interleaved(2 * n, 1);
        for (int32_t i = 0; i < n; ++i) {
            inRe[i] = x[2 * i];
            inIm[i] = x[2 * i + 1];
        }
        ASSERT_EQ(0, qx::FFTComplexForward(plan.get(), inRe.data(), inIm.data(), re.data(),
                                           im.data(), stride, re.stride(), n));
        ASSERT_EQ(0, qx::FFTComplexForward(plan.get(), &x[0], &x[1], interleaved.data(),
                                           interleaved.data() + 1, 2, 2, n));
        bool same = re.gapsUntouched(n) && im.gapsUntouched(n);
        for (int32_t i = 0; i < n; ++i)
            same = same && re[i] == y[2 * i] && im[i] == y[2 * i + 1] &&
                   interleaved[2 * i] == y[2 * i] && interleaved[2 * i + 1] == y[2 * i + 1];
        EXPECT_TRUE(same) << "complex, stride " << stride;
        Strided half(n, stride);
        ASSERT_EQ(0, qx::FFTRealForward(plan.get(), inRe.data(), half.data(), stride, stride, n));
        same = half.gapsUntouched(n);
        for (int32_t i = 0; i < n; ++i)
            same = same && half[i] == h[i];
        EXPECT_TRUE(same) << "real, stride " << stride;
    }
}

// The same for inverses, whose passes over the whole array have a separate form for contiguous
// values.
void CheckStridesOfInverses(int32_t n) {
    SCOPED_TRACE(n);
    const PlanReference plan(n);
    const std::vector<double> x = Noise(2 * n, n);
    std::vector<double> y(2 * n), h(x), back(n), re(3 * n), im(3 * n), wideH(3 * n),
        wideBack(3 * n);
    for (int32_t i = 0; i < n; ++i)
        wideH[3 * i] = x[i];
    qx::FFTComplexInverse(plan.get(), &x[0], &x[1], &y[0], &y[1], 2, 2, n);
    qx::FFTComplexInverse(plan.get(), &x[0], &x[1], &re[0], &im[0], 2, 3, n);
    qx::FFTRealInverse(plan.get(), h.data(), back.data(), 1, 1, n);
    qx::FFTRealInverse(plan.get(), wideH.data(), wideBack.data(), 3, 3, n);
    bool same = true;
    for (int32_t i = 0; i < n; ++i)
        same = same && re[3 * i] == y[2 * i] && im[3 * i] == y[2 * i + 1] &&
               wideBack[3 * i] == back[i] && wideH[3 * i] == h[i];
    EXPECT_TRUE(same);
}

TEST(Transform, GivesTheSameBitsAtEveryStrideAndAlignment) {
    for (int32_t n = 1; n <= 70; ++n) {
        CheckStrides(n);
        CheckStridesOfInverses(n);
    }
    for (const int32_t n :
         {74,   82,   83,   86,   100,   107,   167,   210,       2 * 167, 529,   720,     1000,
          1024, 2048, 2809, 8192, 10000, 16384, 32768, 17 * 1024, 24010,   65536, 1 << 17, 1 << 18})
        CheckStrides(n);
}

// The kernels as the plan stores them, applied as leaves to several columns.
TEST(Transform, LeafKernelsTakeColumns) {
    constexpr int32_t count = 5;
    for (const int32_t p :
         {2, 3, 4, 5, 7, 8, 9, 10, 11, 13, 14, 16, 17, 18, 19, 29, 31, 32, 37, 41, 43}) {
        SCOPED_TRACE(p);
        const PlanReference plan(p);
        const FFTPlan &table = *plan.get();
        ASSERT_EQ(table.factorCount, 1);
        ASSERT_EQ(table.factors[0], p);
        const std::vector<double> x = Noise(2 * p * count, p);
        std::vector<double> y(2 * p * count), h(p * count);
        table.complexLeaf[0](&x[0], &x[1], &y[0], &y[1], 2, 2, count);
        table.realLeaf[0](x.data(), h.data(), 2, 1, count);
        for (int32_t i = 0; i < count; ++i) {
            std::vector<double> column, real;
            for (int32_t j = 0; j < p; ++j) {
                column.insert(column.end(), {x[2 * (i + j * count)], x[2 * (i + j * count) + 1]});
                real.insert(real.end(), {x[2 * (i + j * count)], 0});
            }
            const DBL *const results = &y[2 * i * p];
            EXPECT_LT(WorstComplex(Definition(column), results, results + 1, 2), 4e-16 * p);
            EXPECT_LT(WorstHalf(Definition(real), &h[i * p], 1), 4e-16 * p);
        }
    }
}

// Zeros and conjugates are exact, in both orders.
TEST(Transform, HalfComplexFormExpandsToTheFullSpectrum) {
    for (int32_t n = 1; n <= 12; ++n) {
        for (const int32_t shift : {0, 1}) {
            SCOPED_TRACE(testing::Message() << n << " " << shift);
            const std::vector<double> h = Noise(n);
            std::vector<double> full(2 * n, 9);
            std::copy(h.begin(), h.end(), qx::CompactHalf(full.data(), n, shift));
            qx::FFTCompactToFull(full.data(), n, shift);
            for (int32_t f = 0; f < n; ++f) {
                const int32_t element = shift == 0 ? f : (f + n / 2) % n;
                const int32_t k = std::min(f, n - f);
                const bool isReal = f == 0 || 2 * f == n;
                const double im = isReal ? 0 : h[n - k];
                EXPECT_EQ(full[2 * element], h[f == 0 ? 0 : k]) << f;
                EXPECT_EQ(full[2 * element + 1], 2 * f <= n ? im : -im) << f;
            }
        }
    }
}

TEST(Transform, SmallLengthsByHand) {
    const double x[] = {1, 2, 4, 8};
    double y[4];
    const PlanReference two(2), four(4), one(1);
    ASSERT_EQ(0, qx::FFTRealForward(two.get(), x, y, 1, 1, 2));
    EXPECT_EQ(y[0], 3);
    EXPECT_EQ(y[1], -1);
    ASSERT_EQ(0, qx::FFTRealForward(four.get(), x, y, 1, 1, 4));
    EXPECT_EQ(std::vector<double>(y, y + 4), (std::vector<double>{15, -3, -5, 6}));
    ASSERT_EQ(0, qx::FFTComplexInverse(one.get(), x, x + 1, y, y + 1, 2, 2, 1));
    EXPECT_EQ(y[0], 1);
    EXPECT_EQ(y[1], 2);
}

TEST(Transform, RefusesAnotherLength) {
    const PlanReference plan(8);
    std::vector<double> x = Noise(32), y(32);
    EXPECT_EQ(-1, qx::FFTComplexForward(plan.get(), &x[0], &x[1], &y[0], &y[1], 2, 2, 9));
    EXPECT_EQ(-1, qx::FFTComplexInverse(plan.get(), &x[0], &x[1], &y[0], &y[1], 2, 2, 9));
    EXPECT_EQ(ErrInternal, qx::FFTRealForward(plan.get(), &x[0], &y[0], 1, 1, 9));
    EXPECT_EQ(ErrInternal, qx::FFTRealInverse(plan.get(), &x[0], &y[0], 1, 1, 9));
    EXPECT_EQ(x, Noise(32));
    EXPECT_EQ(y, std::vector<double>(32));
}

// The inverse uses its input as work memory and leaves it scaled, in Hartley form.
TEST(Transform, RealInverseLeavesTheHartleyForm) {
    const PlanReference plan(5);
    std::vector<double> h = {5, 10, 15, 20, 30}, out(5);
    ASSERT_EQ(0, qx::FFTRealInverse(plan.get(), h.data(), out.data(), 1, 1, 5));
    const double expected[] = {1, 2 - 6, 3 - 4, 4 + 3, 6 + 2};
    for (int32_t i = 0; i < 5; ++i)
        EXPECT_NEAR(h[i], expected[i], 1e-15);
}

// Enough for the transforms to overlap while one of them has the plan's buffer. A sanitizer needs
// fewer.
#if defined(__SANITIZE_THREAD__) || defined(__SANITIZE_ADDRESS__)
constexpr int32_t loanRounds = 50;
#else
constexpr int32_t loanRounds = 200;
#endif

TEST(Transform, ThreadsShareAPlan) {
    for (const int32_t n : {1000, 107, 46, 8192, 16384}) {
        const int32_t rounds = n >= 8192 ? loanRounds : 50;
        const PlanReference plan(n);
        const std::vector<double> x = Noise(2 * n);
        std::vector<double> expected(2 * n);
        qx::FFTComplexForward(plan.get(), &x[0], &x[1], &expected[0], &expected[1], 2, 2, n);
        int32_t equal[4] = {};
        std::vector<std::thread> threads;
        for (int32_t &mine : equal) {
            threads.emplace_back([&x, &expected, &mine, n, rounds] {
                for (int32_t i = 0; i < rounds; ++i) {
                    const PlanReference own(n);
                    const PlanReference passing(n + 1 + i % 3);
                    std::vector<double> y(2 * n);
                    qx::FFTComplexForward(own.get(), &x[0], &x[1], &y[0], &y[1], 2, 2, n);
                    mine += y == expected;
                }
            });
        }
        for (std::thread &thread : threads)
            thread.join();
        for (const int32_t mine : equal)
            EXPECT_EQ(mine, rounds);
        EXPECT_EQ(plan.get()->refCount, 1);
    }
}

// Kernels and plain sums need no scratch memory. Rader's algorithm reports missing memory, in
// leaves and in stages, and does not change the output. Memory provided by the caller is used as
// well.
TEST(Transform, PrimesReportMissingScratchMemory) {
    ASSERT_EQ(0, qx::analysisWorkspace.reserve(64));
    ASSERT_EQ(0, qx::analysisWorkspace.setEnabled(true));
    for (const int32_t n : {23, 47, 53, 107, 167, 46, 106, 334, 2809, 23 * 32, 1000, 41 * 43}) {
        const bool isLight = n % 23 == 0 || n % 47 == 0 || n == 1000 || n == 41 * 43;
        const ErrorCode expected = isLight ? 0 : ErrOutOfMemory;
        SCOPED_TRACE(n);
        qx::analysisWorkspace.setEnabled(false);
        const PlanReference plan(n);
        qx::analysisWorkspace.setEnabled(true);
        std::vector<double> x = Noise(2 * n), y(2 * n);
        EXPECT_EQ(expected, qx::FFTComplexForward(plan.get(), &x[0], &x[1], &y[0], &y[1], 2, 2, n));
        EXPECT_EQ(expected, qx::FFTComplexForward(plan.get(), &x[0], &x[n], &y[0], &y[n], 1, 1, n));
        EXPECT_EQ(expected, qx::FFTRealForward(plan.get(), &x[0], &y[0], 1, 1, n));
        EXPECT_EQ(expected, qx::FFTRealForward(plan.get(), &x[0], &y[0], 1, 2, n));
        EXPECT_EQ(expected, qx::FFTRealInverse(plan.get(), &x[0], &y[0], 1, 1, n));
        EXPECT_EQ(0, qx::analysisWorkspace.liveBlocks());

        std::vector<double> given(static_cast<std::size_t>(plan.get()->complexWork)),
            expectedY(2 * n);
        EXPECT_EQ(isLight, given.empty());
        EXPECT_EQ(0, qx::FFTComplexForward(plan.get(), &x[0], &x[1], &y[0], &y[1], 2, 2, n,
                                           given.data()));
        qx::analysisWorkspace.setEnabled(false);
        EXPECT_EQ(0, qx::FFTComplexForward(plan.get(), &x[0], &x[1], &expectedY[0], &expectedY[1],
                                           2, 2, n));
        qx::analysisWorkspace.setEnabled(true);
        EXPECT_EQ(y, expectedY);
    }
    qx::analysisWorkspace.setEnabled(false);
    ASSERT_EQ(0, qx::analysisWorkspace.giveBack());
}

// Transforms write no more work memory than the plan states: guards after it are unchanged.
TEST(Transform, WorkMemoryHasTheSizeThatThePlanStates) {
    for (const int32_t n : {53, 107, 167, 719, 106, 334, 2809, 53 * 59 * 3, 53 * 32, 10007}) {
        SCOPED_TRACE(n);
        const PlanReference plan(n);
        const std::size_t complexWork = static_cast<std::size_t>(plan.get()->complexWork);
        const std::size_t realWork = static_cast<std::size_t>(plan.get()->realWork);
        std::vector<double> x = Noise(2 * n), y(2 * n);
        const double guard = 1234.5;
        std::vector<double> work(std::max(complexWork, realWork) + 1, guard);
        qx::FFTComplexForward(plan.get(), &x[0], &x[1], &y[0], &y[1], 2, 2, n, work.data());
        EXPECT_EQ(work[complexWork], guard);
        EXPECT_NE(work[complexWork - 8], guard)
            << "at most a cache line of the requested memory is unused";
        work.assign(work.size(), guard);
        qx::FFTRealForward(plan.get(), &x[0], &y[0], 1, 1, n, work.data());
        EXPECT_EQ(work[realWork], guard);
    }
}

} // namespace
} // namespace qx::test
