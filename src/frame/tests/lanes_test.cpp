#include "frame/lane_masks.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <cstring>

namespace qx::test {
namespace {

// Memory at 4 modulo 16, where the host's elements begin.
struct Offset {
    static constexpr int elements = 64;
    alignas(16) unsigned char bytes[4 + 8 * elements];
    DBL *data() { return reinterpret_cast<DBL *>(bytes + 4); }
    Offset() {
        for (int i = 0; i < elements; ++i)
            data()[i] = 1.0 / (i + 1);
    }
};

template <class L>
class LanesTest : public testing::Test {};
typedef testing::Types<Lanes<1>, Lanes<2>, Lanes<4>, Lanes<8>> LaneCounts;
TYPED_TEST_SUITE(LanesTest, LaneCounts);

TYPED_TEST(LanesTest, DoesInEachLaneWhatOneDoubleWouldDo) {
    typedef TypeParam L;
    Offset x, y;
    const L a = L::load(x.data() + 1);
    const L b = L::gather(x.data() + 2, 5);
    ((a + b) * a - b / (-a) + L(0.1)).store(y.data());
    for (int i = 0; i < L::count; ++i) {
        const double p = x.data()[1 + i];
        const double q = x.data()[2 + 5 * i];
        const double sum = p + q;
        const double product = sum * p;
        const double quotient = q / -p;
        const double difference = product - quotient;
        const double got = y.data()[i];
        EXPECT_EQ(got, difference + 0.1);
        EXPECT_EQ(b[i], q);
    }
    const L zero = L(-0.0);
    EXPECT_TRUE(std::signbit(zero[L::count - 1]));
}

TYPED_TEST(LanesTest, SelectsAndComparesEachLane) {
    typedef TypeParam L;
    const double nan = std::nan(""), values[] = {-1.0, -0.0, 0.0, 2.0, nan};
    const auto same = [](double a, double b) { return std::memcmp(&a, &b, sizeof a) == 0; };
    for (const double p : values)
        for (const double q : values) {
            L a(p), b(q);
            const double larger = p > q ? p : q, smaller = p < q ? p : q;
            for (int i = 0; i < L::count; ++i) {
                EXPECT_TRUE(same(Larger(a, b)[i], larger)) << p << " " << q;
                EXPECT_TRUE(same(Smaller(a, b)[i], smaller)) << p << " " << q;
                EXPECT_EQ(Select(a == b, L(3.0), L(4.0))[i], p == q ? 3.0 : 4.0);
                EXPECT_EQ(Select(!(a <= b), L(3.0), L(4.0))[i], p <= q ? 4.0 : 3.0);
                EXPECT_EQ(Select((a < b) | (a >= b), L(3.0), L(4.0))[i], p < q || p >= q ? 3 : 4);
            }
        }
    const L number = L(-1.5);
    EXPECT_EQ(qx::OfBits<L>(ToBits(number))[L::count - 1], -1.5);
    EXPECT_EQ(Magnitude(number)[0], 1.5);
}

TYPED_TEST(LanesTest, MovesElementsAndNothingElse) {
    typedef TypeParam L;
    Offset x, y;
    const L a = L::load(x.data());
    a.reversed().scatter(y.data() + 3, 7);
    Offset expected;
    for (int i = 0; i < L::count; ++i)
        expected.data()[3 + 7 * i] = x.data()[L::count - 1 - i];
    EXPECT_EQ(0, std::memcmp(y.bytes + 4, expected.bytes + 4, 8 * Offset::elements));
}

template <class L>
class LanePairsTest : public testing::Test {};
typedef testing::Types<Lanes<2>, Lanes<4>, Lanes<8>> PairedLanes;
TYPED_TEST_SUITE(LanePairsTest, PairedLanes);

TYPED_TEST(LanePairsTest, TakeThePairsThatTheirNamesSay) {
    typedef TypeParam L;
    constexpr int n = L::count;
    Offset x, y;
    const L a = L::load(x.data()), b = L::load(x.data() + n);
    const Lanes<2> first = Lanes<2>::load(x.data());
    for (int i = 0; i < n; ++i) {
        const int even = i / 2 * 2, odd = even + 1;
        const double sign = i % 2 == 0 ? -1 : 1;
        EXPECT_EQ(FirstsTwice(a)[i], a[even]);
        EXPECT_EQ(SecondsTwice(a)[i], a[odd]);
        EXPECT_EQ(Swapped(a)[i], a[i ^ 1]);
        EXPECT_EQ(ReversedPairs(a)[i], a[n - 2 - even + i % 2]);
        EXPECT_EQ(qx::InEveryPair<n>(first)[i], a[i % 2]);
        EXPECT_EQ(FirstPair(a)[i % 2], a[i % 2]);
        EXPECT_EQ(NegatedInPairs(a, true)[i], sign * a[i]);
        EXPECT_EQ(NegatedInPairs(a, false)[i], -sign * a[i]);
        EXPECT_EQ(MinusPlus(a, b)[i], a[i] + sign * b[i]);
        EXPECT_EQ(PairsLow(a, b)[i], (i % 2 == 0 ? a : b)[even]);
        EXPECT_EQ(PairsHigh(a, b)[i], (i % 2 == 0 ? a : b)[odd]);
    }
    const DBL *const from[] = {x.data(),      x.data() + 9,  x.data() + 4,  x.data() + 17,
                               x.data() + 22, x.data() + 31, x.data() + 30, x.data() + 8};
    DBL *const to[] = {y.data() + 1, y.data() + 20, y.data() + 9, y.data() + 13};
    const L pairs = qx::LoadPairs<n>(from, 2), each = qx::LoadEach<n>(from, 3);
    StorePairs(pairs, to, 5);
    for (int i = 0; i < n; ++i) {
        EXPECT_EQ(pairs[i], double{from[i / 2][2 + i % 2]});
        EXPECT_EQ(double{to[i / 2][5 + i % 2]}, pairs[i]);
        EXPECT_EQ(each[i], double{from[i][3]});
    }
}

TYPED_TEST(LanePairsTest, ReadAndMoveIntegers) {
    constexpr int n = TypeParam::count;
    int32_t numbers[20] = {}, moved[20] = {};
    for (int i = 0; i < 20; ++i)
        numbers[i] = i * 107374182 - INT32_MAX / 2;
    qx::StoreEightIncreased(numbers + 1, -3, moved + 5);
    for (int i = 0; i < 20; ++i)
        EXPECT_EQ(moved[i], i < 5 || i >= 13 ? 0 : numbers[i - 4] - 3);
    for (int i = 0; i < n; ++i)
        EXPECT_EQ(qx::OfIntegers<n>(numbers + 1)[i], numbers[1 + i]);
}

TYPED_TEST(LanePairsTest, CompareEachLaneAndNumberTheBitsFromLaneZero) {
    typedef TypeParam L;
    for (unsigned pattern = 0; pattern < 1U << L::count; ++pattern) {
        L x(1.0);
        for (int i = 0; i < L::count; ++i)
            x.v[i] = (pattern >> i & 1) != 0 ? 2.0 : 1.0;
        EXPECT_EQ(MaskBits(x > L(1.0)), pattern);
        EXPECT_EQ(MaskBits(x >= L(2.0)), pattern);
        EXPECT_EQ(MaskBits(L(1.0) < x), pattern);
        EXPECT_EQ(Any(x > L(1.0)), pattern != 0);
        x.v[0] = std::nan("");
        EXPECT_EQ(MaskBits((x > L(1.0)) | (x <= L(1.0))) & 1, 0U);
    }
}

template <class L>
class FloatLanesTest : public testing::Test {};
typedef testing::Types<qx::FloatLanes<1>, qx::FloatLanes<4>, qx::FloatLanes<8>, qx::FloatLanes<16>>
    FloatCounts;
TYPED_TEST_SUITE(FloatLanesTest, FloatCounts);

TYPED_TEST(FloatLanesTest, DoInEachLaneWhatOneFloatWouldDo) {
    typedef TypeParam L;
    alignas(16) unsigned char bytes[4 + 4 * 48];
    SGL *const x = reinterpret_cast<SGL *>(bytes + 4);
    for (int i = 0; i < 48; ++i)
        x[i] = 1.0F / static_cast<float>(i + 1);
    (L::load(x) * L::load(x + 16) + L(0.1F)).store(x + 32);
    for (int i = 0; i < L::count; ++i) {
        const float product = x[i] * x[16 + i], expected = product + 0.1F, got = x[32 + i];
        EXPECT_EQ(got, expected);
    }
}

TYPED_TEST(LanePairsTest, TransposeBlocksAndReachPartsOfVectors) {
    typedef TypeParam L;
    constexpr int n = L::count;
    Offset x;
    L block[n];
    for (int i = 0; i < n; ++i)
        block[i] = L::load(x.data() + n * i);
    Transpose(block);
    for (int i = 0; i < n; ++i)
        for (int j = 0; j < n; ++j)
            EXPECT_EQ(block[i][j], double{x.data()[n * j + i]});
    for (int count = 1; count <= n; ++count) {
        Offset y;
        const L part = L::loadFirst(x.data() + 3, count);
        part.storeFirst(y.data() + 30, count);
        const L product = Times(part, x.data() + 1);
        for (int i = 0; i < n; ++i) {
            EXPECT_EQ(part[i], i < count ? double{x.data()[3 + i]} : 0.0);
            EXPECT_EQ(double{y.data()[30 + i]}, i < count ? part[i] : double{x.data()[30 + i]});
            EXPECT_EQ(product[i], part[i] * double{x.data()[1]});
        }
    }
}

#ifdef QX_HAS_AVX2_BUILD
TEST(Widths, AreTheProcessorsUnlessTheEnvironmentForcesASmallerOne) {
    int32_t widest = __builtin_cpu_supports("avx2") ? 4 : 2;
#ifdef QX_HAS_EIGHT_LANES
    if (__builtin_cpu_supports("avx512dq") && __builtin_cpu_supports("avx512vl"))
        widest = 8;
#endif
    const char *const forced = std::getenv("QX_WIDTH");
    const int32_t most = forced != nullptr && std::strlen(forced) == 1 ? forced[0] - '0' : 8;
    EXPECT_EQ(qx::lanesInUse, std::min(widest, most));
    if (widest < 8 && most >= 8)
        GTEST_SKIP() << "no routines of eight lanes here; the other tests ran with " << widest;
}
#endif

} // namespace
} // namespace qx::test
