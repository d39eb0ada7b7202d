#include "qx/anova.h"
#include "qx/errors.h"
#include "tests/support/hostile_host.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <cmath>
#include <fstream>
#include <limits>
#include <sstream>
#include <string>
#include <vector>

namespace {

using qx::ElementType;
using qx::test::DBLArray;
using qx::test::I32Array;

struct Anova {
    double ssBetween, msBetween, f, p, ssError, msError, ssTotal, fCritical;
    ErrorCode err;
};

Anova AnovaOf(const std::vector<double> &values, const std::vector<int32_t> &labels, int32_t k,
              double alpha) {
    const DBLArray y(values);
    const I32Array levels(labels);
    Anova a = {7, 7, 7, 7, 7, 7, 7, 7, 7};
    EXPECT_EQ(Anova1Way_head_2017(y.handle(), levels.handle(), &k, alpha, &a.ssBetween,
                                  &a.msBetween, &a.f, &a.p, &a.ssError, &a.msError, &a.ssTotal,
                                  &a.fCritical, &a.err),
              0);
    return a;
}

// The certified values of NIST. The number of digits that a single pass keeps falls with the
// constant leading digits of the data: one in the first sets, seven in SmLs04, thirteen in SmLs07.
TEST(Anova, ReachesTheDigitsThatASinglePassCanKeep) {
    std::ifstream file(qx::test::TestData("nist_anova.dat"));
    int sets = 0;
    for (std::string line; std::getline(file, line);) {
        if (line[0] == '#')
            continue;
        std::istringstream words(line);
        std::string name;
        std::size_t n;
        int32_t k;
        double ssBetween, f, ssError;
        words >> name >> n >> k >> ssBetween >> f >> ssError;
        std::vector<double> y(n);
        std::vector<int32_t> labels(n);
        for (std::size_t i = 0; i < n; ++i)
            file >> labels[i] >> y[i];
        file.ignore();
        SCOPED_TRACE(name);
        const Anova a = AnovaOf(y, labels, k, 0.05);
        EXPECT_EQ(a.err, 0);
        ++sets;
        if (name == "SmLs07") {
            EXPECT_GT(std::fabs(a.ssError / ssError - 1.0), 1e3) << "no digit is left here";
            continue;
        }
        const double bound = name == "SmLs04" ? 0.3 : 1e-8; // under one digit with a mean of 1e6
        EXPECT_NEAR(a.ssBetween / ssBetween, 1.0, bound);
        EXPECT_NEAR(a.ssError / ssError, 1.0, bound);
        EXPECT_NEAR(a.f / f, 1.0, bound);
    }
    EXPECT_EQ(sets, 5);
}

// Three fertilisers of a textbook layout, worked by hand: means 5, 9, 10 over 6 plots each.
TEST(Anova, AWorkedExampleWithLabelsInAnyOrder) {
    const std::vector<double> y{6, 8, 13, 8, 12, 9, 4, 9, 11, 5, 11, 8, 3, 6, 7, 4, 8, 12};
    const std::vector<int32_t> labels{-7, 100, 3, -7, 100, 3, -7, 100, 3,
                                      -7, 100, 3, -7, 100, 3, -7, 100, 3};
    const Anova a = AnovaOf(y, labels, 3, 0.05);
    EXPECT_EQ(a.err, 0);
    EXPECT_DOUBLE_EQ(a.ssBetween, 84.0);
    EXPECT_DOUBLE_EQ(a.ssError, 68.0);
    EXPECT_DOUBLE_EQ(a.ssTotal, 152.0);
    EXPECT_DOUBLE_EQ(a.msBetween, 42.0);
    EXPECT_DOUBLE_EQ(a.f, 9.264705882352941);
    EXPECT_NEAR(a.p, 0.00239877, 1e-8);
    EXPECT_NEAR(a.fCritical, 3.682320, 1.1e-4);

    const DBLArray values(y);
    const I32Array levels(labels);
    const int32_t k = 3;
    Anova old = {};
    EXPECT_EQ(Anova1Way_head(values.handle(), levels.handle(), &k, &old.ssBetween, &old.msBetween,
                             &old.f, &old.p, &old.ssError, &old.msError, &old.ssTotal, &old.err),
              0);
    EXPECT_EQ(old.f, a.f);
    EXPECT_EQ(old.p, a.p);
    EXPECT_EQ(AnovaOf(y, labels, 3, 0.0).fCritical, std::numeric_limits<double>::infinity());
}

// As many labels as half the data, whose bits lie far apart or side by side: by the number of
// look-ups of a linear search, 10^12, this would take half an hour.
TEST(Anova, ManyLevelsTakeTimeInProportionToTheData) {
    constexpr int32_t k = 1 << 20;
    for (const uint32_t step : {1u, 1u << 11 | 1u, 0x9e3779b1u}) {
        std::vector<double> y;
        std::vector<int32_t> labels;
        uint32_t label = 0x80000000u;
        for (int32_t i = 0; i < k; ++i) {
            label += step;
            const double level = i % 3;
            y.insert(y.end(), {level, level + 2});
            labels.insert(labels.end(), 2, static_cast<int32_t>(label));
        }
        const Anova a = AnovaOf(y, labels, k, 0.05);
        EXPECT_EQ(a.err, 0);
        EXPECT_EQ(a.ssError, 2.0 * k); // each pair is one off its mean
        EXPECT_NEAR(a.ssBetween, 2.0 * k * 2 / 3, 10);
    }
}

TEST(Anova, CodesComeInTheirOrder) {
    const std::vector<double> y{1, 2, 3, 4};
    const auto code = [&](const std::vector<int32_t> &labels, int32_t k, double alpha) {
        const Anova a = AnovaOf(y, labels, k, alpha);
        for (const double value :
             {a.ssBetween, a.msBetween, a.f, a.p, a.ssError, a.msError, a.ssTotal, a.fCritical})
            EXPECT_TRUE(a.err == 0 || std::isnan(value));
        return a.err;
    };
    EXPECT_EQ(code({1, 2, 1}, 1, 2.0), ErrSizeMismatch);
    EXPECT_EQ(AnovaOf({}, {}, 2, 0.5).err, ErrEmptyInput);
    EXPECT_EQ(code({1, 2, 1, 2}, 1, 2.0), ErrAnovaFewLevels);
    EXPECT_EQ(code({1, 2, 1, 2}, 4, 2.0), ErrAnovaFewLevels);
    EXPECT_EQ(code({1, 2, 1, 2}, 2, 2.0), ErrBadSignificance);
    EXPECT_EQ(code({1, 2, 3, 2}, 2, 0.5), ErrAnovaFactorEmpty);
    EXPECT_EQ(code({1, 1, 1, 1}, 2, 0.5), ErrAnovaNoReplication);
    EXPECT_EQ(code({1, 2, 1, 2}, 2, 0.5), 0);
}

struct Contingency {
    double chiSquare, p;
    ErrorCode err;
};

Contingency ContingencyOf(int32_t rows, int32_t cols, const std::vector<int32_t> &cells) {
    const qx::test::Array2D<ElementType::I32> table(rows, cols);
    for (std::size_t i = 0; i < cells.size(); ++i)
        table.data()[i] = cells[i];
    Contingency c = {7, 7, 7};
    EXPECT_EQ(Contingency_head(table.handle(), &c.chiSquare, &c.p, &c.err), 0);
    return c;
}

TEST(Contingency, AgreesWithPublishedTables) {
    // K. Pearson's statistic on smoking by two groups, R. A. Fisher's twins (Statistical methods
    // for research workers, 1925): 13.03 without correction, p = 0.00031.
    const Contingency twins = ContingencyOf(2, 2, {10, 3, 2, 15});
    EXPECT_EQ(twins.err, 0);
    EXPECT_NEAR(twins.chiSquare, 13.0316742081448, 1.5e-14);
    EXPECT_NEAR(twins.p, 0.000306267, 1e-9);
    // Eye and hair colour of 592 students (R. D. Snee, 1974): 138.2898 on 9 degrees of freedom.
    const Contingency colours =
        ContingencyOf(4, 4, {68, 20, 15, 5, 119, 84, 54, 29, 26, 17, 14, 14, 7, 94, 10, 16});
    EXPECT_NEAR(colours.chiSquare, 138.2898, 5e-5);
    EXPECT_LT(colours.p, 1e-15);
    EXPECT_NEAR(ContingencyOf(2, 3, {10, 20, 30, 20, 40, 60}).p, 1.0, 1e-15);
}

TEST(Contingency, FaultsAndEmptyRows) {
    const auto code = [](int32_t rows, int32_t cols, const std::vector<int32_t> &cells) {
        const Contingency c = ContingencyOf(rows, cols, cells);
        EXPECT_TRUE(c.err == 0 || (std::isnan(c.chiSquare) && std::isnan(c.p)));
        return c.err;
    };
    EXPECT_EQ(code(1, 3, {1, 2, 3}), ErrTableTooSmall);
    EXPECT_EQ(code(0, 0, {}), ErrTableTooSmall);
    const qx::test::Array2D<ElementType::I32> negative(0, 0);
    for (const int32_t rows : {-1, 0}) {
        (*negative.handle())->dimSizes[0] = rows;
        (*negative.handle())->dimSizes[1] = -1 - rows;
        Contingency c = {7, 7, 7};
        EXPECT_EQ(Contingency_head(negative.handle(), &c.chiSquare, &c.p, &c.err), 0);
        EXPECT_EQ(c.err, ErrTableNegativeSize);
    }
    (*negative.handle())->dimSizes[0] = (*negative.handle())->dimSizes[1] = 0;
    EXPECT_EQ(code(2, 2, {1, 2, -3, 4}), ErrTableNegativeSize);
    const Contingency emptyRow = ContingencyOf(2, 2, {0, 0, 3, 4});
    EXPECT_EQ(emptyRow.err, 0);
    EXPECT_TRUE(std::isnan(emptyRow.chiSquare) && std::isnan(emptyRow.p));
}

} // namespace
