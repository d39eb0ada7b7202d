#include "fft/plan_slot.h"
#include "qx/dzt.h"
#include "qx/errors.h"
#include "qx/frame.h"
#include "tests/support/hostile_host.h"
#include "tests/support/transform_reference.h"
#include "transforms/dzt.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <utility>
#include <vector>

namespace qx::test {
namespace {

constexpr double Rounding = 5e-15;

struct Band {
    int32_t sections, subLength, start, size;
};

// The definition, applied to x cropped or padded to the length of the long transform.
template <class Values>
LongSpectrum Expected(const Values &x, const Band &band) {
    const int64_t length = int64_t{band.sections} * band.subLength;
    LongSpectrum out(band.size);
    for (int32_t i = 0; i < band.size; ++i)
        for (int64_t u = 0; u < length && u < int64_t(x.size()); ++u)
            out[i] += ToLong(x[u]) * Turn(-(u * (int64_t{band.start} + i) % length), length);
    return out;
}

template <class Array, class Plain, class Twin>
std::vector<CDB> RunTwins(Plain plain, Twin twin, const Array &a, const Band &band) {
    const Array b(a.values());
    CDBArray out, other;
    Node node;
    EXPECT_EQ(plain(a.handle(), band.sections, band.subLength, band.start, band.size, out.handle(),
                    &node.slot),
              0);
    EXPECT_EQ(twin(b.handle(), band.sections, band.subLength, band.start, band.size, other.handle(),
                   &node.instance),
              0);
    EXPECT_TRUE(SameBits(out.values(), other.values()));
    EXPECT_TRUE(SameBits(a.values(), b.values()));
    return out.values();
}

TEST(BandTransform, GivesBinsOfTheLongTransform) {
    const Band bands[] = {{1, 8, 3, 5},  {4, 8, 0, 32}, {4, 8, 5, 11},   {3, 7, -2, 30},
                          {5, 1, -9, 4}, {2, 53, 7, 9}, {6, 5, 1000, 3}, {7, 2, -1000, 16}};
    for (const Band &band : bands)
        for (int32_t missing : {0, 1, 9}) {
            SCOPED_TRACE(testing::Message() << band.sections << "x" << band.subLength << " from "
                                            << band.start << " less " << missing);
            const int32_t n = std::max(1, band.sections * band.subLength - missing);
            const Signal x = RandomSignal(n);
            const std::vector<CDB> z = RandomComplex(n);
            EXPECT_LT(MaxError(RunTwins(ReDZTH, ReDZTH_IDP, DBLArray(x), band), Expected(x, band)),
                      Rounding);
            EXPECT_LT(MaxError(RunTwins(CxDZTH, CxDZTH_IDP, CDBArray(z), band), Expected(z, band)),
                      Rounding);
        }
}

// Inputs longer than the transform are folded in place by a loop that begins at index N.
TEST(BandTransform, FoldsLongInputsFromTheSubLengthOn) {
    const Band band{2, 3, 0, 6};
    const DBLArray x{1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14};
    Node node;
    CDBArray out;
    ASSERT_EQ(ReDZTH(x.handle(), 2, 3, 0, 6, out.handle(), &node.slot), 0);
    // One full wrap adds 4, 5, 6, 7, 8, 9; the first three lie in the range that the fold
    // overwrites and are read before they change. Two elements remain: 10 and 11.
    const Signal folded{1 + 4 + 10, 2 + 5 + 11, 3 + 6, 4 + 7, 5 + 8, 6 + 9};
    const Signal values = x.values();
    EXPECT_EQ(Signal(values.begin(), values.begin() + 6), folded);
    EXPECT_EQ(Signal(values.begin() + 6, values.end()), (Signal{7, 8, 9, 10, 11, 12, 13, 14}));
    EXPECT_LT(MaxError(out.values(), Expected(folded, band)), Rounding);

    // With one section the loop is a plain wrap.
    const Signal longer = RandomSignal(11);
    Signal wrapped(4);
    for (int32_t j = 0; j < 11; ++j)
        wrapped[j % 4] += longer[j];
    const Band single{1, 4, -1, 4};
    EXPECT_LT(
        MaxError(RunTwins(ReDZTH, ReDZTH_IDP, DBLArray(longer), single), Expected(wrapped, single)),
        Rounding);

    const CDBArray complex(RandomComplex(14));
    const std::vector<CDB> before = complex.values();
    ASSERT_EQ(CxDZTH(complex.handle(), 2, 3, 0, 6, out.handle(), &node.slot), 0);
    EXPECT_EQ(complex[1].im, before[1].im + before[4].im + before[10].im);
}

// With one value per sub-sequence, all but one of them zero, the result is the rotation itself. It
// advances by multiplication, whose errors accumulate: 3e-12 in 4000 steps.
TEST(BandTransform, TurnsFromTheFirstOutputOn) {
    constexpr int32_t sections = 11, start = -25, size = 4000;
    for (int32_t j = 0; j < sections; ++j) {
        DBLArray x(Signal(sections, 0.0));
        x.data()[j] = 1.0;
        CDBArray out;
        Node node;
        ASSERT_EQ(ReDZTH(x.handle(), sections, 1, start, size, out.handle(), &node.slot), 0);
        const Long step = -8 * std::atan(Long(1)) * j / sections;
        Long worst = 0;
        for (int32_t i = 0; i < size; ++i)
            worst = std::max({worst, std::fabs(out[i].re - std::cos(step * (start + i))),
                              std::fabs(out[i].im - std::sin(step * (start + i)))});
        EXPECT_LT(worst, 1.2e-11) << j;
    }
}

TEST(BandTransform, TheInnerRoutineChecksItsPlan) {
    FFTPlan *const plan = qx::create_oxfft_table(4);
    Signal x = RandomSignal(8);
    std::vector<CDB> out(2);
    const auto run = [&](const FFTPlan *with, int32_t n, int32_t sections, int32_t subLength) {
        return qx::BandTransform<qx::ElementType::DBL>(with, {x.data(), n}, sections, subLength, 0,
                                                       {out.data(), 2});
    };
    EXPECT_EQ(run(nullptr, 0, 0, 0), ErrEmptyInput);
    EXPECT_EQ(run(nullptr, 8, 0, 4), ErrFFTSizeNotPositive);
    EXPECT_EQ(run(nullptr, 8, 2, 0), ErrFFTSizeNotPositive);
    EXPECT_EQ(run(nullptr, 8, 2, 4), ErrInternal);
    EXPECT_EQ(run(plan, 8, 2, 3), ErrInternal);
    EXPECT_EQ(x, RandomSignal(8)) << "before the input is folded";
    EXPECT_EQ(run(plan, 8, 2, 4), 0);
    qx::destroy_oxfft_table(plan);
}

TEST(BandTransform, ChecksComeInOrderAndEmptyInputIsNoFailure) {
    const DBLArray none, x(RandomSignal(4));
    Node node;
    const auto run = [&](const DBLArray &in, const Band &band) {
        CDBArray out(2);
        const ErrorCode status = ReDZTH(in.handle(), band.sections, band.subLength, band.start,
                                        band.size, out.handle(), &node.slot);
        EXPECT_EQ(out.size(), 0);
        return status;
    };
    EXPECT_EQ(run(none, {0, 0, 0, 0}), ErrOrderNotPositive);
    EXPECT_EQ(run(none, {1, 0, 0, 1}), ErrFFTSizeNotPositive);
    EXPECT_EQ(run(none, {1, 1, 0, 0}), ErrFFTSizeNotPositive);
    EXPECT_EQ(run(none, {1, 1, 0, 1}), 0);
    EXPECT_EQ(node.slot, nullptr);
    const int32_t most = std::numeric_limits<int32_t>::max();
    EXPECT_EQ(run(x, {most, 2, 0, 1}), ErrLengthTooLarge);
    EXPECT_EQ(run(x, {1 << 30, 4, most, 1}), ErrLengthTooLarge) << "2^32, which wraps to 0";

    CDBArray out(2);
    const int32_t least = std::numeric_limits<int32_t>::min();
    EXPECT_EQ(ReDZTH(x.handle(), 2, 2, least, 3, out.handle(), &node.slot), 0);
    EXPECT_EQ(ReDZTH(x.handle(), 2, 2, most, 3, out.handle(), &node.slot), 0);
    EXPECT_EQ(out.size(), 3);
}

TEST(BandTransform, ARefusalReturnsTheHostsStatus) {
    const DBLArray x(RandomSignal(4));
    for (int32_t hostStatus : {77, -4242}) {
        CDBArray out(2);
        Node node;
        ResetHost(1, hostStatus);
        EXPECT_EQ(ReDZTH(x.handle(), 2, 2, 0, 3, out.handle(), &node.slot), hostStatus);
        ResetHost();
        EXPECT_NE(node.slot, nullptr);
        EXPECT_EQ(out.size(), hostStatus < 0 ? 0 : 2) << "only a negative status empties";
    }
}

// Two billion sections of which four have a value; the time depends on the data only.
TEST(BandTransform, SectionsBeyondTheDataCostNothing) {
    const std::vector<double> values{1.5, -2, 0.25, 3};
    const DBLArray x(values);
    for (const auto &[sections, subLength] : {std::pair{2147483647, 1}, {1 << 28, 7}}) {
        CDBArray out;
        Node node;
        ASSERT_EQ(ReDZTH(x.handle(), sections, subLength, 1 << 27, 3, out.handle(), &node.slot), 0);
        ASSERT_EQ(out.size(), 3);
        const long double L = static_cast<long double>(sections) * subLength;
        for (int32_t i = 0; i < 3; ++i) {
            long double re = 0, im = 0;
            for (int32_t u = 0; u < 4; ++u) {
                const long double angle = -8 * std::atan(1.0L) * u * ((1 << 27) + i) / L;
                re += values[static_cast<std::size_t>(u)] * std::cos(angle);
                im += values[static_cast<std::size_t>(u)] * std::sin(angle);
            }
            EXPECT_NEAR(out.data()[i].re, static_cast<double>(re), 1.4e-15);
            EXPECT_NEAR(out.data()[i].im, static_cast<double>(im), 1.8e-15);
        }
    }
}

// A workspace with room for the sub-sequences but not for their transforms causes a failure, not a
// sum that omits them.
TEST(BandTransform, MissingMemoryOfATransformIsReported) {
    WorkspaceStatus status = {};
    ASSERT_EQ(0, InitializeAnalysisWorkspaceH(2048, &status));
    const DBLArray x(std::vector<double>(150, 1.0));
    CDBArray out;
    Node node;
    ASSERT_EQ(qx::PlanSlotAcquire(&node.slot, 53), 0);
    EnableAnalysisWorkspaceH(&status);
    EXPECT_EQ(ReDZTH(x.handle(), 3, 53, 0, 5, out.handle(), &node.slot), ErrOutOfMemory);
    DisableAnalysisWorkspaceH(&status);
    EXPECT_EQ(out.size(), 0);
    EXPECT_EQ(ReDZTH(x.handle(), 3, 53, 0, 5, out.handle(), &node.slot), 0);
    ASSERT_EQ(0, UninitializeAnalysisWorkspaceH(&status));
}

} // namespace
} // namespace qx::test
