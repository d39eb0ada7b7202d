#include "fft/plan_slot.h"
#include "qx/errors.h"
#include "qx/hartley_hilbert.h"
#include "tests/support/hostile_host.h"
#include "tests/support/transform_reference.h"

#include "tests/support/heap_probe.h"

#include <gtest/gtest.h>

#include <cmath>

namespace qx::test {
namespace {

constexpr double Rounding = 4e-15;

typedef ErrorCode (*InSlot)(DBL1D, PlanSlot *);
typedef ErrorCode (*InInstance)(DBL1D, InstanceWord *);

// The result of an export, which must agree with that of its twin to the bit.
Signal RunTwins(InSlot plain, InInstance twin, const Signal &x) {
    const DBLArray a(x), b(x);
    Node node;
    EXPECT_EQ(plain(a.handle(), &node.slot), 0);
    EXPECT_EQ(twin(b.handle(), &node.instance), 0);
    EXPECT_TRUE(SameBits(a.values(), b.values()));
    return a.values();
}

Signal Hartley(const Signal &x) { return RunTwins(FHTH, FHTH_IDP, x); }
Signal InverseHartley(const Signal &x) { return RunTwins(InvFHTH, InvFHTH_IDP, x); }
Signal Hilbert(const Signal &x) {
    return RunTwins(FastHilbertTransformH, FastHilbertTransformH_IDP, x);
}
Signal InverseHilbert(const Signal &x) {
    return RunTwins(InvFastHilbertTransformH, InvFastHilbertTransformH_IDP, x);
}

const int32_t Lengths[] = {1, 2, 3, 4, 7, 8, 15, 23, 53, 60};

TEST(Hartley, IsTheSumOfCosineAndSineTransform) {
    for (int32_t n : Lengths) {
        SCOPED_TRACE(n);
        const Signal x = RandomSignal(n);
        LongSpectrum sums(n);
        for (int32_t k = 0; k < n; ++k)
            for (int32_t j = 0; j < n; ++j) {
                const LongComplex turn = Turn(int64_t{j} * k, n);
                sums[k] += Long(x[j]) * (turn.real() + turn.imag());
            }
        EXPECT_LT(MaxError(Hartley(x), sums), Rounding);
        EXPECT_LT(MaxError(InverseHartley(Hartley(x)), ToLong(x)), Rounding);
        Signal scaled = Hartley(x);
        for (double &value : scaled)
            value *= 1.0 / n;
        EXPECT_TRUE(SameBits(InverseHartley(x), n > 1 ? scaled : x)) << "multiplied, not divided";
    }
}

TEST(Hilbert, TurnsCosinesIntoSines) {
    for (int32_t n : {5, 8, 60}) {
        Signal cosine;
        LongSpectrum sine;
        for (int32_t j = 0; j < n; ++j) {
            const LongComplex turn = Turn(2 * j, n) * Turn(1, 7);
            cosine.push_back(static_cast<double>(turn.real()));
            sine.push_back(turn.imag());
        }
        EXPECT_LT(MaxError(Hilbert(cosine), sine), Rounding) << n;
    }
}

TEST(Hilbert, DropsTheZeroAndTheNyquistFrequency) {
    EXPECT_EQ(Hilbert({3.0}), (Signal{0.0}));
    EXPECT_EQ(Hilbert({3.0, 5.0}), (Signal{0.0, 0.0}));
    for (double value : Hilbert({2.0, 2.0, 2.0, 2.0, 2.0, 2.0}))
        EXPECT_NEAR(value, 0, Rounding);
    for (int32_t n : Lengths) {
        SCOPED_TRACE(n);
        const Signal x = RandomSignal(n);
        LongSpectrum spectrum = Dft(ToLong(x));
        spectrum[0] = 0;
        if (n % 2 == 0)
            spectrum[n / 2] = 0;
        LongSpectrum kept = Dft(spectrum, 1);
        for (LongComplex &value : kept)
            value /= Long(n);
        const Signal back = InverseHilbert(Hilbert(x));
        EXPECT_LT(n > 2 ? MaxError(back, kept) : std::fabs(back[0]), Rounding);
    }
}

TEST(HartleyHilbert, AnEmptyArrayIsEmptiedWithItsCode) {
    for (InSlot run : {FHTH, InvFHTH, FastHilbertTransformH, InvFastHilbertTransformH}) {
        const DBLArray none;
        Node node;
        ResetHost();
        EXPECT_EQ(run(none.handle(), &node.slot), ErrEmptyInput);
        EXPECT_EQ(Host().reshapes, (std::vector<Reshape>{{10, 1, 0}}));
        EXPECT_EQ(node.slot, nullptr);
    }
}

TEST(HartleyHilbert, ThePlanStaysInTheNode) {
    const DBLArray x(RandomSignal(6));
    Node node;
    ASSERT_EQ(FHTH(x.handle(), &node.slot), 0);
    ASSERT_EQ(InvFHTH(x.handle(), &node.slot), 0);
    const auto *const cell = static_cast<const qx::PlanCell *>(node.slot);
    EXPECT_EQ(cell->plan->length, 6);
    EXPECT_EQ(cell->plan->refCount, 1) << "the routines released their own references";
}

// Every other failure empties the array.
TEST(HartleyHilbert, TheInverseLeavesTheArrayIfNoPlanCanBeMade) {
    if (!HeapProbe::works())
        GTEST_SKIP();
    const Signal values = RandomSignal(6);
    for (const bool isTwin : {false, true}) {
        const DBLArray x(values);
        Node node;
        ErrorCode status = 0;
        {
            const HeapProbe probe(1);
            status =
                isTwin ? InvFHTH_IDP(x.handle(), &node.instance) : InvFHTH(x.handle(), &node.slot);
        }
        EXPECT_EQ(status, ErrOutOfMemory);
        EXPECT_TRUE(SameBits(x.values(), values));
    }
}

} // namespace
} // namespace qx::test
