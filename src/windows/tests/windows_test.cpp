#include "qx/errors.h"
#include "qx/window_constants.h"
#include "qx/windows.h"
#include "tests/support/hostile_host.h"
#include "tests/support/recipe.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <fstream>
#include <functional>
#include <limits>
#include <numbers>
#include <sstream>
#include <string>
#include <vector>

namespace qx::test {
namespace {

const double nan = std::numeric_limits<double>::quiet_NaN();
typedef std::vector<double> Values;

// The window of an export: the result of applying it to ones.
Values WindowOf(int n, const std::function<ErrorCode(DBL1D)> &apply, ErrorCode expected = 0) {
    const DBLArray x(Values(static_cast<std::size_t>(n), 1.0));
    EXPECT_EQ(apply(x.handle()), expected);
    return x.values();
}

struct Row {
    int32_t selector;
    std::string form;
    double param;
    Values w;
};

std::vector<Row> ReferenceRows() {
    std::ifstream file(TestData("windows.dat"));
    std::vector<Row> rows;
    for (std::string line; std::getline(file, line);) {
        std::istringstream words(line);
        Row row;
        std::size_t n;
        words >> row.selector >> row.form >> row.param >> n;
        row.w.resize(n);
        for (double &value : row.w)
            words >> value;
        rows.push_back(row);
    }
    return rows;
}

double LargestDifference(const Values &a, const Values &b) {
    double largest = a.size() == b.size() ? 0.0 : 1e9;
    for (std::size_t i = 0; i < std::min(a.size(), b.size()); ++i)
        largest = std::max(largest, std::fabs(a[i] - b[i]));
    return largest;
}

TEST(Windows, EverySelectorAgreesWithItsFormula) {
    const std::vector<Row> rows = ReferenceRows();
    ASSERT_GT(rows.size(), 200U);
    for (const Row &row : rows) {
        SCOPED_TRACE(std::to_string(row.selector) + " " + row.form + " " +
                     std::to_string(row.param) + " " + std::to_string(row.w.size()));
        const int n = static_cast<int>(row.w.size());
        // The Bessel series of the Kaiser window stops at terms of 1e-8; the cosines of the
        // Dolph-Chebyshev window come from a recurrence whose error grows with the square of n.
        const double bound = row.selector == 60 ? 1e-8 : (row.selector == 61 ? 1e-11 : 2e-15);
        const bool isSymmetric = row.form == "symmetric";
        if (isSymmetric && row.selector == 30 && n == 2)
            continue; // the triangle of one sample is 0, see below
        const double decibels = 20.0 * std::log10(row.param);
        const double param = row.selector == 61 ? decibels : row.param;
        const auto all = [&](DBL1D x) {
            return AllWinH(x, row.selector, param, 0, isSymmetric ? 1 : 0);
        };
        if (!(isSymmetric && n == 2 && row.selector < 61)) {
            EXPECT_LT(LargestDifference(WindowOf(n, all), row.w), bound);
        }
        if (isSymmetric && n > 2) {
            const auto symmetric = [&](DBL1D x) { return SymmWinH(x, row.selector, row.param); };
            EXPECT_LT(LargestDifference(WindowOf(n, symmetric), row.w), bound);
        }
    }
}

// Compares one call of each family export with the dispatcher, real and complex.
TEST(Windows, FamilyExportsAgreeWithTheDispatcher) {
    typedef std::function<ErrorCode(DBL1D)> Real;
    typedef std::function<ErrorCode(CDB1D)> Complex;
    struct Pair {
        int32_t selector;
        double param;
        Real real;
        Complex complex;
    };
    const DBLArray hanning{0.5, 0.5};
    const std::vector<Pair> pairs{
        {60, 3.0, [](DBL1D x) { return KaiserH(x, 3.0); },
         [](CDB1D x) { return CxKaiserH(x, 3.0); }},
        {61, 40.0, [](DBL1D x) { return DolChebyWinH(x, 100.0, 0); },
         [](CDB1D x) { return CxDolChebyWinH(x, 100.0, 0); }},
        {62, 0.3, [](DBL1D x) { return GaussWinH(x, 0.3, 0); },
         [](CDB1D x) { return CxGaussWinH(x, 0.3, 0); }},
        {64, 30.0, [](DBL1D x) { return ForceWinH(x, 30.0); },
         [](CDB1D x) { return CxForceWinH(x, 30.0); }},
        {65, 0.01, [](DBL1D x) { return ExpWinH(x, 0.01); },
         [](CDB1D x) { return CxExpWinH(x, 0.01); }},
        {30, 0, [](DBL1D x) { return TriangleWinH(x); }, [](CDB1D x) { return CxTriangleWinH(x); }},
        {34, 0, [](DBL1D x) { return WelchWinH(x); }, [](CDB1D x) { return CxWelchWinH(x); }},
        {31, 0, [](DBL1D x) { return BartHannWinH(x); }, [](CDB1D x) { return CxBartHannWinH(x); }},
        {32, 0, [](DBL1D x) { return BohmanWinH(x); }, [](CDB1D x) { return CxBohmanWinH(x); }},
        {33, 0, [](DBL1D x) { return ParzenWinH(x); }, [](CDB1D x) { return CxParzenWinH(x); }},
        {12, 0.4, [](DBL1D x) { return CosTaperedH(x, 0.4); }, nullptr},
        {6, 0, [](DBL1D x) { return AllCosWinH(x, 6, 0); },
         [](CDB1D x) { return CxAllCosWinH(x, 6, 0); }},
        {1, 0, [&](DBL1D x) { return GenCosWinH(x, hanning.handle()); },
         [&](CDB1D x) { return CxGenCosWinH(x, hanning.handle()); }},
    };
    for (const Pair &pair : pairs)
        for (const int n : {2, 3, 16, 33}) {
            SCOPED_TRACE(std::to_string(pair.selector) + " " + std::to_string(n));
            const Values w =
                WindowOf(n, [&](DBL1D x) { return AllWinH(x, pair.selector, pair.param, 0, 0); });
            EXPECT_EQ(WindowOf(n, pair.real), w);
            if (pair.complex == nullptr)
                continue;
            CDBArray z(n);
            for (int i = 0; i < n; ++i)
                z.data()[i] = {1.0, -4.0};
            EXPECT_EQ(pair.complex(z.handle()), 0);
            for (int i = 0; i < n; ++i) {
                EXPECT_EQ(z[i].re, w[static_cast<std::size_t>(i)]);
                EXPECT_EQ(z[i].im, -4.0 * w[static_cast<std::size_t>(i)]);
            }
        }
}

TEST(Windows, TheRotationStaysAccurateOverAMillionSamples) {
    constexpr int n = 1000000;
    const Values w = WindowOf(n, [](DBL1D x) { return AllCosWinH(x, 8, 0); });
    const double a[] = {0.27105140069342415,   0.43329793923448606,  0.21812299954311062,
                        0.0659254463880309,    0.010811742098372268, 0.0007765848252250934,
                        1.3887217350903198e-05};
    long double worst = 0;
    for (int i = 0; i < n; i += 97) {
        long double sum = 0;
        for (int k = 0; k < 7; ++k)
            sum += (k % 2 == 0 ? 1 : -1) * static_cast<long double>(a[k]) *
                   std::cos(2 * std::numbers::pi_v<long double> * k * i / n);
        worst = std::max(worst, std::fabs(sum - w[static_cast<std::size_t>(i)]));
    }
    EXPECT_LT(worst, 1e-13) << "relative to the peak of 1";
}

// The rotation with any number of terms, which uses other code than the named windows.
TEST(Windows, ManyTermsRotateLikeTheNamedWindows) {
    constexpr int n = 1000000;
    const DBLArray coefs{0.27105140069342415,
                         0.43329793923448606,
                         0.21812299954311062,
                         0.0659254463880309,
                         0.010811742098372268,
                         0.0007765848252250934,
                         1.3887217350903198e-05,
                         0.0,
                         0.0};
    EXPECT_EQ(WindowOf(n, [&](DBL1D x) { return GenCosWinH(x, coefs.handle()); }),
              WindowOf(n, [](DBL1D x) { return AllCosWinH(x, 8, 0); }));
}

// The series stops after the first term of at most 1e-8, and in any case after 25 terms.
TEST(Windows, TheKaiserSeriesIsTruncatedAsDocumented) {
    const auto series = [](long double beta, int terms) {
        long double sum = 1, term = 1;
        for (int k = 1; k <= terms; ++k)
            sum += term *= beta * beta / (4.0L * k * k);
        return sum;
    };
    const auto edge = [](double beta) {
        return WindowOf(2, [=](DBL1D x) { return KaiserH(x, beta); })[0];
    };
    EXPECT_NEAR(edge(1.0) * static_cast<double>(series(1, 6)), 1.0, 4e-16);
    EXPECT_GT(static_cast<double>(series(1, 7) / series(1, 6)) - 1.0, 1e-12) << "visible";
    EXPECT_NEAR(edge(100.0) * static_cast<double>(series(100, 25)), 1.0, 1e-15);
}

// Overflow in an intermediate step of the formula is not a failure.
TEST(Windows, ParametersBeyondTheRangeOfDoubleGiveNaN) {
    const auto isNaN = [](double w) { return std::isnan(w); };
    const auto count = [&](const std::function<ErrorCode(DBL1D)> &apply) {
        const Values w = WindowOf(16, apply);
        return std::count_if(w.begin(), w.end(), isNaN);
    };
    for (const double sign : {1.0, -1.0}) {
        EXPECT_EQ(count([=](DBL1D x) { return KaiserH(x, sign * 1e7); }), 0);
        EXPECT_GT(count([=](DBL1D x) { return KaiserH(x, sign * 4e7); }), 0);
        EXPECT_GT(count([=](DBL1D x) { return AllWinH(x, 60, sign * 2e9, 0, 0); }), 0);
    }
    for (const int32_t symmetric : {0, 1}) {
        EXPECT_EQ(count([=](DBL1D x) { return DolChebyWinH(x, 1.3e154, symmetric); }), 0);
        EXPECT_EQ(count([=](DBL1D x) { return DolChebyWinH(x, 1.4e154, symmetric); }), 16);
    }
    EXPECT_EQ(count([](DBL1D x) { return AllWinH(x, 61, 3083.0, 0, 0); }), 16);
    EXPECT_EQ(count([](DBL1D x) { return GaussWinH(x, 4e-156, 0); }), 0);
    const Values gauss = WindowOf(16, [](DBL1D x) { return GaussWinH(x, 1e-160, 0); });
    EXPECT_TRUE(std::isnan(gauss[8]));
    EXPECT_EQ(gauss[7] + gauss[9], 0.0);
}

TEST(Windows, TapersAndCutsHaveTheirExactEnds) {
    const auto taper = [](int n, double ratio) {
        return WindowOf(n, [=](DBL1D x) { return CosTaperedH(x, ratio); });
    };
    const Values ones(10, 1.0);
    EXPECT_EQ(taper(10, 0.0), ones);
    EXPECT_EQ(taper(10, -1.0), ones);
    EXPECT_EQ(taper(10, nan), ones);
    EXPECT_EQ(taper(1, 0.5), Values{1.0});
    EXPECT_EQ(taper(10, 0.2), (Values{0, 1, 1, 1, 1, 1, 1, 1, 1, 0})) << "a taper of one sample";
    EXPECT_EQ(taper(10, 1.0), WindowOf(10, [](DBL1D x) { return AllCosWinH(x, 1, 0); }));
    const Values sines = taper(12, 0.5);
    for (int i = 0; i < 3; ++i) {
        const double s = std::sin(std::numbers::pi / 6 * i);
        EXPECT_NEAR(sines[static_cast<std::size_t>(i)], s * s, 1e-15);
        EXPECT_EQ(sines[static_cast<std::size_t>(i)], sines[static_cast<std::size_t>(11 - i)]);
    }
    CDBArray z(12);
    for (int i = 0; i < 12; ++i)
        z.data()[i] = {1.0, 2.0};
    EXPECT_EQ(CxCosTaperedH(z.handle(), 0.5), 0);
    for (int i = 0; i < 12; ++i)
        EXPECT_NEAR(z[i].im, 2.0 * sines[static_cast<std::size_t>(i)], 1e-15);
    // The complex form computes each phase separately, the real form accumulates the steps.
    constexpr int length = 1000, half = 450;
    const CDBArray fresh(std::vector<CDB>(length, CDB{1.0, 1.0}));
    EXPECT_EQ(CxCosTaperedH(fresh.handle(), 0.9), 0);
    const Values added = taper(length, 0.9);
    double step = std::numbers::pi / (2.0 * half);
    double phase = step;
    int differing = 0;
    for (int i = 1; i < half; ++i, phase += step) {
        const double s = std::sin(i * std::numbers::pi / (2.0 * half));
        const double t = std::sin(phase);
        EXPECT_EQ(fresh[i].re, s * s);
        EXPECT_EQ(added[static_cast<std::size_t>(i)], t * t);
        differing += s != t;
    }
    EXPECT_GT(differing, 0);

    const auto force = [](double percent) {
        const Values w = WindowOf(8, [=](DBL1D x) { return ForceWinH(x, percent); });
        return std::count(w.begin(), w.end(), 1.0);
    };
    EXPECT_EQ(force(50.0), 4);
    EXPECT_EQ(force(49.9), 3);
    EXPECT_EQ(force(100.0), 8);
    EXPECT_EQ(force(1e300), 8);
    EXPECT_EQ(force(0.0), 0);
    EXPECT_EQ(force(-1e300), 0);
    EXPECT_EQ(force(nan), 0);

    const Values decay = WindowOf(5, [](DBL1D x) { return ExpWinH(x, 0.0625); });
    for (int i = 0; i < 5; ++i)
        EXPECT_NEAR(decay[static_cast<std::size_t>(i)], std::pow(0.5, i), 1e-15);
    EXPECT_TRUE(std::isnan(WindowOf(3, [](DBL1D x) { return ExpWinH(x, nan); })[1]));
}

TEST(Windows, OneSampleAndNoneAndTheirCodes) {
    const auto expect = [](int n, const std::function<ErrorCode(DBL1D)> &apply, ErrorCode code,
                           const Values &left) { EXPECT_EQ(WindowOf(n, apply, code), left); };
    const DBLArray none(0);
    const DBLArray one{1.0};
    const DBLArray two{2.0};
    const auto cosines = [](const DBLArray &coefs) {
        return [&coefs](DBL1D x) { return GenCosWinH(x, coefs.handle()); };
    };
    expect(0, cosines(one), ErrEmptyInput, {});
    expect(1, cosines(none), 0, {1.0});
    expect(2, cosines(none), ErrEmptyInput, {});
    expect(3, cosines(one), 0, {1.0, 1.0, 1.0});
    expect(3, cosines(two), 0, {2.0, 2.0, 2.0});
    expect(3, [&](DBL1D x) { return ScaledGenCosWinH(x, two.handle()); }, 0, {1.0, 1.0, 1.0});
    expect(1, TriangleWinH, 0, {0.0});
    expect(1, WelchWinH, 0, {1.0});
    expect(2, WelchWinH, 0, {0.0, 1.0});
    expect(1, BohmanWinH, 0, {1.0});
    expect(1, BartHannWinH, 0, {1.0});
    expect(1, ParzenWinH, 0, {1.0});
    expect(2, BohmanWinH, 0, {0.0, 1.0});
    expect(2, BartHannWinH, 0, {0.0, 1.0});
    expect(1, [](DBL1D x) { return AllCosWinH(x, 1, 0); }, 0, {1.0});
    expect(1, [](DBL1D x) { return ExpWinH(x, 0.5); }, ErrFewerThanTwo, {});
    expect(1, [](DBL1D x) { return ForceWinH(x, 50.0); }, ErrFewerThanTwo, {});
    expect(4, [](DBL1D x) { return ExpWinH(x, 0.0); }, ErrFinalValueNotPositive, {});
    expect(2, [](DBL1D x) { return SymmWinH(x, 30, 0.0); }, 0, {0.0, 0.0});
    expect(2, [](DBL1D x) { return SymmWinH(x, 1, 0.0); }, 0, {1.0, 1.0});
    expect(1, [](DBL1D x) { return SymmWinH(x, 99, 0.0); }, 0, {1.0});
    expect(0, [](DBL1D x) { return AllWinH(x, 0, 0.0, 0, 0); }, 0, {});
    expect(0, [](DBL1D x) { return AllWinH(x, 0, 0.0, 0, 1); }, ErrEmptyInput, {});
}

TEST(Windows, SelectorsAreCheckedInEveryForm) {
    const auto code = [](int32_t selector, int32_t scaled, int32_t symmetric) {
        const DBLArray x{1.0, 1.0, 1.0};
        const ErrorCode status = AllWinH(x.handle(), selector, nan, scaled, symmetric);
        EXPECT_EQ(x.size(), status == 0 ? 3 : 0);
        return status;
    };
    for (int32_t selector = -1; selector < 70; ++selector) {
        const bool cosine = selector >= 0 && (selector < 10 || selector == 11);
        const bool shape = (selector >= 30 && selector <= 34) || (selector >= 60 && selector <= 62);
        const bool plainOnly = selector == 12 || selector == 64 || selector == 65;
        EXPECT_EQ(code(selector, 0, 0), cosine || shape || plainOnly ? 0 : ErrInvalidSelector);
        EXPECT_EQ(code(selector, 1, 0), cosine || shape ? 0 : ErrInvalidSelector) << selector;
        EXPECT_EQ(code(selector, 0, 1), cosine || shape ? 0 : ErrInvalidSelector) << selector;
        EXPECT_EQ(code(selector, 1, 1), ErrInvalidSelector);
    }
    // Defaults replace NaN, and negative numbers where these are meaningless.
    const auto all = [](int32_t selector, double param) {
        return WindowOf(16, [=](DBL1D x) { return AllWinH(x, selector, param, 0, 0); });
    };
    for (const auto &[selector, standard] : std::vector<std::pair<int32_t, double>>{
             {12, 0.2}, {60, 0.0}, {61, 60.0}, {62, 0.2}, {64, 50.0}, {65, 0.1}})
        EXPECT_EQ(all(selector, nan), all(selector, standard));
    EXPECT_EQ(all(61, -3.0), all(61, 60.0));
    EXPECT_EQ(all(62, -3.0), all(62, 0.2));
    EXPECT_EQ(WindowOf(16, [](DBL1D x) { return GaussWinH(x, -1.0, 0); }), all(62, 0.2));
}

TEST(Windows, AScaledWindowHasACoherentGainOfOne) {
    for (const int32_t selector : {0, 1, 5, 8, 11, 30, 31, 32, 33, 34, 60, 61, 62}) {
        const double param = selector == 61 ? 100.0 : (selector == 60 ? 5.0 : 0.2);
        const DBLArray x(Values(64, 1.0));
        WindowConstants constants = {0, 0};
        EXPECT_EQ(ScaledWinH(x.handle(), selector, param, &constants), 0);
        double sum = 0, squares = 0;
        for (const double w : x.values()) {
            sum += w;
            squares += w * w;
        }
        EXPECT_NEAR(sum / 64, 1.0, 2.2e-15) << selector;
        EXPECT_NEAR(constants.enbw, 64 * squares / (sum * sum), 3e-6) << selector;
        WindowConstants named = {0, 0};
        EXPECT_EQ(WinConstByNameH(64, selector, param, &named), 0);
        EXPECT_EQ(named.enbw, constants.enbw);
        EXPECT_EQ(named.cg, constants.cg);
    }
    const DBLArray none(0);
    WindowConstants constants = {0, 0};
    EXPECT_EQ(ScaledWinH(none.handle(), 1, 0, &constants), 0) << "stored constants need no data";
    EXPECT_EQ(constants.enbw, 1.5);
    EXPECT_EQ(ScaledWinH(none.handle(), 30, 0, &constants), ErrEmptyInput);
    EXPECT_TRUE(std::isnan(constants.enbw) && std::isnan(constants.cg));
    const DBLArray x{1.0, 1.0};
    constants = {0, 0};
    EXPECT_EQ(ScaledWinH(x.handle(), 64, 0, &constants), ErrInvalidSelector);
    EXPECT_TRUE(std::isnan(constants.cg));
    const DBLArray negative(0);
    (*negative.handle())->dimSize = -1;
    constants = {7, 7};
    EXPECT_EQ(ScaledWinH(negative.handle(), 99, 0, &constants), ErrNegativeDimension);
    EXPECT_EQ(constants.enbw, 7.0) << "the constants are not changed";
    EXPECT_EQ(negative.size(), 0);
}

TEST(Windows, TheOldestExportsReportThroughTheirArgument) {
    const DBL beta = 2.0, percent = 40.0, finalValue = 0.3, bad = -1.0;
    ErrorCode err = 7;
    const auto same = [&](const std::function<int32_t(DBL1D)> &old,
                          const std::function<ErrorCode(DBL1D)> &revised) {
        EXPECT_EQ(WindowOf(9, old), WindowOf(9, revised));
        EXPECT_EQ(err, 0);
        err = 7;
    };
    same([&](DBL1D x) { return Kaiser_Bessel(x, &beta, &err); },
         [](DBL1D x) { return KaiserH(x, 2.0); });
    same([&](DBL1D x) { return ForceWindCIN(x, &percent, &err); },
         [](DBL1D x) { return ForceWinH(x, 40.0); });
    same([&](DBL1D x) { return ExpWindCIN(x, &finalValue, &err); },
         [](DBL1D x) { return ExpWinH(x, 0.3); });
    same([&](DBL1D x) { return TriangleWin(x, &err); }, TriangleWinH);
    same([&](DBL1D x) { return CosTapered(x, &err); }, [](DBL1D x) { return CosTaperedH(x, 0.2); });
    const DBLArray x{1.0, 1.0};
    EXPECT_EQ(ExpWindCIN(x.handle(), &bad, &err), 0);
    EXPECT_EQ(err, ErrFinalValueNotPositive);
    EXPECT_EQ(x.size(), 0);
}

} // namespace
} // namespace qx::test
