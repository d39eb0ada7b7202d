#include "fft/plan_slot.h"
#include "qx/errors.h"
#include "qx/power_spectrum.h"
#include "spectra/power_spectrum.h"
#include "tests/support/hostile_host.h"
#include "tests/support/transform_reference.h"

#include <gtest/gtest.h>

#include <cmath>

namespace qx::test {
namespace {

constexpr double Rounding = 4e-15;

// conj(X[k]) Y[k] / n^2 by definition.
template <class Values>
LongSpectrum Cross(const Values &x, const Values &y) {
    const LongSpectrum first = Dft(ToLong(x));
    LongSpectrum product = Dft(ToLong(y));
    const Long n = product.size();
    for (std::size_t k = 0; k < product.size(); ++k)
        product[k] *= std::conj(first[k]) / (n * n);
    return product;
}

const int32_t Lengths[] = {1, 2, 3, 4, 9, 10, 23, 53, 60, 64};

TEST(Spectra, PowerByDefinitionAndSymmetricToTheBit) {
    for (int32_t n : Lengths) {
        SCOPED_TRACE(n);
        const Signal x = RandomSignal(n);
        const std::vector<CDB> z = RandomComplex(n);
        const DBLArray real(x), twin(x);
        const CDBArray complex(z);
        DBLArray out, outTwin;
        Node node;
        ASSERT_EQ(SpectrumH(real.handle(), &node.slot), 0);
        ASSERT_EQ(SpectrumH_IDP(twin.handle(), &node.instance), 0);
        EXPECT_LT(MaxError(real.values(), Cross(x, x)), Rounding);
        EXPECT_TRUE(SameBits(real.values(), twin.values()));
        for (int32_t k = 1; k < n; ++k)
            EXPECT_EQ(real[k], real[n - k]);
        Long sum = 0, square = 0;
        for (int32_t k = 0; k < n; ++k) {
            sum += real[k];
            square += Long(x[k]) * x[k] / n;
        }
        EXPECT_NEAR(static_cast<double>(sum / square), 1, Rounding) << "the mean square";

        ASSERT_EQ(CxSpectrumH(complex.handle(), out.handle(), &node.slot), 0);
        ASSERT_EQ(CxSpectrumH_IDP(complex.handle(), outTwin.handle(), &node.instance), 0);
        EXPECT_LT(MaxError(out.values(), Cross(z, z)), Rounding);
        EXPECT_TRUE(SameBits(out.values(), outTwin.values()));
        EXPECT_TRUE(SameBits(complex.values(), z)) << "the input is only read";
    }
}

TEST(Spectra, CrossByDefinitionWithExactZerosAndConjugates) {
    for (int32_t n : Lengths) {
        SCOPED_TRACE(n);
        const Signal x = RandomSignal(n, 1), y = RandomSignal(n, 2);
        const std::vector<CDB> z = RandomComplex(n, 1), w = RandomComplex(n, 2);
        const DBLArray realX(x), realY(y);
        const CDBArray complexX(z), complexY(w);
        CDBArray out, twin;
        Node node;
        ASSERT_EQ(CrossSpectrumH(realX.handle(), realY.handle(), out.handle(), &node.slot), 0);
        ASSERT_EQ(CrossSpectrumH_IDP(realX.handle(), realY.handle(), twin.handle(), &node.instance),
                  0);
        EXPECT_LT(MaxError(out.values(), Cross(x, y)), Rounding);
        EXPECT_TRUE(SameBits(out.values(), twin.values()));
        EXPECT_EQ(out[0].im, 0.0);
        EXPECT_FALSE(std::signbit(out[0].im));
        if (n % 2 == 0) {
            EXPECT_EQ(out[n / 2].im, 0.0);
        }
        for (int32_t k = 1; k < n; ++k) {
            EXPECT_EQ(out[k].re, out[n - k].re);
            EXPECT_EQ(out[k].im, -out[n - k].im);
        }
        ASSERT_EQ(CrossSpectrumH(realX.handle(), realX.handle(), out.handle(), &node.slot), 0);
        for (int32_t k = 0; k < n; ++k)
            EXPECT_EQ(out[k].im, 0.0) << "of a signal with itself";

        ASSERT_EQ(CxCrossSpectrumH(complexX.handle(), complexY.handle(), out.handle(), &node.slot),
                  0);
        ASSERT_EQ(CxCrossSpectrumH_IDP(complexX.handle(), complexY.handle(), twin.handle(),
                                       &node.instance),
                  0);
        EXPECT_LT(MaxError(out.values(), Cross(z, w)), Rounding);
        EXPECT_TRUE(SameBits(out.values(), twin.values()));
    }
}

TEST(Spectra, OneValueAndNoNumber) {
    Node node;
    const DBLArray x{-3.0};
    ASSERT_EQ(SpectrumH(x.handle(), &node.slot), 0);
    EXPECT_EQ(x[0], 9.0);
    CDBArray cross;
    const CDBArray z({{2.0, 3.0}}), w({{5.0, -7.0}});
    ASSERT_EQ(CxCrossSpectrumH(z.handle(), w.handle(), cross.handle(), &node.slot), 0);
    EXPECT_EQ(cross[0].re, 2.0 * 5 - 3 * 7);
    EXPECT_EQ(cross[0].im, -2.0 * 7 - 3 * 5);

    const DBLArray broken{1.0, std::nan(""), HUGE_VAL, 2.0};
    EXPECT_EQ(SpectrumH(broken.handle(), &node.slot), 0);
    EXPECT_TRUE(std::isnan(broken[1]));
}

TEST(Spectra, ChecksComeInOrderAndEmptyTheOutput) {
    const DBLArray none, x(RandomSignal(3)), longer(RandomSignal(4));
    const CDBArray noneComplex, z(RandomComplex(3));
    Node node;
    const auto realCross = [&](const DBLArray &a, const DBLArray &b) {
        CDBArray out(2);
        const ErrorCode status = CrossSpectrumH(a.handle(), b.handle(), out.handle(), &node.slot);
        EXPECT_EQ(out.size(), 0);
        return status;
    };
    EXPECT_EQ(realCross(none, x), ErrEmptyInput);
    EXPECT_EQ(realCross(x, none), ErrEmptyInput);
    EXPECT_EQ(realCross(x, longer), ErrSizeMismatch);
    CDBArray out(2);
    EXPECT_EQ(CxCrossSpectrumH(z.handle(), noneComplex.handle(), out.handle(), &node.slot),
              ErrEmptyInput);
    EXPECT_EQ(out.size(), 0);
    ResetHost();
    EXPECT_EQ(SpectrumH(none.handle(), &node.slot), ErrEmptyInput);
    EXPECT_EQ(Host().reshapes, (std::vector<Reshape>{{10, 1, 0}}));
    DBLArray power(2);
    EXPECT_EQ(CxSpectrumH(noneComplex.handle(), power.handle(), &node.slot), ErrEmptyInput);
    EXPECT_EQ(power.size(), 0);
    EXPECT_EQ(node.slot, nullptr);
}

TEST(Spectra, EachExportTreatsARefusalInItsWay) {
    const DBLArray x(RandomSignal(3));
    const CDBArray z(RandomComplex(3));
    for (int32_t hostStatus : {77, -4242}) {
        SCOPED_TRACE(hostStatus);
        DBLArray power(2);
        CDBArray cross(2), complexCross(2);
        Node first, second, third;
        ResetHost(1, hostStatus);
        EXPECT_EQ(CxSpectrumH(z.handle(), power.handle(), &first.slot), ErrOutOfMemory);
        EXPECT_NE(first.slot, nullptr) << "the plan is acquired before the output is resized";
        EXPECT_EQ(power.size(), 0);

        ResetHost(1, hostStatus);
        EXPECT_EQ(CrossSpectrumH(x.handle(), x.handle(), cross.handle(), &second.slot), hostStatus);
        EXPECT_EQ(second.slot, nullptr) << "the plan is acquired after the output is resized";
        EXPECT_EQ(cross.size(), hostStatus < 0 ? 0 : 2);

        ResetHost(1, hostStatus);
        EXPECT_EQ(
            CxCrossSpectrumH_IDP(z.handle(), z.handle(), complexCross.handle(), &third.instance),
            ErrOutOfMemory);
        EXPECT_EQ(third.instance, nullptr);
        EXPECT_EQ(complexCross.size(), 0);
        ResetHost();
    }
}

TEST(Spectra, TheSlotFollowsTheLength) {
    const DBLArray x(RandomSignal(6)), y(RandomSignal(9));
    Node node;
    ASSERT_EQ(SpectrumH(x.handle(), &node.slot), 0);
    const auto *const cell = static_cast<const qx::PlanCell *>(node.slot);
    EXPECT_EQ(cell->plan->length, 6);
    EXPECT_EQ(cell->plan->refCount, 1) << "the routine released its own reference";
    ASSERT_EQ(SpectrumH(y.handle(), &node.slot), 0);
    EXPECT_EQ(cell->plan->length, 9);
}

} // namespace
} // namespace qx::test
