#include "linalg/functions/functions.h"
#include "linalg/tests/host_matrix.h"
#include "linalg/tests/matrices.h"
#include "linalg/tests/residuals.h"
#include "qx/qx.h"
#include "tests/support/test_data.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <complex>
#include <cstdlib>
#include <cstring>
#include <fstream>
#include <limits>
#include <string>
#include <vector>

namespace qx::test {
namespace {

struct Case {
    std::string name;
    int n;
    std::vector<CDB> a, exp, log, root;
    bool isReal() const {
        for (const CDB &x : a)
            if (x.im != 0.0)
                return false;
        return true;
    }
    std::vector<double> real() const {
        std::vector<double> result;
        for (const CDB &x : a)
            result.push_back(x.re);
        return result;
    }
};

std::vector<Case> ReadCases(const char *fileName, bool withExponentials) {
    std::ifstream file(TestData(fileName));
    std::vector<Case> cases;
    Case next;
    while (file >> next.name >> next.n) {
        for (std::vector<CDB> *matrix : {&next.a, &next.exp, &next.log, &next.root}) {
            matrix->clear();
            if (matrix == &next.exp && !withExponentials)
                continue;
            std::string re, im;
            for (int i = 0; i < next.n * next.n && file >> re >> im; ++i)
                matrix->push_back(
                    {std::strtod(re.c_str(), nullptr), std::strtod(im.c_str(), nullptr)});
        }
        cases.push_back(next);
    }
    return cases;
}

TEST(MatrixFunctions, AgreeWithSixtyDigits) {
    const std::vector<Case> cases = ReadCases("matrix_functions.dat", true);
    ASSERT_GE(cases.size(), 10U);
    for (const Case &c : cases) {
        SCOPED_TRACE(c.name);
        ErrorCode err;
        CDB2DArray exp(c.n, c.n, c.a), log(c.n, c.n, c.a), root(c.n, c.n, c.a);
        CxMatrixExp_head(exp.handle(), &err);
        EXPECT_EQ(err, 0);
        EXPECT_LT(RelativeDeviation(Contents(exp), Exact(c.n, c.n, c.exp.data())), 2e-9);
        CxMatrixLn_head(log.handle(), &err);
        EXPECT_GE(err, 0);
        EXPECT_LT(RelativeDeviation(Contents(log), Exact(c.n, c.n, c.log.data())), 1e-8);
        CDB2DArray revision;
        EXPECT_EQ(CxMatrixExp2026_head(CDB2DArray(c.n, c.n, c.a).handle(), revision.handle()), 0);
        // Rounding errors are multiplied by the condition number, which grows with the norm.
        const double condition = static_cast<double>(Exact(c.n, c.n, c.a.data()).norm()) + 10;
        EXPECT_LT(RelativeDeviation(Contents(revision), Exact(c.n, c.n, c.exp.data())),
                  1e-15 * condition);
        const bool isRefined = err == 0;
        CxMatrixExp_head(log.handle(), &err);
        EXPECT_LT(RelativeDeviation(Contents(log), Exact(c.n, c.n, c.a.data())),
                  isRefined ? 1e-11 : 1e-9);
        CxMatrixSqrt_head(root.handle(), &err);
        EXPECT_EQ(err, 0);
        EXPECT_LT(RelativeDeviation(Contents(root), Exact(c.n, c.n, c.root.data())), 1e-14);
        if (!c.isReal())
            continue;
        DBL2DArray a(c.n, c.n, c.real()), realExp = a, realRoot = a;
        MatrixExp_head(realExp.handle(), &err);
        EXPECT_LT(RelativeDeviation(Contents(realExp), Exact(c.n, c.n, c.exp.data())), 2e-9);
        DBL2DArray realRevision;
        EXPECT_EQ(MatrixExp2026_head(a.handle(), realRevision.handle()), 0);
        EXPECT_LT(RelativeDeviation(Contents(realRevision), Exact(c.n, c.n, c.exp.data())),
                  1e-15 * condition);
        MatrixLn_head(a.handle(), log.handle(), &err);
        EXPECT_LT(RelativeDeviation(Contents(log), Exact(c.n, c.n, c.log.data())), 1e-8);
        EXPECT_EQ(MatrixSqrtH(a.handle(), root.handle()), 0);
        EXPECT_LT(RelativeDeviation(Contents(root), Exact(c.n, c.n, c.root.data())), 1e-14);
        MatrixSqrt_head(realRoot.handle(), &err);
        EXPECT_EQ(err, 0);
        for (int i = 0; i < c.n * c.n; ++i)
            EXPECT_EQ(realRoot[i], root[i].re);
    }
}

// Elements divided by 2^exponent, so that their squares neither overflow nor underflow.
Exact AwayFromEnds(int n, const std::vector<CDB> &elements) {
    int exponent = 0;
    double largest = 0.0;
    for (const CDB &x : elements)
        largest = std::max({largest, std::fabs(x.re), std::fabs(x.im)});
    std::frexp(largest, &exponent);
    return Exact(n, n, Scaled(elements, -exponent / 2).data());
}

void ExpectSame(const CDB2DArray &a, const CDB2DArray &b) {
    ASSERT_EQ(a.values().size(), b.values().size());
    EXPECT_EQ(std::memcmp(a.values().data(), b.values().data(), a.values().size() * sizeof(CDB)),
              0);
}

TEST(MatrixFunctions, OfTheRevisionsAgreeWithReferences) {
    std::vector<Case> cases = ReadCases("hard_matrix_functions.dat", false);
    ASSERT_EQ(cases.size(), 11U);
    for (const Case &c : ReadCases("matrix_functions.dat", true))
        cases.push_back(c);
    for (const Case &c : cases) {
        SCOPED_TRACE(c.name);
        const Exact log(c.n, c.n, c.log.data());
        CDB2DArray out, ofReal;
        EXPECT_EQ(CxMatrixLn2026_head(CDB2DArray(c.n, c.n, c.a).handle(), out.handle()), 0);
        EXPECT_LT(RelativeDeviation(Contents(out), log), 2e-13);
        if (c.isReal()) {
            EXPECT_EQ(MatrixLn2026_head(DBL2DArray(c.n, c.n, c.real()).handle(), ofReal.handle()),
                      0);
            ExpectSame(ofReal, out);
        }
        EXPECT_EQ(CxMatrixSqrt2026_head(CDB2DArray(c.n, c.n, c.a).handle(), out.handle()), 0);
        EXPECT_LT(RelativeDeviation(AwayFromEnds(c.n, out.values()), AwayFromEnds(c.n, c.root)),
                  1e-13);
        if (c.isReal()) {
            EXPECT_EQ(MatrixSqrt2026_head(DBL2DArray(c.n, c.n, c.real()).handle(), ofReal.handle()),
                      0);
            ExpectSame(ofReal, out);
        }
    }
}

// The square of the root and the exponential of the logarithm give a again. Covers the recursive
// halves and every degree and number of square roots.
template <class Elements, class Log, class Root>
void ExpectInverted(const Elements &elements, int n, Log log, Root root) {
    const auto a = Matrix(n, n, elements);
    CDB2DArray found, back;
    ASSERT_EQ(root(a.handle(), found.handle()), 0);
    const Exact r = Contents(found), exact(n, n, elements.data());
    const long double unit = n * 0x1p-52L;
    EXPECT_LT((r * r - exact).norm(), 4 * unit * r.norm() * r.norm());
    ASSERT_EQ(log(a.handle(), found.handle()), 0);
    const long double condition = 10 + Contents(found).norm();
    ASSERT_EQ(CxMatrixExp2026_head(found.handle(), back.handle()), 0);
    EXPECT_LT((Contents(back) - exact).norm(), 8 * unit * condition * exact.norm());
}
TEST(MatrixFunctions, OfTheRevisionsAreInvertedAtHigherOrders) {
    for (const int n : {1, 2, 4, 16, 17, 33, 70})
        for (const double shift : {0.0, 0.5, 2.0, 100.0}) {
            SCOPED_TRACE(testing::Message() << "order " << n << ", shift " << shift);
            auto a = qx::test::Reals(n * n, 5);
            auto z = qx::test::Complexes(n * n, 6);
            for (int i = 0; i < n; ++i) {
                a[i * (n + 1)] += shift;
                z[i * (n + 1)].im += shift;
            }
            ExpectInverted(a, n, MatrixLn2026_head, MatrixSqrt2026_head);
            ExpectInverted(z, n, CxMatrixLn2026_head, CxMatrixSqrt2026_head);
            // Positive definite: all eigenvalues are real, and only real arithmetic is used.
            for (int i = 0; i < n; ++i)
                for (int j = 0; j <= i; ++j)
                    a[i * n + j] = a[j * n + i] += i == j ? n : 0.0;
            ExpectInverted(a, n, MatrixLn2026_head, MatrixSqrt2026_head);
        }
}

TEST(MatrixFunctions, OfTheRevisionsOnTheCutAndWithoutRoot) {
    CDB2DArray out;
    const double pi = 0x1.921fb54442d18p+1;
    for (const double beside : {0.0, -0.0, 1.0}) {
        EXPECT_EQ(MatrixLn2026_head(DBL2DArray(2, 2, {-1, beside, 0, -4}).handle(), out.handle()),
                  0);
        EXPECT_EQ(out[0].im, pi);
        EXPECT_EQ(out[3].im, pi);
        EXPECT_DOUBLE_EQ(out[3].re, std::log(4.0));
        EXPECT_NEAR(out[1].re, -beside * std::log(4.0) / 3, 1e-16);
        EXPECT_EQ(CxMatrixSqrt2026_head(
                      CDB2DArray(2, 2, {{-1, -0.0}, {beside, 0}, {0, 0}, {-4, -0.0}}).handle(),
                      out.handle()),
                  0);
        EXPECT_EQ(out[0].im, 1.0);
        EXPECT_EQ(out[3].im, 2.0);
        EXPECT_DOUBLE_EQ(out[1].im, -beside / 3);
    }
    // In a triangular matrix, an eigenvalue slightly below the cut is not on it.
    EXPECT_EQ(CxMatrixLn2026_head(CDB2DArray(2, 2, {{-1, -1e-30}, {1, 0}, {0, 0}, {2, 0}}).handle(),
                                  out.handle()),
              0);
    EXPECT_EQ(out[0].im, -pi);
    // With 1 between two zero eigenvalues there is no square root; with 0 between them there is
    // one.
    for (const double between : {0.0, 1.0}) {
        const DBL2DArray a(3, 3, {4, 0, 2, 0, 0, between, 0, 0, 0});
        EXPECT_EQ(MatrixSqrt2026_head(a.handle(), out.handle()),
                  between == 0.0 ? 0 : ErrDegenerateValue);
        EXPECT_EQ(out.rows(), between == 0.0 ? 3 : 0);
        EXPECT_EQ(MatrixLn2026_head(a.handle(), out.handle()), ErrDegenerateValue);
    }
    // Rank 1, with rounding errors as the other eigenvalues.
    for (const int n : {2, 7, 20}) {
        const std::vector<double> ones(n * n, 1.0), expected(n * n, 1.0 / std::sqrt(n));
        EXPECT_EQ(MatrixSqrt2026_head(DBL2DArray(n, n, ones).handle(), out.handle()), 0);
        EXPECT_LT(RelativeDeviation(Contents(out), Exact(n, n, expected.data())), 1e-7) << n;
    }
    // Nearly singular: eigenvalues +-1e-8.
    EXPECT_EQ(
        MatrixSqrt2026_head(DBL2DArray(2, 2, {1e-18, 1, 1e-18, 1e-18}).handle(), out.handle()),
        WarnLowAccuracy);
    EXPECT_EQ(MatrixLn2026_head(DBL2DArray(2, 2, {1, 1, 1, 1 + 0x1p-52}).handle(), out.handle()),
              WarnLowAccuracy);
}

TEST(MatrixExponential, TakesADiagonalElementByElement) {
    ErrorCode err;
    const DBL2DArray a(2, 2, {1.0, 0.0, 0.0, -2.0}), zero(3, 3);
    MatrixExp_head(a.handle(), &err);
    EXPECT_EQ(a.values(), (std::vector<double>{std::exp(1.0), 0.0, 0.0, std::exp(-2.0)}));
    MatrixExp_head(zero.handle(), &err);
    EXPECT_EQ(zero.values(), (std::vector<double>{1, 0, 0, 0, 1, 0, 0, 0, 1}));
    const CDB2DArray z(1, 1, {{0.0, 3.0}});
    CxMatrixExp_head(z.handle(), &err);
    EXPECT_NEAR(z[0].re, std::cos(3.0), 1e-16);
    EXPECT_NEAR(z[0].im, std::sin(3.0), 1e-16);
}
// exp of (x, y; 0, z) has y (exp(x) - exp(z)) / (x - z) above its diagonal, however large y is.
// Such matrices would be divided by up to 2^1024, which is out of range.
TEST(MatrixExponential, OfTheRevisionLosesNothingToOneLargeElement) {
    for (const double large : {1.0, 1e6, 1e100, 1e290, 1e308}) {
        SCOPED_TRACE(large);
        DBL2DArray out;
        EXPECT_EQ(MatrixExp2026_head(DBL2DArray(2, 2, {1, large, 0, -1}).handle(), out.handle()),
                  0);
        EXPECT_NEAR(out[0] / std::exp(1.0), 1.0, 1e-15);
        EXPECT_NEAR(out[1] / large / std::sinh(1.0), 1.0, 2e-15);
        EXPECT_EQ(out[2], 0.0);
        EXPECT_NEAR(out[3] / std::exp(-1.0), 1.0, 1e-15);
        EXPECT_EQ(MatrixExp2026_head(DBL2DArray(3, 3, {0, large, 0, 0, 0, 1, 0, 0, 0}).handle(),
                                     out.handle()),
                  0);
        EXPECT_EQ(out.values(), (std::vector<double>{1, large, large / 2, 0, 1, 1, 0, 0, 1}));
    }
    // Rotations by large and small angles, and elements that vanish in rounding.
    DBL2DArray out;
    for (const double angle : {1e-300, 1e-3, 0.5, 2.0, 100.0, 1e6}) {
        EXPECT_EQ(
            MatrixExp2026_head(DBL2DArray(2, 2, {0, -angle, angle, 0}).handle(), out.handle()), 0);
        EXPECT_NEAR(out[0], std::cos(angle), 4e-16 * (angle + 4));
        EXPECT_NEAR(out[2], std::sin(angle), 4e-16 * (angle + 4) * std::min(angle, 1.0));
    }
    EXPECT_EQ(MatrixExp2026_head(DBL2DArray(2, 2, {-1e300, 1, 1, -1e300}).handle(), out.handle()),
              0);
    EXPECT_EQ(out.values(), std::vector<double>(4, 0.0));
}

// Elements of any size for which the result is representable; similarity with a diagonal matrix
// transforms these matrices to elements near 1.
TEST(MatrixExponential, OfTheRevisionTakesElementsOfAnySize) {
    const auto expectExponential = [](const std::vector<double> &a,
                                      const std::vector<double> &expected) {
        const int n = expected.size() == 4 ? 2 : 3;
        const auto expectNear = [](double value, double wanted) {
            if (std::isinf(wanted) || wanted == 0.0)
                EXPECT_EQ(value, wanted);
            else
                EXPECT_NEAR(value / wanted, 1.0, 2e-15);
        };
        DBL2DArray out;
        EXPECT_EQ(MatrixExp2026_head(DBL2DArray(n, n, a).handle(), out.handle()), 0);
        // With D = diag(1, i, 1), D^-1 a D is complex, and so is the exponential.
        std::vector<CDB> turned;
        const auto turns = [n](std::size_t k) {
            return (k / n == 1) != (k % n == 1) ? (k / n == 1 ? -1 : 1) : 0;
        };
        for (std::size_t k = 0; k < a.size(); ++k)
            turned.push_back(turns(k) ? CDB{0, turns(k) * a[k]} : CDB{a[k], 0});
        CDB2DArray complexOut;
        EXPECT_EQ(CxMatrixExp2026_head(CDB2DArray(n, n, turned).handle(), complexOut.handle()), 0);
        for (std::size_t k = 0; k < a.size(); ++k) {
            SCOPED_TRACE(testing::Message() << "element " << k << " of the exponential of "
                                            << testing::PrintToString(a));
            expectNear(out[k], expected[k]);
            const CDB z = complexOut[k];
            if (std::isfinite(expected[k]))
                expectNear(turns(k) ? turns(k) * z.im : z.re, expected[k]);
        }
    };
    const double e = std::exp(1.0);
    for (const double x : {1e150, 1e200, 1e300, 1.7e308}) {
        expectExponential({0, x, 0, 0}, {1, x, 0, 1});
        expectExponential({0, 0, -x, 0}, {1, 0, -x, 1});
        expectExponential({0, x, x, 0, 0, x, 0, 0, 0}, {1, x, x * x / 2 + x, 0, 1, x, 0, 0, 1});
        expectExponential({-1, 0, 0, 0, 0, x, 0, 0, 0}, {1 / e, 0, 0, 0, 1, x, 0, 0, 1});
        expectExponential({1, x, 0, 1}, {e, e * x, 0, e});
        expectExponential({1, x, 0, -1}, {e, std::sinh(1.0) * x, 0, 1 / e});
        expectExponential({0, x, -1 / x, 0},
                          {std::cos(1.0), std::sin(1.0) * x, -std::sin(1.0) / x, std::cos(1.0)});
        expectExponential({x, x, x, x}, std::vector<double>(4, HUGE_VAL));
        expectExponential({-x, x, 0, -x}, std::vector<double>(4, 0.0));
    }
}

// The sixth power is 0, but in computing the eighth, products overflow that would cancel: the
// estimate of its norm is infinite and gives no number of squarings. Sanitizers detect the invalid
// conversion.
TEST(MatrixExponential, OfTheRevisionTerminatesWherePowersCancel) {
    std::vector<double> a(64);
    for (int i = 0; i < 8; ++i) {
        a[8 * i] = -0x1p140;
        if (i < 3)
            a[8 * i + i + 1] = 0x1p140;
        for (int j = 4; i >= 3 && j < 8; ++j)
            a[8 * i + j] = std::vector<double>{0x1p141, -0x1p141, 0x1p141, -0x1p140}[j - 4];
    }
    DBL2DArray out;
    EXPECT_EQ(MatrixExp2026_head(DBL2DArray(8, 8, a).handle(), out.handle()), 0);
    EXPECT_EQ(out.rows(), 8);
}

TEST(MatrixExponential, OfTheLargestNormsIsInfiniteOrZero) {
    ErrorCode err;
    for (const double sign : {1.0, -1.0}) {
        const std::vector<double> elements = {sign * 1.7e308, 1.0, 1.0, sign * 1.6e308};
        const DBL2DArray a(2, 2, elements);
        const CDB2DArray z(2, 2, {{elements[0], 0}, {1, 0}, {1, 0}, {elements[3], 0}});
        MatrixExp_head(a.handle(), &err);
        EXPECT_EQ(err, 0);
        CxMatrixExp_head(z.handle(), &err);
        EXPECT_EQ(err, 0);
        for (int i = 0; i < 4; ++i) {
            EXPECT_EQ(a[i], sign > 0 ? HUGE_VAL : 0.0) << sign;
            EXPECT_EQ(std::isfinite(z[i].re), sign < 0);
            EXPECT_NE(z[i].re, 1.0);
        }
    }
    // The norm itself overflows.
    const DBL2DArray a(2, 2, {1.7e308, 1e308, 1.0, 0.0});
    const CDB2DArray z(2, 2, {{1.7e308, 1e308}, {1, 0}, {0, 0}, {0, 0}});
    MatrixExp_head(a.handle(), &err);
    EXPECT_EQ(err, ErrNonFiniteInput);
    EXPECT_EQ(a.rows(), 0);
    CxMatrixExp_head(z.handle(), &err);
    EXPECT_EQ(err, ErrNonFiniteInput);
}
TEST(MatrixExponential, ChoosesTheDegreeByItsBound) {
    // The bound for each degree, from its definition with factorials.
    const auto bound = [](int q) {
        const long double e = std::exp2(3.0L - 2 * q) * std::tgamma(q + 1.0L) *
                              std::tgamma(q + 1.0L) /
                              (std::tgamma(2 * q + 1.0L) * std::tgamma(2 * q + 2.0L));
        return e * std::exp(e);
    };
    for (const double norm : {0.01, 0.5, 1.0, 3.0, 20.0, 200.0}) {
        const int q = qx::PadeDegree(1e-8, norm);
        const long double target = 1e-8L / (std::exp(static_cast<long double>(norm)) * norm);
        EXPECT_LE(bound(q), target * (1 + 1e-12L)) << norm;
        if (q > 1) {
            EXPECT_GT(bound(q - 1), target * (1 - 1e-12L)) << norm;
        }
    }
    EXPECT_LT(qx::PadeDegree(1e-8, 1e300), 200);
}

TEST(MatrixLogarithm, OfSingularAndDefectiveMatrices) {
    ErrorCode err;
    const CDB2DArray nilpotent(2, 2, {{0, 0}, {1, 0}, {0, 0}, {0, 0}});
    CxMatrixLn_head(nilpotent.handle(), &err);
    EXPECT_EQ(err, ErrDegenerateValue);
    EXPECT_EQ(nilpotent.rows(), 0);
    const CDB2DArray zero(1, 1, {{0, 0}});
    CxMatrixLn_head(zero.handle(), &err);
    EXPECT_EQ(err, ErrDegenerateValue);
    // log of (1 1; 0 1) is (0 1; 0 0).
    CDB2DArray jordan(2, 2, {{1, 0}, {1, 0}, {0, 0}, {1, 0}}), again = jordan;
    CxMatrixLn_head(jordan.handle(), &err);
    EXPECT_GE(err, 0);
    const std::vector<CDB> expected = {{0, 0}, {1, 0}, {0, 0}, {0, 0}};
    EXPECT_LT(RelativeDeviation(Contents(jordan), Exact(2, 2, expected.data())), 1e-9);
    CxMatrixLn_head(again.handle(), &err);
    for (int i = 0; i < 4; ++i)
        EXPECT_EQ(again[i].re, jordan[i].re);
}

TEST(MatrixSquareRoot, OfNegativeAndVanishingEigenvalues) {
    ErrorCode err;
    const DBL2DArray a(2, 2, {-4.0, 0.0, 0.0, 9.0});
    CDB2DArray root;
    EXPECT_EQ(MatrixSqrtH(a.handle(), root.handle()), 0);
    EXPECT_NEAR(root[0].im, 2.0, 1e-15);
    MatrixSqrt_head(a.handle(), &err);
    EXPECT_EQ(err, 0);
    EXPECT_NEAR(a[0], 0.0, 1e-15);
    EXPECT_NEAR(a[3], 3.0, 1e-15);
    EXPECT_EQ(MatrixSqrtH(DBL2DArray(3, 3).handle(), root.handle()), WarnLowAccuracy);
    EXPECT_EQ(root.rows(), 3);
    EXPECT_EQ(MatrixSqrtH(DBL2DArray(2, 2, {0, 1, 0, 0}).handle(), root.handle()), WarnLowAccuracy)
        << "it has no square root";
    EXPECT_EQ(root.rows(), 2);
    EXPECT_EQ(MatrixSqrtH(DBL2DArray(0, 2).handle(), root.handle()), ErrNotSquare);
    EXPECT_EQ(MatrixSqrtH(DBL2DArray(0, 0).handle(), root.handle()), ErrEmptyInput);
}

TEST(MatrixSquareRoot, AtTheEndOfTheRange) {
    ErrorCode err;
    // The modulus of the eigenvalues overflows, but their parts do not.
    const double re = 1.6e308, im = 1.7e308;
    const DBL2DArray rotation(2, 2, {re, im, -im, re}), a(2, 2, {im, re, re, im});
    MatrixSqrt_head(rotation.handle(), &err);
    EXPECT_EQ(err, 0);
    const auto root = std::sqrt(std::complex<long double>(re, im));
    EXPECT_NEAR(rotation[0] / static_cast<double>(root.real()), 1.0, 4e-15);
    EXPECT_NEAR(rotation[1] / static_cast<double>(root.imag()), 1.0, 4e-15);
    MatrixSqrt_head(a.handle(), &err); // an eigenvalue of 3.3e308
    EXPECT_EQ(err, ErrNonFiniteInput);
    EXPECT_EQ(a.rows(), 0);
}

TEST(MatrixPower, IsRepeatedMultiplication) {
    for (const int n : {1, 3, 12}) {
        const std::vector<double> elements = RealMatrix(MatrixKinds()[0], n, n);
        Exact expected = Exact::Identity(n);
        for (int power = 0; power <= 13; ++power) {
            const DBL2DArray a(n, n, elements);
            ASSERT_EQ(MatrixPower_head(a.handle(), power), 0);
            EXPECT_LT(Deviation(Contents(a), expected), 4.0 * (power + 1)) << power;
            expected = expected * Exact(n, n, elements.data());
        }
    }
}
TEST(MatrixPower, OfANegativeExponentIsAPowerOfThePseudoInverse) {
    const DBL2DArray singular(2, 2, {2.0, 2.0, 2.0, 2.0}), extreme(1, 1, {1.0});
    EXPECT_EQ(MatrixPower_head(singular.handle(), -2), 0);
    for (int i = 0; i < 4; ++i)
        EXPECT_NEAR(singular[i], 0.03125, 1e-16);
    EXPECT_EQ(MatrixPower_head(extreme.handle(), std::numeric_limits<int32_t>::min()), 0);
    EXPECT_EQ(extreme[0], 1.0);
}

template <class Elements, class Export>
void ExpectPowers(const Elements &elements, int n, int scale, Export raise) {
    const auto a = Matrix(n, n, Scaled(elements, scale));
    const Exact one = Exact(n, n, elements.data());
    Exact expected = Exact::Identity(n);
    auto out = Matrix(0, 0, Elements());
    for (int power = 0; power <= 6; ++power) {
        SCOPED_TRACE(testing::Message() << "power " << power << ", order " << n);
        ASSERT_EQ(raise(a.handle(), power, out.handle()), 0);
        EXPECT_LT(Deviation(Exact(n, n, Scaled(out.values(), -power * scale).data()), expected),
                  4.0 * (power + 1));
        ASSERT_EQ(raise(a.handle(), -power, out.handle()), 0);
        const Exact inverse(n, n, Scaled(out.values(), power * scale).data());
        EXPECT_LT((inverse * expected - Exact::Identity(n)).norm(),
                  8 * (power + 1) * n * 0x1p-52L * inverse.norm() * expected.norm());
        expected = expected * one;
    }
}
TEST(MatrixPower, OfTheRevisionIsAPowerOfTheInverseAtAnySize) {
    for (const int n : {1, 3, 12})
        for (const int scale : {-150, 0, 150}) {
            const auto &kind = MatrixKinds()[0];
            ExpectPowers(RealMatrix(kind, n, n), n, scale, MatrixPower2026_head);
            ExpectPowers(ComplexMatrix(kind, n, n), n, scale, CxMatrixPower2026_head);
        }
    DBL2DArray out;
    const DBL2DArray singular(2, 2, {2, 2, 2, 2}), nearly(2, 2, {1, 1, 1, 1 + 0x1p-52});
    EXPECT_EQ(MatrixPower2026_head(singular.handle(), -1, out.handle()), ErrSingularMatrix);
    EXPECT_EQ(out.rows(), 0);
    EXPECT_EQ(MatrixPower2026_head(nearly.handle(), -1, out.handle()), WarnLowAccuracy);
    EXPECT_EQ(out[3], 0x1p52);
    EXPECT_EQ(MatrixPower2026_head(singular.handle(), 0, out.handle()), 0);
    EXPECT_EQ(out.values(), (std::vector<double>{1, 0, 0, 1}));
    EXPECT_EQ(MatrixPower2026_head(DBL2DArray(1, 1, {-1.0}).handle(),
                                   std::numeric_limits<int32_t>::min(), out.handle()),
              0);
    EXPECT_EQ(out[0], 1.0);
}

template <class Elements, class Export>
void ExpectPseudoInverted(const Elements &elements, int m, int n, Export invert) {
    auto a = Matrix(m, n, elements);
    const double tolerance = -1.0;
    ErrorCode err;
    invert(a.handle(), &tolerance, &err);
    ASSERT_EQ(err, 0);
    ASSERT_EQ(a.rows(), n);
    ASSERT_EQ(a.cols(), m);
    ExpectPseudoInverse(Exact(m, n, elements.data()), Contents(a));
}
TEST(PseudoInverse, MeetsItsFourConditions) {
    for (const auto &[m, n] : {std::pair{1, 1}, {4, 4}, {7, 3}, {3, 7}, {20, 12}})
        for (const int kind : {0, 2, 4, 10}) { // random, of rank 1, of rank 2, Frank
            SCOPED_TRACE(testing::Message() << m << " by " << n << ' ' << MatrixKinds()[kind].name);
            ExpectPseudoInverted(RealMatrix(MatrixKinds()[kind], m, n), m, n, PseudoInverse_head);
            ExpectPseudoInverted(ComplexMatrix(MatrixKinds()[kind], m, n), m, n,
                                 CxPseudoInverse_head);
        }
}
TEST(PseudoInverse, OfTheRevisionMeetsThemAtAnyNorm) {
    for (const auto &[m, n] : {std::pair{1, 1}, {4, 4}, {7, 3}, {3, 7}, {20, 12}})
        for (const int kind : {0, 2, 4, 10})
            for (const int power : {-900, -50, 0, 900}) {
                SCOPED_TRACE(testing::Message() << m << " by " << n << ' '
                                                << MatrixKinds()[kind].name << ", 2^" << power);
                const auto a = RealMatrix(MatrixKinds()[kind], m, n);
                const auto z = ComplexMatrix(MatrixKinds()[kind], m, n);
                DBL2DArray out;
                CDB2DArray zout;
                ASSERT_EQ(PseudoInverse2026_head(Matrix(m, n, Scaled(a, power)).handle(), -1.0,
                                                 out.handle()),
                          0);
                ExpectPseudoInverse(Exact(m, n, a.data()),
                                    Exact(n, m, Scaled(out.values(), power).data()));
                ASSERT_EQ(CxPseudoInverse2026_head(Matrix(m, n, Scaled(z, power)).handle(), -1.0,
                                                   zout.handle()),
                          0);
                ExpectPseudoInverse(Exact(m, n, z.data()),
                                    Exact(n, m, Scaled(zout.values(), power).data()));
            }
    DBL2DArray out;
    const DBL2DArray a(2, 2, {1e-200, 0.0, 0.0, 1e-214});
    for (const auto &[tolerance, expected] : {std::pair{0.0, 1e214}, {1e-214, 0.0}}) {
        EXPECT_EQ(PseudoInverse2026_head(a.handle(), tolerance, out.handle()), 0);
        EXPECT_DOUBLE_EQ(out[3], expected);
    }
}
TEST(PseudoInverse, CutsAtAnAbsoluteTolerance) {
    ErrorCode err;
    for (const auto &[tolerance, expected] : {std::pair{0.0, 1e14}, {1e-14, 0.0}, {-1.0, 1e14}}) {
        const DBL2DArray a(2, 2, {1.0, 0.0, 0.0, 1e-14});
        PseudoInverse_head(a.handle(), &tolerance, &err);
        EXPECT_DOUBLE_EQ(a[3], expected);
    }
}

} // namespace
} // namespace qx::test
