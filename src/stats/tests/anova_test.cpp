#include "qx/anova.h"
#include "qx/errors.h"
#include "tests/support/hostile_host.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <cstdlib>
#include <fstream>
#include <limits>
#include <sstream>
#include <string>
#include <vector>

namespace qx::test {
namespace {

struct Anova {
    double ssBetween, msBetween, f, p, ssError, msError, ssTotal, fCritical;
    ErrorCode err;
};

Anova AnovaOf(const std::vector<double> &values, const std::vector<int32_t> &labels, int32_t k,
              double alpha, decltype(&Anova1Way_head_2017) analysis = Anova1Way_head_2017) {
    const DBLArray y(values);
    const I32Array levels(labels);
    Anova a = {7, 7, 7, 7, 7, 7, 7, 7, 7};
    EXPECT_EQ(analysis(y.handle(), levels.handle(), &k, alpha, &a.ssBetween, &a.msBetween, &a.f,
                       &a.p, &a.ssError, &a.msError, &a.ssTotal, &a.fCritical, &a.err),
              0);
    return a;
}

// The certified values of NIST. The more leading digits the data have in common, the fewer digits a
// single pass keeps: there is one common digit in the first sets, seven in SmLs04 and thirteen in
// SmLs07.
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
        // The accuracy that remains after rounding the data to doubles.
        const Anova revised = AnovaOf(y, labels, k, 0.05, Anova1Way_head_2026);
        const double kept = name == "SmLs07" ? 1e-2 : name == "SmLs04" ? 1e-9 : 1e-12;
        EXPECT_NEAR(revised.ssBetween / ssBetween, 1.0, kept);
        EXPECT_NEAR(revised.ssError / ssError, 1.0, kept);
        EXPECT_NEAR(revised.f / f, 1.0, kept);
        if (name == "SmLs07") {
            EXPECT_GT(std::fabs(a.ssError / ssError - 1.0), 1e3) << "no correct digit is left";
            continue;
        }
        const double bound = name == "SmLs04" ? 0.3 : 1e-8; // under one digit with a mean of 1e6
        EXPECT_NEAR(a.ssBetween / ssBetween, 1.0, bound);
        EXPECT_NEAR(a.ssError / ssError, 1.0, bound);
        EXPECT_NEAR(a.f / f, 1.0, bound);
    }
    EXPECT_EQ(sets, 5);
}

// Integers plus a large constant, with exactly known sums: 3, 5 and 4 observations with means 2, 5
// and 9.
TEST(Anova, TheRevisionKeepsEveryDigitFarFromZero) {
    const std::vector<double> plain{1, 2, 3, 3, 4, 5, 6, 7, 6, 8, 10, 12};
    const std::vector<int32_t> labels{1, 1, 1, 2, 2, 2, 2, 2, 3, 3, 3, 3};
    // Within: 2 + 10 + 20; between: sum of squares 493 less the above less 67^2 / 12.
    const double within = 32.0;
    const double between = 493.0 - within - 67.0 * 67.0 / 12.0;
    const double eps = std::numeric_limits<double>::epsilon();
    for (const double constant : {0.0, 1e9, 4e15, -4e15})
        for (const double unit : {1.0, 0x1p-700, 0x1p500}) {
            std::vector<double> y;
            for (const double value : plain)
                y.push_back((value + constant) * unit);
            const Anova a = AnovaOf(y, labels, 3, 0.05, Anova1Way_head_2026);
            const double f = between / 2 / (within / 9);
            EXPECT_EQ(a.err, 0);
            EXPECT_NEAR(a.f, f, 2 * eps * f);
            EXPECT_NEAR(a.ssError, within * unit * unit, 0.0);
            EXPECT_NEAR(a.ssBetween, between * unit * unit, 2 * eps * between * unit * unit);
            EXPECT_NEAR(a.ssTotal, (between + within) * unit * unit, 80 * eps * unit * unit);
            // With 2 and d degrees of freedom P(F > f) is (1 + 2 f / d)^(-d / 2).
            const double p = std::pow(1 + 2 * f / 9, -4.5);
            EXPECT_NEAR(a.p, p, 20 * eps * p);
            EXPECT_NEAR(a.fCritical, 4.5 * (std::pow(0.05, -1 / 4.5) - 1), 40 * eps);
        }

    const Anova noError = AnovaOf({0.1, 0.1, 0.7, 0.7}, {0, 0, 1, 1}, 2, 0.05, Anova1Way_head_2026);
    EXPECT_EQ(noError.err, 0);
    EXPECT_EQ(noError.ssError, 0);
    EXPECT_EQ(noError.f, std::numeric_limits<double>::infinity());
    EXPECT_EQ(noError.p, 0);
    const Anova noEffect =
        AnovaOf({0.1, 0.3, 0.3, 0.1}, {0, 0, 1, 1}, 2, 0.05, Anova1Way_head_2026);
    EXPECT_EQ(noEffect.ssBetween, 0);
    EXPECT_EQ(noEffect.p, 1);
    for (const double value : {0.1, std::numeric_limits<double>::infinity()})
        EXPECT_EQ(AnovaOf({value, value, value}, {0, 0, 1}, 2, 0.05, Anova1Way_head_2026).err,
                  ErrNaNInData);
}

// Three fertilisers in a textbook layout, computed by hand: means 5, 9, 10 over 6 plots each.
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

// Half as many labels as data, with bits that are far apart or adjacent. A linear search would need
// 10^12 look-ups and take half an hour.
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
        EXPECT_EQ(a.ssError, 2.0 * k); // each pair deviates from its mean by one
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
    EXPECT_EQ(AnovaOf(y, {0, 1, 2, 3}, 4, 0.5, Anova1Way_head_2026).err, ErrAnovaFewLevels);
    EXPECT_EQ(code({1, 2, 1, 2}, 2, 2.0), ErrBadSignificance);
    EXPECT_EQ(code({1, 2, 3, 2}, 2, 0.5), ErrAnovaFactorEmpty);
    EXPECT_EQ(code({1, 1, 1, 1}, 2, 0.5), ErrAnovaNoReplication);
    EXPECT_EQ(code({1, 2, 1, 2}, 2, 0.5), 0);
}

struct Observation {
    int32_t level[3];
    double y;
};

struct Crossed {
    int factors = 2;
    int32_t levels[3] = {}; // negative: random
    int32_t observations = 1;
    std::vector<Observation> data;

    std::vector<double> values() const {
        std::vector<double> y;
        for (const Observation &observation : data)
            y.push_back(observation.y);
        return y;
    }
    std::vector<int32_t> labels(int factor) const {
        std::vector<int32_t> labels;
        for (const Observation &observation : data)
            labels.push_back(observation.level[factor]);
        return labels;
    }
};

enum Column { SumOfSquares, Degrees, MeanSquare, F, P, DenominatorDegrees, Critical, Columns };

struct Table {
    ErrorCode err = 0;
    std::vector<double> column[Columns];
    double f(std::size_t source) const { return column[F].at(source); }
};

// Calls both revisions, which must agree to the bit.
Table TableOf(const Crossed &design, double significance = 0.05) {
    const DBLArray y(design.values());
    const I32Array a(design.labels(0)), b(design.labels(1)), c(design.labels(2));
    const DBLArray old[] = {DBLArray{7}, DBLArray{7}, DBLArray{7},
                            DBLArray{7}, DBLArray{7}, DBLArray{7}};
    const DBLArray now[] = {DBLArray{7}, DBLArray{7}, DBLArray{7}, DBLArray{7},
                            DBLArray{7}, DBLArray{7}, DBLArray{7}};
    const int32_t *k = design.levels;
    const auto out = [&](int i) { return now[i].handle(); };
    const auto outOfOld = [&](int i) { return old[i].handle(); };
    Table table;
    ErrorCode oldErr;
    if (design.factors == 2) {
        oldErr = Anova2Way_head(y.handle(), a.handle(), b.handle(), k[0], k[1], design.observations,
                                outOfOld(0), outOfOld(1), outOfOld(2), outOfOld(3), outOfOld(4),
                                outOfOld(5));
        table.err = Anova2Way_head_2017(y.handle(), a.handle(), b.handle(), k[0], k[1],
                                        design.observations, significance, out(0), out(1), out(2),
                                        out(3), out(4), out(5), out(6));
    } else {
        oldErr = ANOVA3Way_head(y.handle(), a.handle(), b.handle(), c.handle(), k[0], k[1], k[2],
                                design.observations, outOfOld(0), outOfOld(1), outOfOld(2),
                                outOfOld(3), outOfOld(4), outOfOld(5));
        table.err = ANOVA3Way_head_2017(y.handle(), a.handle(), b.handle(), c.handle(), k[0], k[1],
                                        k[2], design.observations, significance, out(0), out(1),
                                        out(2), out(3), out(4), out(5), out(6));
    }
    if (table.err != ErrBadSignificance) {
        EXPECT_EQ(oldErr, table.err);
    }
    for (int i = 0; i < Columns; ++i) {
        table.column[i] = now[i].values();
        EXPECT_EQ(table.column[i].empty(), table.err != 0);
        for (int32_t at = 0; i < Critical && table.err == 0 && at < now[i].size(); ++at)
            EXPECT_EQ(std::isnan(old[i][at]) ? 0.0 : old[i][at],
                      std::isnan(now[i][at]) ? 0.0 : now[i][at]);
    }
    return table;
}

// A full factorial with the value of each observation.
template <class Value>
Crossed FullFactorial(std::vector<int32_t> levels, int32_t observations, Value value) {
    Crossed design;
    design.factors = static_cast<int>(levels.size());
    levels.resize(3, 1);
    design.observations = observations;
    for (int i = 0; i < 3; ++i)
        design.levels[i] = levels[static_cast<std::size_t>(i)];
    for (int32_t k = 0; k < observations; ++k)
        for (int32_t a = 0; a < std::abs(levels[0]); ++a)
            for (int32_t b = 0; b < std::abs(levels[1]); ++b)
                for (int32_t c = 0; c < std::abs(levels[2]); ++c)
                    design.data.push_back({{a, b, c}, value(a, b, c, k)});
    return design;
}

// The observations in another order and with other labels.
Crossed Disguised(Crossed design) {
    for (std::size_t i = design.data.size() - 1; i > 0; --i)
        std::swap(design.data[i], design.data[i * 7919 % (i + 1)]);
    for (Observation &observation : design.data)
        for (int32_t &level : observation.level)
            level = static_cast<int32_t>(0x9e3779b9u * static_cast<uint32_t>(level + 5));
    return design;
}

double ReadNumber(std::istream &words) {
    std::string word;
    words >> word;
    return std::strtod(word.c_str(), nullptr); // streams do not read hexadecimal fractions
}

// Exact tables (make_factorial_anova_data.py): published data, all choices of random factors, one
// observation per cell, and multiples of 1/8 at a distance of 10^9 from 0.
TEST(FactorialAnova, AgreesWithExactTables) {
    const double bounds[] = {2.3e-16, 0.0, 2.3e-16, 2.3e-16, 7e-15, 1.4e-15, 4e-15};
    double worst[Columns] = {};
    std::ifstream file(qx::test::TestData("factorial_anova.dat"));
    int designs = 0;
    for (std::string line, word; std::getline(file, line); ++designs) {
        std::istringstream words(line);
        std::string name, expected;
        Crossed design;
        words >> word >> name >> design.factors;
        int32_t cells = 1;
        for (int i = 0; i < design.factors; ++i) {
            words >> design.levels[i];
            cells *= std::abs(design.levels[i]);
        }
        words >> design.observations;
        const double significance = ReadNumber(words);
        SCOPED_TRACE(name);
        for (int i = 0; i < cells * design.observations; ++i) {
            Observation observation = {};
            for (int j = 0; j < design.factors; ++j)
                file >> observation.level[j];
            observation.y = ReadNumber(file);
            design.data.push_back(observation);
        }
        const Table table = TableOf(Disguised(design), significance);
        ASSERT_EQ(table.err, 0);
        const std::size_t sources = design.factors == 2 ? 5 : 9;
        for (std::size_t source = 0; source < sources; ++source) {
            file >> word;
            for (int i = 0; i < Columns; ++i) {
                const double exact = ReadNumber(file);
                const double value = table.column[i].at(source);
                if (std::isnan(exact) || exact == 0.0) {
                    EXPECT_TRUE(std::isnan(exact) ? std::isnan(value) : value == exact) << word;
                    continue;
                }
                const double error = std::fabs(value / exact - 1.0);
                EXPECT_LE(error, bounds[i]) << word << ", column " << i;
                worst[i] = std::max(worst[i], error);
            }
        }
        EXPECT_EQ(table.column[F].size(), sources);
        std::getline(file, line);
    }
    EXPECT_EQ(designs, 27);
    for (int i = 0; i < Columns; ++i)
        RecordProperty("worst" + std::to_string(i), testing::PrintToString(worst[i]));
}

// f does not change with an offset and a scale factor of the data, even if their squares overflow
// or underflow.
TEST(FactorialAnova, KeepsItsRatiosAtEveryScale) {
    const auto value = [](int32_t a, int32_t b, int32_t c, int32_t k) {
        return a * 3 - b * 2 + a * b * 0.5 + c * (a - 1) * 0.25 +
               (a * 5 + b * 3 + c + k * 7) % 11 / 8.0;
    };
    const Crossed design = FullFactorial({-3, 4, 2}, 3, value);
    const Table table = TableOf(design);
    ASSERT_EQ(table.err, 0);
    for (const double scale : {0x1p-1070, 0x1p-600, -0x1p600, 0x1p1018}) {
        SCOPED_TRACE(scale);
        Crossed scaled = design;
        for (Observation &observation : scaled.data)
            observation.y *= scale;
        const Table other = TableOf(scaled);
        ASSERT_EQ(other.err, 0);
        if (scale == 0x1p-1070) // with rounded data
            continue;
        for (std::size_t source = 0; source < 7; ++source) {
            EXPECT_EQ(other.f(source), table.f(source));
            EXPECT_EQ(other.column[P][source], table.column[P][source]);
        }
    }
    // The largest differences overflow.
    const Crossed huge = FullFactorial({2, 2}, 2, [](int32_t a, int32_t b, int32_t, int32_t k) {
        return (a == 0 ? -1.0 : 1.0) * (b + 3 * k + 4) * 0x1p1020;
    });
    const Crossed same = FullFactorial({2, 2}, 2, [](int32_t a, int32_t b, int32_t, int32_t k) {
        return (a == 0 ? -1.0 : 1.0) * (b + 3 * k + 4);
    });
    EXPECT_EQ(TableOf(huge).column[F].at(0), TableOf(same).column[F].at(0));
    EXPECT_EQ(TableOf(huge).column[SumOfSquares].at(0), std::numeric_limits<double>::infinity());
}

TEST(FactorialAnova, EndsOfTheRangeOfSignificance) {
    const Crossed design = FullFactorial({3, 2}, 2, [](int32_t a, int32_t b, int32_t, int32_t k) {
        return a * a + b + k * (1.0 + a * b);
    });
    EXPECT_EQ(TableOf(design, 0.0).column[Critical].at(0), std::numeric_limits<double>::infinity());
    EXPECT_EQ(TableOf(design, 1.0).column[Critical].at(0), 0.0);
    for (const double none : {-0x1p-1074, 1.0 + 0x1p-52, std::nan("")})
        EXPECT_EQ(TableOf(design, none).err, ErrBadSignificance);
}

// A true 0 is not mistaken for a rounding error, for any fractions.
TEST(FactorialAnova, RefusesDenominatorsThatVanish) {
    const auto equalInCells = [](int32_t a, int32_t b, int32_t c, int32_t) {
        return 0.1 * a + 0.7 * b * a - 1.3 * c;
    };
    EXPECT_EQ(TableOf(FullFactorial({3, 7}, 3, equalInCells)).err, ErrAnovaDesign);
    EXPECT_EQ(TableOf(FullFactorial({3, 7, 2}, 5, equalInCells)).err, ErrAnovaDesign);
    const auto additive = [](int32_t a, int32_t b, int32_t, int32_t) {
        return 12345.625 * (a * 37 % 101) + 0.375 * (b * 53 % 97) + 1.0;
    };
    EXPECT_EQ(TableOf(FullFactorial({7, 11}, 1, additive)).err, ErrAnovaDesign);
    const auto constant = [](int32_t, int32_t, int32_t, int32_t) { return 0.1; };
    EXPECT_EQ(TableOf(FullFactorial({3, 3}, 2, constant)).err, ErrAnovaDesign);

    // Replicates that differ equally in all cells: there is an error but no interaction.
    const auto noInteraction = [&](int32_t a, int32_t b, int32_t c, int32_t k) {
        return additive(a, b, c, k) + k;
    };
    EXPECT_EQ(TableOf(FullFactorial({7, 11}, 2, noInteraction)).f(2), 0.0);
    EXPECT_EQ(TableOf(FullFactorial({7, 11}, 2, noInteraction)).column[P].at(2), 1.0);
    EXPECT_EQ(TableOf(FullFactorial({-7, 11}, 2, noInteraction)).err, ErrAnovaDesign);

    // MS(AB) + MS(AC) is below MS(ABC); the difference is a denominator only if B and C are random.
    const auto parity = [](int32_t a, int32_t b, int32_t c, int32_t k) {
        return ((a + b + c) % 2) * 8.0 + k + a;
    };
    EXPECT_EQ(TableOf(FullFactorial({2, -2, -2}, 2, parity)).err, ErrAnovaDesign);
    EXPECT_EQ(TableOf(FullFactorial({2, 2, 2}, 2, parity)).err, 0);
    // Data with thirds, which are rounded.
    const auto balanced = [](int32_t a, int32_t b, int32_t c, int32_t k) {
        const int32_t signs[] = {1, -2, 1};
        const double u = signs[a], v = signs[b], w = signs[c];
        return u * v * w + 0.5 * u * v + 0.5 * u * w + k + 1 / 3.0;
    };
    const Table fixed = TableOf(FullFactorial({3, 3, 3}, 2, balanced));
    ASSERT_EQ(fixed.err, 0);
    EXPECT_EQ(TableOf(FullFactorial({-3, -3, -3}, 2, balanced)).err, ErrAnovaDesign);
}

TEST(FactorialAnova, CodesComeInTheirOrder) {
    const auto value = [](int32_t a, int32_t b, int32_t c, int32_t k) {
        return a * 3 + b * 5 % 7 + c + k * (a + 2.0 * b + 1);
    };
    for (const int factors : {2, 3}) {
        SCOPED_TRACE(factors);
        const std::vector<int32_t> levels = {3, 2, 2};
        Crossed design = FullFactorial({levels.begin(), levels.begin() + factors}, 2, value);
        EXPECT_EQ(TableOf(design).err, 0);
        const int last = factors - 1;
        // From here on, each new fault takes precedence over all earlier ones.
        EXPECT_EQ(TableOf(design, 2.0).err, ErrBadSignificance);
        for (const double bad : {std::nan(""), std::numeric_limits<double>::infinity()}) {
            design.data.back().y = bad;
            EXPECT_EQ(TableOf(design, 2.0).err, ErrNaNInData);
        }
        design.data[0].level[0] = 1;
        EXPECT_EQ(TableOf(design, 2.0).err, ErrAnovaCellCount);
        design.data[1].level[last] = 77;
        EXPECT_EQ(TableOf(design, 2.0).err, ErrAnovaFactorEmpty) << "one label too many";
        for (Observation &observation : design.data)
            observation.level[last] = 5;
        EXPECT_EQ(TableOf(design, 2.0).err, ErrAnovaFactorEmpty) << "one too few";
        design.data.pop_back();
        EXPECT_EQ(TableOf(design, 2.0).err, ErrAnovaCountMismatch);
        design.levels[last] = std::numeric_limits<int32_t>::min();
        EXPECT_EQ(TableOf(design, 2.0).err, ErrAnovaCountMismatch);
        design.observations = 1;
        EXPECT_EQ(TableOf(design, 2.0).err, ErrAnovaNegativeSelector);
        design.observations = 0;
        EXPECT_EQ(TableOf(design, 2.0).err, ErrAnovaNoReplication);
        design.levels[0] = -1;
        EXPECT_EQ(TableOf(design, 2.0).err, ErrAnovaFewLevels);
        design.data.clear();
        EXPECT_EQ(TableOf(design, 2.0).err, ErrEmptyInput);
    }
    const DBLArray y({1, 2, 3, 4});
    const I32Array a({1, 2, 1, 2}), b({1, 2, 1});
    const DBLArray out[6] = {DBLArray{7}, DBLArray{7}, DBLArray{7},
                             DBLArray{7}, DBLArray{7}, DBLArray{7}};
    EXPECT_EQ(Anova2Way_head(y.handle(), a.handle(), b.handle(), 1, 2, 1, out[0].handle(),
                             out[1].handle(), out[2].handle(), out[3].handle(), out[4].handle(),
                             out[5].handle()),
              ErrSizeMismatch);
}

// A denominator that is nearly zero has almost no degrees of freedom, and no critical value that a
// double can represent.
TEST(FactorialAnova, NearlyNoDegreesOfFreedom) {
    double f = 0.0;
    for (double part = 0.5; part < 0.5625; part += 0x1p-10) {
        const auto value = [=](int32_t a, int32_t b, int32_t c, int32_t k) {
            const double u = a * 2 - 1, v = b * 2 - 1, w = c * 2 - 1;
            return u * v * w + part * u * v + 0.875 * u * w + 2 * v * w + k * 0.25 + u;
        };
        const Table table = TableOf(FullFactorial({2, -2, -2}, 2, value), 0.05);
        if (table.err == ErrAnovaDesign)
            continue;
        const double degrees = table.column[DenominatorDegrees].at(0);
        const double p = table.column[P].at(0);
        EXPECT_TRUE(degrees > 0.0 && degrees < 0.1);
        EXPECT_TRUE(p > 0.5 && p <= 1.0) << p << " with " << degrees;
        EXPECT_GT(table.column[Critical].at(0), 1e10);
        f = table.f(0);
    }
    EXPECT_GT(f, 0.0);
}

struct Contingency {
    double chiSquare, p;
    ErrorCode err;
};

Contingency ContingencyOf(int32_t rows, int32_t cols, const std::vector<int32_t> &cells,
                          decltype(&Contingency_head) test = Contingency_head) {
    const qx::test::Array2D<ElementType::I32> table(rows, cols);
    for (std::size_t i = 0; i < cells.size(); ++i)
        table.data()[i] = cells[i];
    Contingency c = {7, 7, 7};
    EXPECT_EQ(test(table.handle(), &c.chiSquare, &c.p, &c.err), 0);
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

// For two by two tables, with one degree of freedom, p is erfc(sqrt(chiSquare / 2)).
TEST(Contingency, TheRevisionKeepsSmallProbabilities) {
    const double eps = std::numeric_limits<double>::epsilon();
    const auto revised = [](const std::vector<int32_t> &cells) {
        return ContingencyOf(2, 2, cells, Contingency2026_head);
    };
    for (const int32_t count : {10, 100, 300}) {
        const Contingency c = revised({count, 0, 0, count});
        EXPECT_EQ(c.chiSquare, 2.0 * count);
        const double p = static_cast<double>(std::erfc(std::sqrt(static_cast<long double>(count))));
        EXPECT_NEAR(c.p, p, 4 * eps * p);
    }
    // Nearly independent large counts, where O - E cancels: n (a d - b c)^2 / products of sums.
    const Contingency close = revised({1000000007, 1000000009, 1000000021, 1000000022});
    const long double n = 4000000059.0L;
    const long double difference = 1000000007.0L * 1000000022.0L - 1000000009.0L * 1000000021.0L;
    const long double chiSquare =
        n * difference * difference / 2000000016.0L / 2000000043.0L / 2000000028.0L / 2000000031.0L;
    EXPECT_NEAR(close.chiSquare, static_cast<double>(chiSquare),
                4 * eps * static_cast<double>(chiSquare));
    const Contingency emptyRow = revised({0, 0, 3, 4});
    EXPECT_EQ(emptyRow.err, 0);
    EXPECT_TRUE(std::isnan(emptyRow.chiSquare) && std::isnan(emptyRow.p));
    EXPECT_EQ(revised({1, 2, -3, 4}).err, ErrTableNegativeSize);
}

} // namespace
} // namespace qx::test
