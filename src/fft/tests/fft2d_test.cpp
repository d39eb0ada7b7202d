#include "fft/plan_slot.h"
#include "fft/two_dimensional.h"
#include "qx/errors.h"
#include "qx/fft2d.h"
#include "qx/frame.h"
#include "tests/support/heap_probe.h"
#include "tests/support/hostile_host.h"
#include "tests/support/transform_reference.h"

#include <gtest/gtest.h>

#include <limits>

namespace qx::test {
namespace {

constexpr double Rounding = 2e-15;

struct Shape {
    int32_t rows, cols;
};

CDBMatrix &Fill(CDBMatrix &matrix, uint64_t seed = 1) {
    const std::vector<CDB> values = RandomComplex(matrix.size(), seed);
    std::copy(values.begin(), values.end(), matrix.data());
    return matrix;
}
DBLMatrix &Fill(DBLMatrix &matrix, uint64_t seed = 1) {
    const Signal values = RandomSignal(matrix.size(), seed);
    for (int32_t i = 0; i < matrix.size(); ++i)
        matrix.data()[i] = values[i];
    return matrix;
}

// The region of `matrix` that begins at (rowStart, colStart), zero-padded, transformed by the
// definition and reordered.
template <class Matrix>
LongSpectrum Expected(const Matrix &matrix, Shape start, Shape size, int32_t shift) {
    LongSpectrum region(std::size_t(size.rows) * size.cols);
    for (int32_t r = 0; r < size.rows && start.rows + r < matrix.rows(); ++r)
        for (int32_t c = 0; c < size.cols && start.cols + c < matrix.cols(); ++c)
            region[r * size.cols + c] = ToLong(matrix.at(start.rows + r, start.cols + c));
    LongSpectrum half(region.size()), result(region.size());
    for (int32_t r = 0; r < size.rows; ++r) {
        const LongSpectrum row =
            Dft({region.begin() + r * size.cols, region.begin() + (r + 1) * size.cols});
        std::copy(row.begin(), row.end(), half.begin() + r * size.cols);
    }
    for (int32_t c = 0; c < size.cols; ++c) {
        LongSpectrum column(size.rows);
        for (int32_t r = 0; r < size.rows; ++r)
            column[r] = half[r * size.cols + c];
        column = Dft(column);
        const int32_t toRow = shift != 0 ? size.rows / 2 : 0;
        const int32_t toCol = shift != 0 ? size.cols / 2 : 0;
        for (int32_t r = 0; r < size.rows; ++r)
            result[(r + toRow) % size.rows * size.cols + (c + toCol) % size.cols] = column[r];
    }
    return result;
}

TEST(TwoDimensional, ForwardTakesARegionPadsAndShifts) {
    DBLMatrix real(5, 7);
    CDBMatrix complex(5, 7);
    Fill(real);
    Fill(complex);
    Node node;
    for (Shape size :
         {Shape{1, 1}, {1, 6}, {5, 1}, {4, 4}, {4, 5}, {5, 4}, {5, 5}, {5, 7}, {8, 19}})
        for (Shape start : {Shape{0, 0}, {0, 3}, {2, 0}, {4, 6}})
            for (int32_t shift : {0, 1}) {
                SCOPED_TRACE(testing::Message() << size.rows << "x" << size.cols << " from "
                                                << start.rows << "," << start.cols << " " << shift);
                CDBMatrix out, twin;
                ASSERT_EQ(CxFFT2D_H(complex.handle(), start.rows, start.cols, size.rows, size.cols,
                                    shift, out.handle(), &node.slot, &node.second),
                          0);
                EXPECT_EQ(out.rows(), size.rows);
                EXPECT_LT(MaxError(out.values(), Expected(complex, start, size, shift)), Rounding);
                ASSERT_EQ(CxFFT2D_H_IDP(complex.handle(), start.rows, start.cols, size.rows,
                                        size.cols, shift, twin.handle(), &node.instance),
                          0);
                EXPECT_TRUE(SameBits(out.values(), twin.values()));

                ASSERT_EQ(ReFFT2D_H(real.handle(), start.rows, start.cols, size.rows, size.cols,
                                    shift, out.handle(), &node.slot, &node.second),
                          0);
                EXPECT_LT(MaxError(out.values(), Expected(real, start, size, shift)), Rounding);
                ASSERT_EQ(ReFFT2D_H_IDP(real.handle(), start.rows, start.cols, size.rows, size.cols,
                                        shift, twin.handle(), &node.instance),
                          0);
                EXPECT_TRUE(SameBits(out.values(), twin.values()));
            }
}

// Row by row and column by column, each value at its place in plain or shifted order. Rows from `used` on
// are zero.
template <class Row>
std::vector<CDB> OneByOne(Shape size, int32_t used, int32_t shift, const Row &row) {
    const qx::PlanReference columnPlan(size.rows);
    std::vector<CDB> half(std::size_t(size.rows) * size.cols), wanted(half.size());
    std::vector<CDB> column(size.rows);
    for (int32_t r = 0; r < used; ++r)
        row(r, &half[r * size.cols]);
    const int32_t down = shift != 0 ? size.rows / 2 : 0, right = shift != 0 ? size.cols / 2 : 0;
    for (int32_t c = 0; c < size.cols; ++c) {
        qx::FFTComplexForward(columnPlan.get(), &half[c].re, &half[c].im, &column[0].re,
                              &column[0].im, 2 * size.cols, 2, size.rows);
        for (int32_t r = 0; r < size.rows; ++r)
            wanted[(r + down) % size.rows * size.cols + (c + right) % size.cols] = column[r];
    }
    return wanted;
}

void CheckAgainstOneByOne(Shape size, int32_t used, int32_t shift) {
    SCOPED_TRACE(testing::Message()
                 << size.rows << "x" << size.cols << " " << used << " " << shift);
    const int32_t cols = size.cols;
    const qx::PlanReference rowPlan(cols), columnPlan(size.rows);
    const qx::MatrixRegion region{used, cols, 0, 0, size.rows, cols};
    const std::vector<CDB> x = RandomComplex(used * cols, 1);
    std::vector<CDB> out(std::size_t(size.rows) * cols);
    ASSERT_EQ(qx::FFT2DComplexForward(rowPlan.get(), columnPlan.get(), x.data(), region, shift,
                                      out.data()),
              0);
    EXPECT_TRUE(SameBits(out, OneByOne(size, used, shift, [&](int32_t r, CDB *to) {
                             const CDB *const from = &x[r * cols];
                             qx::FFTComplexForward(rowPlan.get(), &from->re, &from->im, &to->re,
                                                   &to->im, 2, 2, cols);
                         })));

    const Signal real = RandomSignal(used * cols, 1);
    ASSERT_EQ(qx::FFT2DRealForward(rowPlan.get(), columnPlan.get(), real.data(), region, shift,
                                   out.data()),
              0);
    // Half of the columns are transformed, those of negative frequencies in shifted order. The others are
    // the conjugates of their opposites.
    const int32_t sign = shift != 0 ? -1 : 1;
    std::vector<CDB> wanted = OneByOne(size, used, shift, [&](int32_t r, CDB *to) {
        std::vector<double> h(cols);
        qx::FFTRealForward(rowPlan.get(), &real[r * cols], h.data(), 1, 1, cols);
        for (int32_t k = 0; k <= cols / 2; ++k)
            to[(cols + sign * k) % cols] = {h[k], k > 0 && 2 * k < cols ? sign * h[cols - k] : 0};
    });
    const auto at = [&](int32_t r, int32_t f) -> CDB & {
        const int32_t down = shift != 0 ? size.rows / 2 : 0, right = shift != 0 ? cols / 2 : 0;
        return wanted[(r + size.rows + down) % size.rows * cols + (f + cols + right) % cols];
    };
    for (int32_t f = 1; 2 * f < cols; ++f)
        for (int32_t r = 0; r < size.rows; ++r)
            at(-r, -sign * f) = {at(r, sign * f).re, -at(r, sign * f).im};
    EXPECT_TRUE(SameBits(out, wanted));
}

// Columns run abreast where all factors have kernels. They have the bits of a single column, whether they
// fill the lanes or not, with rows that share sets of the cache or not.
TEST(TwoDimensional, ColumnsHaveTheBitsOfOneAlone) {
    for (int32_t rows = 1; rows <= 66; ++rows)
        CheckAgainstOneByOne({rows, rows % 5 + 16}, rows, rows % 2);
    for (const Shape size : {Shape{64, 64},
                             {60, 17},
                             {77, 9},
                             {106, 5},
                             {1024, 8},
                             {300, 240},
                             {640, 18},
                             {17 * 19, 7},
                             {41 * 43, 3},
                             {256, 128},
                             {480, 1},
                             {2, 1}})
        for (const int32_t shift : {0, 1}) {
            CheckAgainstOneByOne(size, size.rows, shift);
            CheckAgainstOneByOne(size, size.rows / 2 + 1, shift);
        }
}

TEST(TwoDimensional, InversesReturnTheMatrix) {
    const double nan = std::numeric_limits<double>::quiet_NaN();
    for (Shape size : {Shape{1, 1}, {1, 6}, {6, 1}, {4, 4}, {4, 19}, {5, 4}, {7, 23}})
        for (int32_t shift : {0, 1}) {
            SCOPED_TRACE(testing::Message() << size.rows << "x" << size.cols << " " << shift);
            DBLMatrix real(size.rows, size.cols);
            CDBMatrix complex(size.rows, size.cols);
            Fill(real);
            Fill(complex);
            CDBMatrix spectrum, complexBack, complexTwin;
            DBLMatrix realBack, realTwin;
            Node node;
            ASSERT_EQ(CxFFT2D_H(complex.handle(), 0, 0, size.rows, size.cols, shift,
                                spectrum.handle(), &node.slot, &node.second),
                      0);
            ASSERT_EQ(CxInvFFT2D_H(spectrum.handle(), shift, complexBack.handle(), &node.slot,
                                   &node.second),
                      0);
            EXPECT_LT(MaxError(complexBack.values(), ToLong(complex.values())), Rounding);
            ASSERT_EQ(
                CxInvFFT2D_H_IDP(spectrum.handle(), shift, complexTwin.handle(), &node.instance),
                0);
            EXPECT_TRUE(SameBits(complexBack.values(), complexTwin.values()));

            ASSERT_EQ(ReFFT2D_H(real.handle(), 0, 0, size.rows, size.cols, shift, spectrum.handle(),
                                &node.slot, &node.second),
                      0);
            // Rows of negative row frequency are not read.
            for (int32_t f = size.rows / 2 + 1; f < size.rows; ++f)
                for (int32_t c = 0; c < size.cols; ++c) {
                    const int32_t r = (f + (shift != 0 ? size.rows / 2 : 0)) % size.rows;
                    spectrum.data()[r * size.cols + c] = {nan, nan};
                }
            ASSERT_EQ(
                ReInvFFT2D_H(spectrum.handle(), shift, realBack.handle(), &node.slot, &node.second),
                0);
            EXPECT_EQ(realBack.rows(), size.rows);
            EXPECT_LT(MaxError(realBack.values(), ToLong(real.values())), Rounding);
            ASSERT_EQ(ReInvFFT2D_H_IDP(spectrum.handle(), shift, realTwin.handle(), &node.instance),
                      0);
            EXPECT_TRUE(SameBits(realBack.values(), realTwin.values()));
        }
}

TEST(TwoDimensional, ChecksComeInOrder) {
    DBLMatrix none(0, 3), matrix(2, 3);
    Fill(matrix);
    Node node;
    const auto run = [&](const DBLMatrix &in, Shape start, Shape size) {
        CDBMatrix out(1, 1);
        const ErrorCode status = ReFFT2D_H(in.handle(), start.rows, start.cols, size.rows,
                                           size.cols, 0, out.handle(), &node.slot, &node.second);
        EXPECT_EQ(out.rows(), 0);
        EXPECT_EQ(out.cols(), 0);
        return status;
    };
    EXPECT_EQ(run(none, {9, 9}, {0, 0}), ErrEmptyInput);
    EXPECT_EQ(run(matrix, {2, -1}, {0, 0}), ErrIndexOutOfRange);
    EXPECT_EQ(run(matrix, {-1, 3}, {0, 0}), ErrIndexOutOfRange);
    EXPECT_EQ(run(matrix, {-1, 0}, {1, 0}), ErrSizesDisagree);
    EXPECT_EQ(node.slot, nullptr);
    const int32_t least = std::numeric_limits<int32_t>::min();
    EXPECT_EQ(run(matrix, {least, 0}, {2, 3}), ErrIndexOutOfRange);
    EXPECT_EQ(run(matrix, {0, -1}, {2, 3}), ErrIndexOutOfRange);
    EXPECT_EQ(static_cast<const qx::PlanCell *>(node.slot)->plan->length, 3)
        << "a negative start is checked last, when the plans are already in their slots";
    EXPECT_EQ(static_cast<const qx::PlanCell *>(node.second)->plan->length, 2);

    // One slot holds one plan, which is enough for a square.
    DBLMatrix square(3, 3);
    Fill(square);
    CDBMatrix both(1, 1), apart(1, 1);
    EXPECT_EQ(ReFFT2D_H(matrix.handle(), 0, 0, 2, 3, 0, both.handle(), &node.slot, &node.slot),
              ErrInternal);
    EXPECT_EQ(both.rows(), 0);
    EXPECT_EQ(ReFFT2D_H(square.handle(), 0, 0, 3, 3, 0, both.handle(), &node.slot, &node.slot), 0);
    EXPECT_EQ(ReFFT2D_H(square.handle(), 0, 0, 3, 3, 0, apart.handle(), &node.slot, &node.second),
              0);
    for (int32_t i = 0; i < 9; ++i)
        EXPECT_EQ(both[i].re, apart[i].re);

    CDBMatrix noneComplex(3, 0), out(1, 1);
    DBLMatrix realOut(1, 1);
    EXPECT_EQ(CxInvFFT2D_H(noneComplex.handle(), 0, out.handle(), &node.slot, &node.second),
              ErrEmptyInput);
    EXPECT_EQ(out.rows(), 0);
    EXPECT_EQ(ReInvFFT2D_H(noneComplex.handle(), 0, realOut.handle(), &node.slot, &node.second),
              ErrEmptyInput);
    EXPECT_EQ(realOut.rows(), 0);
}

TEST(TwoDimensional, ARefusalReturnsTheHostsStatusAndKeepsThePlans) {
    CDBMatrix complex(2, 3), out;
    DBLMatrix real(2, 3), realOut;
    Fill(complex);
    Fill(real);
    for (int32_t hostStatus : {77, -4242}) {
        Node node;
        const auto refused = [&](int32_t typeCode, auto call) {
            ResetHost(1, hostStatus);
            EXPECT_EQ(call(), hostStatus);
            EXPECT_EQ(Host().reshapes, (std::vector<Reshape>{{typeCode, 2, 6}, {typeCode, 2, 0}}));
            ResetHost();
        };
        refused(13, [&] {
            return CxFFT2D_H(complex.handle(), 0, 0, 3, 2, 0, out.handle(), &node.slot,
                             &node.second);
        });
        EXPECT_NE(node.second, nullptr);
        refused(13, [&] {
            return ReFFT2D_H_IDP(real.handle(), 0, 0, 3, 2, 0, out.handle(), &node.instance);
        });
        refused(13, [&] {
            return CxInvFFT2D_H(complex.handle(), 0, out.handle(), &node.slot, &node.second);
        });
        refused(10, [&] {
            return ReInvFFT2D_H_IDP(complex.handle(), 0, realOut.handle(), &node.instance);
        });
    }
}

// If the workspace is too small, an inverse transform either completes (if its columns are plain
// sums) or fails; it once reported success with columns that were never written.
TEST(TwoDimensional, InversesAreWholeOrFailWithoutWorkspace) {
    WorkspaceStatus status = {};
    ASSERT_EQ(0, InitializeAnalysisWorkspaceH(64, &status));
    for (const int32_t rows : {23, 46, 47, 32, 53, 106, 167}) {
        SCOPED_TRACE(rows);
        const bool needsMemory = rows % 53 == 0 || rows == 167;
        CDBMatrix in(rows, 20);
        Fill(in);
        const auto inverses = [&](bool isCramped, CDBMatrix &out, DBLMatrix &realOut) {
            Node node;
            EXPECT_EQ(qx::PlanSlotAcquire(&node.slot, 20), 0);
            EXPECT_EQ(qx::PlanSlotAcquire(&node.second, rows), 0);
            if (isCramped)
                EnableAnalysisWorkspaceH(&status);
            const ErrorCode code =
                CxInvFFT2D_H(in.handle(), 0, out.handle(), &node.slot, &node.second);
            EXPECT_EQ(ReInvFFT2D_H(in.handle(), 0, realOut.handle(), &node.slot, &node.second),
                      code);
            if (isCramped)
                DisableAnalysisWorkspaceH(&status);
            return code;
        };
        CDBMatrix out(1, 1), expected(1, 1);
        DBLMatrix realOut(1, 1), realExpected(1, 1);
        ASSERT_EQ(inverses(false, expected, realExpected), 0);
        ASSERT_EQ(inverses(true, out, realOut), needsMemory ? ErrOutOfMemory : 0);
        ASSERT_EQ(out.rows(), needsMemory ? 0 : rows);
        ASSERT_EQ(realOut.rows(), needsMemory ? 0 : rows);
        for (int32_t i = 0; i < (needsMemory ? 0 : rows * 20); ++i) {
            ASSERT_EQ(out.data()[i].re, expected.data()[i].re);
            ASSERT_EQ(out.data()[i].im, expected.data()[i].im);
            ASSERT_EQ(realOut.data()[i], realExpected.data()[i]);
        }
    }
    ASSERT_EQ(0, UninitializeAnalysisWorkspaceH(&status));
}

TEST(TwoDimensional, RequestsBeyondMemoryEndInACode) {
    DBLMatrix real(2, 3);
    Fill(real);
    Node node;
    for (Shape size : {Shape{1 << 16, 1 << 16}, {1 << 20, 1 << 10}}) {
        CDBMatrix out(1, 1);
        EXPECT_NE(ReFFT2D_H(real.handle(), 0, 0, size.rows, size.cols, 0, out.handle(), &node.slot,
                            &node.second),
                  0);
        EXPECT_EQ(out.rows(), 0);
    }
    if (!HeapProbe::works())
        GTEST_SKIP();
    const CDBMatrix out(1, 1);
    Node fresh;
    const HeapProbe probe;
    EXPECT_EQ(
        ReFFT2D_H(real.handle(), 0, 0, 46341, 46341, 0, out.handle(), &fresh.slot, &fresh.second),
        ErrOutOfMemory);
    EXPECT_EQ(probe.allocations(), 0) << "no plans are made for lengths that no output can have";
}

} // namespace
} // namespace qx::test
