#include "fft/plan_slot.h"
#include "fft/quarter_wave.h"
#include "qx/dct_dst.h"
#include "qx/errors.h"
#include "tests/support/heap_probe.h"
#include "tests/support/hostile_host.h"
#include "tests/support/test_data.h"
#include "tests/support/transform_reference.h"
#include "transforms/dct.h"
#include "transforms/dst.h"

#include <gtest/gtest.h>

#include <cmath>
#include <fstream>
#include <limits>
#include <sstream>
#include <string>
#include <tuple>

namespace qx::test {
namespace {

constexpr double Rounding = 3e-15;

struct Shape {
    int32_t rows, cols;
};

// The exports of the cosine and the sine transform under common names.
struct Family {
    const char *name;
    ErrorCode (*forward)(DBL1D, DBL1D, int32_t, PlanSlot *);
    ErrorCode (*forwardIDP)(DBL1D, DBL1D, int32_t, InstanceWord *);
    ErrorCode (*inverse)(DBL1D, DBL1D, PlanSlot *);
    ErrorCode (*inverseIDP)(DBL1D, DBL1D, InstanceWord *);
    ErrorCode (*forward2D)(DBL2D, DBL2D, int32_t, int32_t, PlanSlot *, PlanSlot *);
    ErrorCode (*forward2DIDP)(DBL2D, DBL2D, int32_t, int32_t, InstanceWord *);
    ErrorCode (*inverse2D)(DBL2D, DBL2D, PlanSlot *, PlanSlot *);
    ErrorCode (*inverse2DIDP)(DBL2D, DBL2D, InstanceWord *);
    LongSpectrum (*definition)(const Signal &);
};

LongSpectrum CosineSums(const Signal &x) {
    const auto n = static_cast<int32_t>(x.size());
    LongSpectrum sums(n);
    for (int32_t k = 0; k < n; ++k) {
        for (int32_t j = 0; j < n; ++j)
            sums[k] += Long(x[j]) * Turn(int64_t{k} * (2 * j + 1), 4 * int64_t{n}).real();
        sums[k] *= std::sqrt((k == 0 ? 1.0L : 2.0L) / n);
    }
    return sums;
}

LongSpectrum SineSums(const Signal &x) {
    const auto n = static_cast<int32_t>(x.size());
    LongSpectrum sums(n);
    for (int32_t k = 0; k < n; ++k)
        for (int32_t j = 0; j < n; ++j)
            sums[k] += Long(x[j]) * Turn(int64_t{j + 1} * (k + 1), 2 * int64_t{n + 1}).imag();
    return sums;
}

const Family Families[] = {
    {"DCT", DCT_1DH, DCT_1DH_IDP, InvDCT_1DH, InvDCT_1DH_IDP, DCT_2DH, DCT_2DH_IDP, InvDCT_2DH,
     InvDCT_2DH_IDP, CosineSums},
    {"DST", DST_1DH, DST_1DH_IDP, InvDST_1DH, InvDST_1DH_IDP, DST_2DH, DST_2DH_IDP, InvDST_2DH,
     InvDST_2DH_IDP, SineSums},
};

Signal Resized(Signal x, int32_t n) {
    x.resize(n);
    return x;
}

TEST(DCTDST, OneDimensionByDefinitionCroppedAndPadded) {
    for (const Family &family : Families)
        for (int32_t n : {1, 2, 3, 4, 5, 12, 23, 26, 53})
            for (int32_t size : {0, -7, n, n + 1, n + 6, (n + 1) / 2}) {
                SCOPED_TRACE(testing::Message() << family.name << " " << n << " " << size);
                const Signal x = RandomSignal(n);
                const DBLArray in(x);
                DBLArray out, twin;
                Node node;
                ASSERT_EQ(family.forward(in.handle(), out.handle(), size, &node.slot), 0);
                ASSERT_EQ(family.forwardIDP(in.handle(), twin.handle(), size, &node.instance), 0);
                const Signal window = Resized(x, size < 1 ? n : size);
                EXPECT_LT(MaxError(out.values(), family.definition(window)), Rounding);
                EXPECT_TRUE(SameBits(out.values(), twin.values()));

                DBLArray back, backTwin;
                ASSERT_EQ(family.inverse(out.handle(), back.handle(), &node.slot), 0);
                ASSERT_EQ(family.inverseIDP(out.handle(), backTwin.handle(), &node.instance), 0);
                EXPECT_LT(MaxError(back.values(), ToLong(window)), Rounding);
                EXPECT_TRUE(SameBits(back.values(), backTwin.values()));
            }
}

TEST(DCTDST, ConstantsComeOutExactly) {
    Node node;
    DBLArray out;
    ASSERT_EQ(DCT_1DH(DBLArray{1, 1, 1, 1}.handle(), out.handle(), 0, &node.slot), 0);
    EXPECT_EQ(out[0], 2.0);
    ASSERT_EQ(DCT_1DH(DBLArray{0.3}.handle(), out.handle(), 0, &node.slot), 0);
    EXPECT_EQ(out[0], 0.3);
    ASSERT_EQ(DST_1DH(DBLArray{0.3}.handle(), out.handle(), 0, &node.slot), 0);
    EXPECT_NEAR(out[0], 0.3, 1e-16);
}

void Fill(const DBLMatrix &matrix, const Signal &values) {
    for (int32_t i = 0; i < matrix.size(); ++i)
        matrix.data()[i] = values[i];
}

// Rows, then columns, of the upper left part, padded with zeros.
LongSpectrum Definition2D(const Family &family, const DBLMatrix &matrix, Shape size) {
    std::vector<Signal> rows;
    for (int32_t r = 0; r < size.rows; ++r) {
        Signal row(size.cols);
        for (int32_t c = 0; c < std::min(size.cols, matrix.cols()) && r < matrix.rows(); ++c)
            row[c] = matrix.at(r, c);
        const LongSpectrum sums = family.definition(row);
        for (int32_t c = 0; c < size.cols; ++c)
            row[c] = static_cast<double>(sums[c].real());
        rows.push_back(row);
    }
    LongSpectrum result(std::size_t(size.rows) * size.cols);
    for (int32_t c = 0; c < size.cols; ++c) {
        Signal column;
        for (const Signal &row : rows)
            column.push_back(row[c]);
        const LongSpectrum sums = family.definition(column);
        for (int32_t r = 0; r < size.rows; ++r)
            result[r * size.cols + c] = sums[r];
    }
    return result;
}

// The shapes include one with an odd side that needs more work memory than the longer, even side.
TEST(DCTDST, TwoDimensionsByDefinitionCroppedAndPadded) {
    for (const Family &family : Families)
        for (Shape shape : {Shape{1, 1}, {1, 5}, {4, 6}, {9, 10}, {10, 9}, {20, 3}})
            for (Shape change : {Shape{0, 0}, {-1, 0}, {2, -1}, {0, 9}}) {
                const Shape size{std::max(1, shape.rows + change.rows),
                                 std::max(1, shape.cols + change.cols)};
                SCOPED_TRACE(testing::Message()
                             << family.name << " " << shape.rows << "x" << shape.cols << " to "
                             << size.rows << "x" << size.cols);
                const DBLMatrix in(shape.rows, shape.cols);
                Fill(in, RandomSignal(in.size()));
                DBLMatrix out, twin, back, backTwin;
                Node node;
                const bool keeps = change.rows == 0 && change.cols == 0;
                ASSERT_EQ(family.forward2D(in.handle(), out.handle(), keeps ? 0 : size.rows,
                                           keeps ? -3 : size.cols, &node.slot, &node.second),
                          0);
                ASSERT_EQ(family.forward2DIDP(in.handle(), twin.handle(), size.rows, size.cols,
                                              &node.instance),
                          0);
                EXPECT_EQ(out.rows(), size.rows);
                EXPECT_EQ(out.cols(), size.cols);
                EXPECT_LT(MaxError(out.values(), Definition2D(family, in, size)), Rounding);
                EXPECT_TRUE(SameBits(out.values(), twin.values()));

                ASSERT_EQ(family.inverse2D(out.handle(), back.handle(), &node.slot, &node.second),
                          0);
                ASSERT_EQ(family.inverse2DIDP(out.handle(), backTwin.handle(), &node.instance), 0);
                LongSpectrum window(out.size());
                for (int32_t r = 0; r < std::min(size.rows, shape.rows); ++r)
                    for (int32_t c = 0; c < std::min(size.cols, shape.cols); ++c)
                        window[r * size.cols + c] = in.at(r, c);
                EXPECT_LT(MaxError(back.values(), window), Rounding);
                EXPECT_TRUE(SameBits(back.values(), backTwin.values()));
            }
}

TEST(DCTDST, AgreeWithSciPy) {
    std::ifstream file(TestData("dct_dst.dat"));
    std::string line;
    int lines = 0;
    for (; std::getline(file, line); ++lines) {
        std::istringstream fields(line);
        std::string kind, number;
        Shape shape{};
        fields >> kind >> shape.rows >> shape.cols;
        Signal numbers;
        while (fields >> number)
            numbers.push_back(std::strtod(number.c_str(), nullptr));
        const std::size_t count = numbers.size() / 2;
        const Signal input(numbers.begin(), numbers.begin() + count);
        const LongSpectrum expected = ToLong(Signal(numbers.begin() + count, numbers.end()));
        const Family &family = Families[kind.substr(0, 3) == "dst"];
        Node node;
        if (kind.size() == 3) {
            DBLArray out;
            ASSERT_EQ(family.forward(DBLArray(input).handle(), out.handle(), 0, &node.slot), 0);
            EXPECT_LT(MaxError(out.values(), expected), Rounding) << line;
        } else {
            const DBLMatrix in(shape.rows, shape.cols);
            Fill(in, input);
            DBLMatrix out;
            ASSERT_EQ(family.forward2D(in.handle(), out.handle(), 0, 0, &node.slot, &node.second),
                      0);
            EXPECT_LT(MaxError(out.values(), expected), Rounding) << line;
        }
    }
    EXPECT_EQ(lines, 18);
}

TEST(DCTDST, ChecksAndRefusalsComeInTheirOrder) {
    const DBLArray none, x(RandomSignal(5));
    const DBLMatrix noneMatrix(0, 2), matrix(4, 5);
    Fill(matrix, RandomSignal(20));
    for (const Family &family : Families) {
        SCOPED_TRACE(family.name);
        const bool isCosine = family.forward == DCT_1DH;
        Node node;
        DBLArray out(2);
        DBLMatrix out2(1, 1);
        EXPECT_EQ(family.forward(none.handle(), out.handle(), 4, &node.slot), ErrEmptyInput);
        EXPECT_EQ(family.inverse(none.handle(), out.handle(), &node.slot), ErrEmptyInput);
        EXPECT_EQ(out.size(), 0);
        EXPECT_EQ(
            family.forward2D(noneMatrix.handle(), out2.handle(), 3, 3, &node.slot, &node.second),
            ErrEmptyInput);
        EXPECT_EQ(out2.rows(), 0);
        EXPECT_EQ(family.inverse2D(noneMatrix.handle(), out2.handle(), &node.slot, &node.second),
                  ErrEmptyInput);

        ResetHost(1, 77);
        EXPECT_EQ(family.forward(x.handle(), out.handle(), 4, &node.slot), 77);
        EXPECT_EQ(Host().reshapes, (std::vector<Reshape>{{10, 1, 4}, {10, 1, 0}}));
        ResetHost(1, -4242);
        EXPECT_EQ(family.inverse(x.handle(), out.handle(), &node.slot), -4242);
        ResetHost();
        EXPECT_EQ(node.slot, nullptr)
            << "in one dimension the output is resized before the plan is acquired";

        ResetHost(1, 77);
        EXPECT_EQ(family.forward2D(matrix.handle(), out2.handle(), 0, 0, &node.slot, &node.second),
                  77);
        EXPECT_EQ(Host().reshapes, (std::vector<Reshape>{{10, 2, 20}, {10, 2, 0}}));
        ResetHost();
        EXPECT_EQ(node.slot != nullptr, isCosine)
            << "in two dimensions only the cosine transform acquires the plan first";
        if (isCosine) {
            EXPECT_EQ(static_cast<const qx::PlanCell *>(node.slot)->plan->length, 4);
            EXPECT_EQ(static_cast<const qx::PlanCell *>(node.second)->plan->length, 10);
        }
        Node other;
        ResetHost(1, 77);
        EXPECT_EQ(family.inverse2D(matrix.handle(), out2.handle(), &other.slot, &other.second), 77);
        ResetHost();
        EXPECT_EQ(other.second != nullptr, isCosine);
    }
}

TEST(DCTDST, OnlyTheInverseCosineTransformIsSilentAboutMissingWorkMemory) {
    if (!HeapProbe::works())
        GTEST_SKIP();
    const DBLArray x(RandomSignal(6));
    for (const Family &family : Families) {
        int32_t silent = 0;
        bool failed = true;
        for (int32_t failAt = 1; failed; ++failAt) {
            DBLArray out(1);
            Node node;
            const HeapProbe probe(failAt);
            const ErrorCode status = family.inverseIDP(x.handle(), out.handle(), &node.instance);
            failed = probe.allocations() >= failAt;
            silent += status == 0 && std::fabs(out[0]) < 1e-100;
        }
        EXPECT_EQ(silent, family.inverse == InvDCT_1DH ? 1 : 0) << family.name;
    }
}

// If only the plan or the work block can be allocated, the slot shows which is allocated first.
TEST(DCTDST, ThePlanComesBeforeTheWorkOfTheCosineTransformOnly) {
    if (!HeapProbe::works())
        GTEST_SKIP();
    const DBLArray x(RandomSignal(6));
    for (const Family &family : Families) {
        // Holds a plan of this length with all its tables, so that only the cell and the work block
        // remain to be allocated.
        Node warm;
        DBLArray ignored;
        ASSERT_EQ(family.forward(x.handle(), ignored.handle(), 0, &warm.slot), 0);
        bool failed = true;
        int withPlan = 0;
        for (int32_t failAt = 1; failed; ++failAt) {
            DBLArray out(1);
            Node node;
            {
                const HeapProbe probe(failAt);
                failed = family.forward(x.handle(), out.handle(), 0, &node.slot) != 0;
            }
            withPlan += failed && node.slot != nullptr;
        }
        EXPECT_EQ(withPlan, family.forward == DCT_1DH ? 1 : 0) << family.name;
    }
}

// The work memory serves rows and columns, of which either may need more.
TEST(DCTDST, LongRowsAndLongColumnsHaveEnoughWork) {
    for (const Family &family : Families)
        for (const Shape size : {Shape{2, 50001}, {50001, 2}, {1, 20001}, {20001, 1}}) {
            SCOPED_TRACE(testing::Message() << family.name << " " << size.rows << "x" << size.cols);
            const DBLMatrix in(size.rows, size.cols);
            Fill(in, RandomSignal(in.size()));
            DBLMatrix out, back;
            Node node;
            ASSERT_EQ(family.forward2D(in.handle(), out.handle(), 0, 0, &node.slot, &node.second),
                      0);
            ASSERT_EQ(family.inverse2D(out.handle(), back.handle(), &node.slot, &node.second), 0);
            EXPECT_LT(MaxError(back.values(), ToLong(in.values())), 2 * Rounding);
        }
}

// Rows and columns commute up to rounding; the bits show which came first.
TEST(DCTDST, InverseRunsColumnsFirstForTheCosineAndRowsFirstForTheSine) {
    constexpr int32_t rows = 7, cols = 10;
    const DBLMatrix in(rows, cols);
    Fill(in, RandomSignal(in.size()));
    for (const Family &family : Families) {
        SCOPED_TRACE(family.name);
        Node node;
        Signal values(in.values());
        const auto alongRows = [&] {
            for (int32_t r = 0; r < rows; ++r) {
                const DBLArray row(
                    Signal(values.begin() + r * cols, values.begin() + (r + 1) * cols));
                DBLArray out;
                ASSERT_EQ(family.inverse(row.handle(), out.handle(), &node.slot), 0);
                for (int32_t c = 0; c < cols; ++c)
                    values[r * cols + c] = out[c];
            }
        };
        const auto alongColumns = [&] {
            for (int32_t c = 0; c < cols; ++c) {
                DBLArray column(rows), out;
                for (int32_t r = 0; r < rows; ++r)
                    column.data()[r] = values[r * cols + c];
                ASSERT_EQ(family.inverse(column.handle(), out.handle(), &node.slot), 0);
                for (int32_t r = 0; r < rows; ++r)
                    values[r * cols + c] = out[r];
            }
        };
        if (family.inverse == InvDCT_1DH) {
            alongColumns();
            alongRows();
        } else {
            alongRows();
            alongColumns();
        }
        DBLMatrix out;
        Node other;
        ASSERT_EQ(family.inverse2D(in.handle(), out.handle(), &other.slot, &other.second), 0);
        EXPECT_TRUE(SameBits(out.values(), values));
    }
}

TEST(DCTDST, TransformsAShortInputInPlace) {
    FFTPlan *const plan = qx::create_oxfft_table(4);
    const Signal x = RandomSignal(8);
    Signal values = x, work(64);
    ASSERT_EQ(qx::DCTForward(plan, {values.data(), 3}, {values.data(), 4}, work.data()), 0);
    const LongSpectrum expected = CosineSums({x[0], x[1], x[2], 0});
    EXPECT_LT(MaxError(Signal(values.begin(), values.begin() + 4), expected), Rounding);
    EXPECT_EQ(values[4], x[4]);
    qx::destroy_oxfft_table(plan);
}

// Eight values have code of their own, with the bits of the steps that other even lengths take.
TEST(DCTDST, EightValuesHaveTheBitsOfTheGeneralSteps) {
    constexpr int32_t n = 8;
    const qx::PlanReference reference(n);
    const FFTPlan *const plan = reference.get();
    const DBL *const wave = qx::QuarterWave(plan);
    for (uint64_t seed = 1; seed <= 200; ++seed) {
        const Signal x = RandomSignal(n, seed);
        Signal out(x), wanted(n), reordered(n), h(n), work(4 * n), z(2 * n), u(2 * n);
        ASSERT_EQ(qx::DCTForward(plan, {out.data(), n}, {out.data(), n}, work.data()), 0);
        for (int32_t j = 0; j < n / 2; ++j) {
            reordered[j] = x[2 * j];
            reordered[n - 1 - j] = x[2 * j + 1];
        }
        qx::FFTRealForward(plan, reordered.data(), h.data(), 1, 1, n);
        wanted[0] = h[0] / std::sqrt(8.0);
        for (int32_t k = 1; k < n / 2; ++k) {
            const double c = wave[2 * k], s = wave[2 * k + 1];
            wanted[k] = (h[k] * c + h[n - k] * s) * 0.5;
            wanted[n - k] = (h[k] * s - h[n - k] * c) * 0.5;
        }
        wanted[n / 2] = h[n / 2] * wave[n] * 0.5;
        EXPECT_TRUE(SameBits(out, wanted)) << seed;

        out = x;
        ASSERT_EQ(qx::DCTInverse(plan, {out.data(), n}, {out.data(), n}, work.data()), 0);
        z[0] = x[0] * std::sqrt(8.0);
        for (int32_t k = 1; k <= n / 2; ++k) {
            const double c = wave[2 * k] * 4, s = wave[2 * k + 1] * 4;
            z[2 * k] = x[k] * c;
            z[2 * k + 1] = x[k] * s;
            z[2 * (n - k)] = x[n - k] * s;
            z[2 * (n - k) + 1] = x[n - k] * c;
        }
        qx::FFTComplexInverse(plan, &z[0], &z[1], &u[0], &u[1], 2, 2, n);
        for (int32_t j = 0; j < n / 2; ++j) {
            wanted[2 * j] = u[2 * j];
            wanted[2 * j + 1] = u[2 * (n - 1 - j)];
        }
        EXPECT_TRUE(SameBits(out, wanted)) << seed;
    }
}

TEST(DCTDST, RequestsBeyondMemoryEndInACode) {
    const DBLArray x(RandomSignal(3));
    const DBLMatrix matrix(1, 3);
    Fill(matrix, RandomSignal(3));
    const int32_t most = std::numeric_limits<int32_t>::max();
    for (const Family &family : Families) {
        DBLArray out(1);
        DBLMatrix out2(1, 1);
        Node node;
        EXPECT_NE(family.forward(x.handle(), out.handle(), most, &node.slot), 0);
        EXPECT_EQ(out.size(), 0);
        EXPECT_NE(
            family.forward2D(matrix.handle(), out2.handle(), most, most, &node.slot, &node.second),
            0);
        EXPECT_EQ(out2.rows(), 0);
        if (HeapProbe::works()) {
            const HeapProbe probe;
            EXPECT_EQ(family.forward2D(matrix.handle(), out2.handle(), 46341, 46341, &node.slot,
                                       &node.second),
                      ErrOutOfMemory);
            EXPECT_EQ(probe.allocations(), 0) << "no memory for sizes that no output can have";
        }
    }
}

} // namespace
} // namespace qx::test
