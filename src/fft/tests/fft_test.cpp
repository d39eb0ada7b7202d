#include "fft/plan_slot.h"
#include "qx/errors.h"
#include "qx/fft.h"
#include "qx/frame.h"
#include "tests/support/heap_probe.h"
#include "tests/support/hostile_host.h"
#include "tests/support/transform_reference.h"

#include <gtest/gtest.h>

#include <cmath>
#include <functional>
#include <limits>

namespace qx::test {
namespace {

constexpr double Rounding = 2e-15;

// The `size` values from `offset` on, zero-padded, transformed and reordered.
template <class Values>
LongSpectrum Expected(const Values &values, int64_t offset, int32_t size, int32_t shift) {
    LongSpectrum window(size);
    for (int32_t j = 0; j < size; ++j)
        if (offset + j >= 0 && offset + j < static_cast<int32_t>(values.size()))
            window[j] = ToLong(values[offset + j]);
    const LongSpectrum plain = Dft(window);
    LongSpectrum ordered = plain;
    for (int32_t j = 0; j < size && shift != 0; ++j)
        ordered[j] = plain[(j - size / 2 + size) % size];
    return ordered;
}

const PlanCell *CellOf(PlanSlot slot) { return static_cast<const PlanCell *>(slot); }

TEST(OneDimensional, ForwardWindowsPadsAndShifts) {
    const int32_t n = 12;
    const Signal x = RandomSignal(n);
    const std::vector<CDB> z = RandomComplex(n);
    const DBLArray real(x);
    const CDBArray complex(z);
    Node node;
    for (int32_t size : {1, 2, 3, 4, 5, 8, 9, 12, 23, 30, 53})
        for (int32_t offset : {0, 1, 5, 11})
            for (int32_t shift : {0, 1}) {
                SCOPED_TRACE(testing::Message() << size << " from " << offset << " " << shift);
                CDBArray out, twin;
                ASSERT_EQ(ReOXFFTH80(real.handle(), out.handle(), &node.slot, offset, size, shift),
                          0);
                EXPECT_LT(MaxError(out.values(), Expected(x, offset, size, shift)), Rounding);
                ASSERT_EQ(ReOXFFTH80_IDP(real.handle(), twin.handle(), &node.instance, offset, size,
                                         shift),
                          0);
                EXPECT_TRUE(SameBits(out.values(), twin.values()));

                ASSERT_EQ(
                    CxOXFFTH80(complex.handle(), out.handle(), &node.slot, offset, size, shift), 0);
                EXPECT_LT(MaxError(out.values(), Expected(z, offset, size, shift)), Rounding);
                ASSERT_EQ(CxOXFFTH80_IDP(complex.handle(), twin.handle(), &node.instance, offset,
                                         size, shift),
                          0);
                EXPECT_TRUE(SameBits(out.values(), twin.values()));
            }
    EXPECT_TRUE(SameBits(real.values(), x)) << "the input is only read";
    EXPECT_TRUE(SameBits(complex.values(), z));
}

TEST(OneDimensional, AWindowOfComplexDataMayLieAnywhere) {
    const std::vector<CDB> z = RandomComplex(12);
    const CDBArray complex(z);
    Node node;
    for (int32_t offset : {std::numeric_limits<int32_t>::min(), -20, -12, -3, -1, 12, 13,
                           std::numeric_limits<int32_t>::max()})
        for (int32_t size : {3, 12, 23}) {
            SCOPED_TRACE(testing::Message() << size << " from " << offset);
            CDBArray out;
            ASSERT_EQ(CxOXFFTH80(complex.handle(), out.handle(), &node.slot, offset, size, 0), 0);
            EXPECT_LT(MaxError(out.values(), Expected(z, offset, size, 0)), Rounding);
        }
}

TEST(OneDimensional, InversesReturnTheInput) {
    for (int32_t n : {1, 2, 3, 4, 5, 8, 9, 23, 30, 53})
        for (int32_t shift : {0, 1}) {
            SCOPED_TRACE(testing::Message() << n << " " << shift);
            const Signal x = RandomSignal(n);
            const std::vector<CDB> z = RandomComplex(n);
            const DBLArray real(x);
            const CDBArray complex(z);
            CDBArray spectrum, complexBack, complexTwin;
            DBLArray realBack, realTwin;
            Node node;
            ASSERT_EQ(ReOXFFTH80(real.handle(), spectrum.handle(), &node.slot, 0, n, shift), 0);
            ASSERT_EQ(InvReOXFFTH80(spectrum.handle(), realBack.handle(), &node.slot, shift), 0);
            EXPECT_LT(MaxError(realBack.values(), ToLong(x)), Rounding);
            ASSERT_EQ(
                InvReOXFFTH80_IDP(spectrum.handle(), realTwin.handle(), &node.instance, shift), 0);
            EXPECT_TRUE(SameBits(realBack.values(), realTwin.values()));

            ASSERT_EQ(CxOXFFTH80(complex.handle(), spectrum.handle(), &node.slot, 0, n, shift), 0);
            ASSERT_EQ(InvCxOXFFTH80(spectrum.handle(), complexBack.handle(), &node.slot, shift), 0);
            EXPECT_LT(MaxError(complexBack.values(), ToLong(z)), Rounding);
            ASSERT_EQ(
                InvCxOXFFTH80_IDP(spectrum.handle(), complexTwin.handle(), &node.instance, shift),
                0);
            EXPECT_TRUE(SameBits(complexBack.values(), complexTwin.values()));
        }
}

TEST(OneDimensional, EldersForwardWithoutWindowAndShift) {
    const DBLArray real(RandomSignal(10));
    const CDBArray complex(RandomComplex(10));
    CDBArray elder, revised;
    DBLArray elderReal, revisedReal;
    Node node;
    ReOXFFTH(real.handle(), elder.handle(), &node.slot);
    ReOXFFTH80(real.handle(), revised.handle(), &node.slot, 0, 10, 0);
    EXPECT_TRUE(SameBits(elder.values(), revised.values()));
    CxOXFFTH(complex.handle(), elder.handle(), &node.slot);
    CxOXFFTH80(complex.handle(), revised.handle(), &node.slot, 0, 10, 0);
    EXPECT_TRUE(SameBits(elder.values(), revised.values()));
    InvCxOXFFTH(complex.handle(), elder.handle(), &node.slot);
    InvCxOXFFTH80(complex.handle(), revised.handle(), &node.slot, 0);
    EXPECT_TRUE(SameBits(elder.values(), revised.values()));
    InvReOXFFTH(complex.handle(), elderReal.handle(), &node.slot);
    InvReOXFFTH80(complex.handle(), revisedReal.handle(), &node.slot, 0);
    EXPECT_TRUE(SameBits(elderReal.values(), revisedReal.values()));
}

TEST(OneDimensional, TheRealInverseReadsNonNegativeFrequenciesOnly) {
    const double nan = std::numeric_limits<double>::quiet_NaN();
    for (int32_t n : {1, 2, 7, 8})
        for (int32_t shift : {0, 1}) {
            const Signal x = RandomSignal(n);
            const DBLArray real(x);
            CDBArray spectrum;
            DBLArray back;
            Node node;
            ASSERT_EQ(ReOXFFTH80(real.handle(), spectrum.handle(), &node.slot, 0, n, shift), 0);
            const auto element = [&](int32_t f) -> CDB & {
                return spectrum.data()[(f + (shift != 0 ? n / 2 : 0)) % n];
            };
            element(0).im = nan;
            for (int32_t f = n / 2 + 1; f < n; ++f)
                element(f) = {nan, nan};
            if (n % 2 == 0)
                element(n / 2).im = nan;
            ASSERT_EQ(InvReOXFFTH80(spectrum.handle(), back.handle(), &node.slot, shift), 0);
            EXPECT_LT(MaxError(back.values(), ToLong(x)), Rounding) << n << " " << shift;
        }
}

TEST(OneDimensional, HalfComplexFormAndItsInverse) {
    for (int32_t n : {1, 2, 5, 12, 23, 53}) {
        const Signal x = RandomSignal(n);
        const LongSpectrum spectrum = Dft(ToLong(x));
        LongSpectrum half(n), hartley(n);
        for (int32_t k = 0; k < n; ++k) {
            half[k] = k <= n / 2 ? spectrum[k].real() : spectrum[n - k].imag();
            // With the opposite sign of the forward transform: cos + sin of the spectrum.
            hartley[k] = (spectrum[k].real() - spectrum[k].imag()) / static_cast<Long>(n);
        }
        const DBLArray real(x);
        DBLArray out, twin, back, backTwin;
        Node node;
        ASSERT_EQ(ReOXFFTHCH(real.handle(), out.handle(), &node.slot), 0);
        EXPECT_LT(MaxError(out.values(), half), Rounding);
        ASSERT_EQ(ReOXFFTHCH_IDP(real.handle(), twin.handle(), &node.instance), 0);
        EXPECT_TRUE(SameBits(out.values(), twin.values()));

        ASSERT_EQ(InvReOXFFTHCH(out.handle(), back.handle(), &node.slot), 0);
        EXPECT_LT(MaxError(back.values(), ToLong(x)), Rounding);
        EXPECT_LT(MaxError(out.values(), hartley), Rounding)
            << "the input is overwritten with this form";
        ASSERT_EQ(InvReOXFFTHCH_IDP(twin.handle(), backTwin.handle(), &node.instance), 0);
        EXPECT_TRUE(SameBits(back.values(), backTwin.values()));
        EXPECT_TRUE(SameBits(out.values(), twin.values()));
    }
}

TEST(OneDimensional, ChecksComeInOrderAndEmptyTheOutput) {
    const DBLArray none, three(RandomSignal(3));
    const CDBArray noneComplex, threeComplex(RandomComplex(3));
    Node node;
    const auto expect = [](ErrorCode expected, ErrorCode status, const CDBArray &out) {
        EXPECT_EQ(status, expected);
        EXPECT_EQ(out.size(), 0);
    };
    const auto real = [&](const DBLArray &in, int32_t offset, int32_t size, ErrorCode code) {
        CDBArray out(2), twin(2);
        expect(code, ReOXFFTH80(in.handle(), out.handle(), &node.slot, offset, size, 0), out);
        expect(code, ReOXFFTH80_IDP(in.handle(), twin.handle(), &node.instance, offset, size, 0),
               twin);
    };
    real(none, -1, 0, ErrEmptyInput);
    real(three, 3, 0, ErrIndexOutOfRange);
    real(three, -1, 4, ErrIndexOutOfRange);
    real(three, 2, 0, ErrFFTSizeNotPositive);
    real(three, 2, std::numeric_limits<int32_t>::min(), ErrFFTSizeNotPositive);

    CDBArray out(2);
    expect(ErrEmptyInput, CxOXFFTH80(noneComplex.handle(), out.handle(), &node.slot, 9, 0, 0), out);
    CDBArray second(2);
    expect(ErrFFTSizeNotPositive,
           CxOXFFTH80(threeComplex.handle(), second.handle(), &node.slot, 9, 0, 0), second);
    EXPECT_EQ(node.slot, nullptr);
    EXPECT_EQ(node.instance, nullptr) << "nothing is stored before the checks have passed";

    DBLArray realOut(2);
    EXPECT_EQ(ReOXFFTHCH(none.handle(), realOut.handle(), &node.slot), ErrEmptyInput);
    EXPECT_EQ(realOut.size(), 0);
    EXPECT_EQ(InvReOXFFTHCH(none.handle(), realOut.handle(), &node.slot), ErrEmptyInput);
    EXPECT_EQ(InvReOXFFTH(noneComplex.handle(), realOut.handle(), &node.slot), ErrEmptyInput);
    EXPECT_EQ(InvCxOXFFTH(noneComplex.handle(), out.handle(), &node.slot), ErrEmptyInput);
    EXPECT_EQ(CxOXFFTH(noneComplex.handle(), out.handle(), &node.slot), ErrEmptyInput);
}

// Every export with the resize that it requests, the code with which it empties the output, and
// whether it acquires its plan before the resize.
TEST(OneDimensional, ARefusalReturnsTheHostsStatusAndShowsTheOrder) {
    const DBLArray real(RandomSignal(6));
    const CDBArray complex(RandomComplex(6));
    struct Case {
        const char *name;
        int32_t code;
        int32_t emptyCode;
        bool planFirst;
        ErrorCode (*run)(const DBLArray &, const CDBArray &, const DBLArray &, const CDBArray &,
                         Node &);
    };
#define CALL(expression)                                                                           \
    [](const DBLArray &x, const CDBArray &z, const DBLArray &realOut, const CDBArray &complexOut,  \
       Node &node) -> ErrorCode {                                                                  \
        const auto in = x.handle();                                                                \
        const auto zin = z.handle();                                                               \
        const auto out = realOut.handle();                                                         \
        const auto zout = complexOut.handle();                                                     \
        static_cast<void>(in), static_cast<void>(zin), static_cast<void>(out),                     \
            static_cast<void>(zout);                                                               \
        return expression;                                                                         \
    }
    const Case cases[] = {
        {"CxOXFFTH80", 13, 13, true, CALL(CxOXFFTH80(zin, zout, &node.slot, 0, 6, 1))},
        {"CxOXFFTH80_IDP", 13, 13, true, CALL(CxOXFFTH80_IDP(zin, zout, &node.instance, 0, 6, 1))},
        {"InvCxOXFFTH80", 13, 13, true, CALL(InvCxOXFFTH80(zin, zout, &node.slot, 1))},
        {"InvCxOXFFTH80_IDP", 13, 13, true, CALL(InvCxOXFFTH80_IDP(zin, zout, &node.instance, 1))},
        {"ReOXFFTH80", 13, 13, true, CALL(ReOXFFTH80(in, zout, &node.slot, 0, 6, 1))},
        {"ReOXFFTH80_IDP", 13, 13, true, CALL(ReOXFFTH80_IDP(in, zout, &node.instance, 0, 6, 1))},
        {"ReOXFFTHCH", 10, 13, false, CALL(ReOXFFTHCH(in, out, &node.slot))},
        {"ReOXFFTHCH_IDP", 10, 13, false, CALL(ReOXFFTHCH_IDP(in, out, &node.instance))},
        {"InvReOXFFTH80", 10, 13, true, CALL(InvReOXFFTH80(zin, out, &node.slot, 1))},
        {"InvReOXFFTH80_IDP", 10, 13, true, CALL(InvReOXFFTH80_IDP(zin, out, &node.instance, 1))},
        {"InvReOXFFTHCH", 10, 13, false, CALL(InvReOXFFTHCH(in, out, &node.slot))},
        {"InvReOXFFTHCH_IDP", 10, 13, false, CALL(InvReOXFFTHCH_IDP(in, out, &node.instance))},
    };
#undef CALL
    for (const Case &c : cases)
        for (int32_t hostStatus : {77, -4242}) {
            SCOPED_TRACE(c.name);
            DBLArray realOut;
            CDBArray complexOut;
            Node node;
            ResetHost(1, hostStatus);
            EXPECT_EQ(c.run(real, complex, realOut, complexOut, node), hostStatus);
            EXPECT_EQ(Host().reshapes, (std::vector<Reshape>{{c.code, 1, 6}, {c.emptyCode, 1, 0}}));
            ResetHost();
            EXPECT_EQ(node.slot != nullptr || node.instance != nullptr, c.planFirst);
        }
}

TEST(OneDimensional, ASlotKeepsItsPlanUntilTheLengthChanges) {
    const CDBArray in(RandomComplex(12));
    CDBArray out;
    PlanSlot slot = nullptr;
    const int before = RegisteredSweeps();
    ASSERT_EQ(CxOXFFTH80(in.handle(), out.handle(), &slot, 0, 12, 0), 0);
    const PlanSlot cell = slot;
    const FFTPlan *const plan = CellOf(slot)->plan;
    EXPECT_EQ(plan->length, 12);
    EXPECT_EQ(RegisteredSweeps(), before + 1);
    ASSERT_EQ(InvCxOXFFTH(in.handle(), out.handle(), &slot), 0);
    EXPECT_EQ(CellOf(slot)->plan, plan);
    EXPECT_EQ(plan->refCount, 1) << "a plan of the right length is not reacquired";

    ASSERT_EQ(CxOXFFTH80(in.handle(), out.handle(), &slot, 0, 10, 0), 0);
    EXPECT_EQ(slot, cell);
    EXPECT_EQ(CellOf(slot)->plan->length, 10);
    EXPECT_EQ(RegisteredSweeps(), before + 1) << "one sweep for each cell";
    RunSweeps();
    EXPECT_EQ(RegisteredSweeps(), before);
}

TEST(OneDimensional, InstanceDataIsSharedReleasedAndNeverSwept) {
    const CDBArray in(RandomComplex(12));
    CDBArray out, other;
    InstanceWord first = nullptr, second = nullptr;
    const int before = RegisteredSweeps();
    ASSERT_EQ(CxOXFFTH80_IDP(in.handle(), out.handle(), &first, 0, 11, 0), 0);
    ASSERT_EQ(CxOXFFTH80_IDP(in.handle(), other.handle(), &second, 0, 11, 0), 0);
    EXPECT_EQ(RegisteredSweeps(), before);
    const auto *const instance = static_cast<const TransformInstance *>(first);
    const FFTPlan *const plan = CellOf(instance->first)->plan;
    EXPECT_EQ(instance->second, nullptr);
    EXPECT_EQ(CellOf(static_cast<const TransformInstance *>(second)->first)->plan, plan);
    EXPECT_EQ(plan->refCount, 2);

    EXPECT_EQ(TransformUnreserveProc(&first), 0);
    EXPECT_EQ(first, nullptr);
    EXPECT_EQ(plan->refCount, 1);
    EXPECT_EQ(TransformUnreserveProc(&first), 0) << "a null word";
    EXPECT_EQ(TransformUnreserveProc(nullptr), 0) << "no word at all";
    PlanSlot slot = nullptr;
    ASSERT_EQ(CxOXFFTH(in.handle(), out.handle(), &slot), 0);
    InstanceWord wrong = slot;
    EXPECT_EQ(TransformUnreserveProc(&wrong), ErrInternal)
        << "the plan of a slot, not of an instance";
    EXPECT_EQ(wrong, slot);
    RunSweeps();
    EXPECT_EQ(TransformUnreserveProc(&second), 0);
}

// Repeated calls of a node, as in real-time use: while its plan is held and the workspace is
// enabled, no export uses the heap, for any length, window and order.
TEST(OneDimensional, AHeldPlanNeedsNoHeap) {
    if (!HeapProbe::works())
        GTEST_SKIP();
    WorkspaceStatus workspace = {0, 0};
    InitializeAnalysisWorkspaceH(1U << 20, &workspace);
    for (const int32_t n : {1, 12, 60, 46, 53, 106, 167, 512})
        for (const int32_t shift : {0, 1}) {
            SCOPED_TRACE(testing::Message() << n << " " << shift);
            const DBLArray real(RandomSignal(n)), half(RandomSignal(n));
            const CDBArray complex(RandomComplex(n));
            CDBArray complexOut;
            DBLArray realOut;
            Node node;
            const auto calls = {
                std::function([&] {
                    return ReOXFFTH80(real.handle(), complexOut.handle(), &node.slot, 0, n, shift);
                }),
                std::function([&] { // padded
                    return ReOXFFTH80(real.handle(), complexOut.handle(), &node.slot, n / 2, n,
                                      shift);
                }),
                std::function([&] {
                    return CxOXFFTH80(complex.handle(), complexOut.handle(), &node.slot, n / 2, n,
                                      shift);
                }),
                std::function(
                    [&] { return ReOXFFTHCH(real.handle(), realOut.handle(), &node.slot); }),
                std::function([&] {
                    return InvReOXFFTH80(complex.handle(), realOut.handle(), &node.slot, shift);
                }),
                std::function([&] {
                    return InvCxOXFFTH80(complex.handle(), complexOut.handle(), &node.slot, shift);
                }),
                std::function(
                    [&] { return InvReOXFFTHCH(half.handle(), realOut.handle(), &node.slot); }),
                std::function([&] {
                    return ReOXFFTH80_IDP(real.handle(), complexOut.handle(), &node.instance, 0, n,
                                          shift);
                }),
            };
            int32_t index = 0;
            for (const std::function<ErrorCode()> &call : calls) {
                ASSERT_EQ(call(), 0);
                EnableAnalysisWorkspaceH(&workspace);
                const HeapProbe probe;
                EXPECT_EQ(call(), 0) << index;
                EXPECT_EQ(probe.allocations(), 0) << index;
                DisableAnalysisWorkspaceH(&workspace);
                ++index;
            }
        }
    UninitializeAnalysisWorkspaceH(&workspace);
    EXPECT_EQ(workspace.code, 0);
}

TEST(OneDimensional, RequestsBeyondMemoryEndInACode) {
    const DBLArray real(RandomSignal(3));
    const CDBArray complex(RandomComplex(3));
    CDBArray out(1), other(1);
    Node node;
    const int32_t huge = std::numeric_limits<int32_t>::max() - 1; // 2 times a prime
    EXPECT_NE(ReOXFFTH80(real.handle(), out.handle(), &node.slot, 0, huge, 0), 0);
    EXPECT_EQ(out.size(), 0);
    EXPECT_NE(CxOXFFTH80(complex.handle(), other.handle(), &node.slot, 0, huge, 0), 0);
    EXPECT_EQ(other.size(), 0);
}

} // namespace
} // namespace qx::test
