#include "frame/lanes.h"

#include <gtest/gtest.h>

#include <cmath>
#include <cstdlib>
#include <cstring>

namespace {

using qx::Lanes;

// Memory at 4 modulo 16, where the host's elements stand.
struct Offset {
    alignas(16) unsigned char bytes[4 + 8 * 32];
    DBL *data() { return reinterpret_cast<DBL *>(bytes + 4); }
    Offset() {
        for (int i = 0; i < 32; ++i)
            data()[i] = 1.0 / (i + 1);
    }
};

template <class L>
class LanesTest : public testing::Test {};
typedef testing::Types<Lanes<1>, Lanes<2>, Lanes<4>> LaneCounts;
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

TYPED_TEST(LanesTest, MovesElementsAndNothingElse) {
    typedef TypeParam L;
    Offset x, y;
    const L a = L::load(x.data());
    a.reversed().scatter(y.data() + 3, 7);
    Offset expected;
    for (int i = 0; i < L::count; ++i)
        expected.data()[3 + 7 * i] = x.data()[L::count - 1 - i];
    EXPECT_EQ(0, std::memcmp(y.bytes + 4, expected.bytes + 4, 8 * 32));
}

TEST(Widths, AreTheProcessorsUnlessTheEnvironmentForcesTheBaseline) {
    const char *const forced = std::getenv("QX_WIDTH");
    const bool baseline = forced != nullptr && std::strcmp(forced, "2") == 0;
    EXPECT_EQ(qx::lanesInUse, __builtin_cpu_supports("avx2") && !baseline ? 4 : 2);
}

} // namespace
