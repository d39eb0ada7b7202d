#include "qx/matrix_properties.h"

#include "linalg/tests/host_matrix.h"
#include "tests/support/recipe.h"

#include <gtest/gtest.h>

#include <cmath>
#include <limits>
#include <vector>

namespace qx::test {
namespace {

typedef DBL2DArray DBLMatrix;
typedef CDB2DArray CDBMatrix;
typedef Array1D<qx::ElementType::DBL> DBLVector;
typedef Array1D<qx::ElementType::CDB> CDBVector;

constexpr double inf = std::numeric_limits<double>::infinity();
const double nan = std::numeric_limits<double>::quiet_NaN();

double Determinant(const DBLMatrix &a, int32_t type, ErrorCode expected = 0) {
    double det = 7;
    ErrorCode err = 1;
    Determinant_head(a.handle(), &type, &det, &err);
    EXPECT_EQ(err, expected);
    return det;
}
double Norm(const DBLMatrix &a, int32_t type, ErrorCode expected = 0) {
    double norm = 7;
    ErrorCode err = 1;
    Norm_head(a.handle(), &type, &norm, &err);
    EXPECT_EQ(err, expected);
    return norm;
}
double Condition(const DBLMatrix &a, int32_t type, ErrorCode expected = 0) {
    double cond = 7;
    ErrorCode err = 1;
    CondNumber_head(a.handle(), &type, &cond, &err);
    EXPECT_EQ(err, expected);
    return cond;
}
int Rank(const DBLMatrix &a, double tolerance, ErrorCode expected = 0) {
    int32_t rank = 7;
    ErrorCode err = 1;
    Rank_head(a.handle(), &tolerance, &rank, &err);
    EXPECT_EQ(err, expected);
    return rank;
}

// The inverse of the determinant of Hilbert's matrix is a whole number (OEIS A005249).
TEST(Determinant, OfHilbertsMatrices) {
    const double inverses[] = {1, 12, 2160, 6048000, 266716800000.0};
    for (int n = 1; n <= 5; ++n) {
        std::vector<double> a;
        for (int i = 0; i < n; ++i)
            for (int j = 0; j < n; ++j)
                a.push_back(1.0 / (i + j + 1));
        const DBLMatrix hilbert(n, n, a);
        EXPECT_NEAR(Determinant(hilbert, 0) * inverses[n - 1], 1.0, 1e-10) << n;
        EXPECT_NEAR(Determinant(hilbert, 1) * inverses[n - 1], 1.0, 1e-10) << n;
    }
}

TEST(Determinant, GoesByTheType) {
    const DBLMatrix a(3, 3, {0, 2, 0, 3, 0, 0, 0, 0, 5});
    EXPECT_DOUBLE_EQ(Determinant(a, 0), -30.0); // one exchange
    EXPECT_EQ(Determinant(a, 2), 0.0);          // the diagonal alone
    // A matrix that is not positive definite may have a nonzero determinant (here -30).
    EXPECT_TRUE(std::isnan(Determinant(a, 1, ErrNotPositiveDefinite)));
    // Order 2 uses the formula for any type, even where the factorisation would fail.
    for (const int type : {0, 1, 2, 3})
        EXPECT_EQ(Determinant(DBLMatrix(2, 2, {1, 2, 3, 4}), type), -2.0);
    EXPECT_EQ(Determinant(DBLMatrix(3, 3, {1, 2, 3, 2, 4, 6, 1, 0, 1}), 0), 0.0);

    const CDBMatrix z(3, 3,
                      {{0, 1}, {0, 0}, {0, 0}, {0, 0}, {0, 0}, {2, 0}, {0, 0}, {0, 1}, {0, 0}});
    CDB det;
    ErrorCode err;
    const int32_t general = 0;
    CxDeterminant_head(z.handle(), &general, &det, &err); // i * (0 - 2 i) = 2
    EXPECT_EQ(det.re, 2.0);
    EXPECT_EQ(det.im, 0.0);

    EXPECT_TRUE(std::isnan(Determinant(a, 4, ErrInvalidSelector)));
    EXPECT_TRUE(std::isnan(Determinant(DBLMatrix(1, 2, {1, 2}), 0, ErrNotSquare)));
    EXPECT_TRUE(std::isnan(Determinant(DBLMatrix(1, 1, {inf}), 0, ErrNonFiniteInput)));
}

TEST(Norm, OfEachType) {
    const DBLMatrix a(2, 3, {1, -2, 3, -4, 5, -6});
    EXPECT_EQ(Norm(a, 1), 9.0);
    EXPECT_EQ(Norm(a, 3), 15.0);
    EXPECT_DOUBLE_EQ(Norm(a, 2), std::sqrt(91.0));
    // The eigenvalues of a a^T are (91 +- sqrt(91^2 - 4 * 54)) / 2.
    EXPECT_NEAR(Norm(a, 0), std::sqrt((91 + std::sqrt(8281.0 - 216)) / 2), 1e-14);
    EXPECT_TRUE(std::isnan(Norm(a, 4, ErrInvalidSelector)));
    EXPECT_TRUE(std::isnan(Norm(DBLMatrix(0, 0), 1, ErrEmptyInput)));

    const CDBMatrix z(1, 2, {{3, 4}, {5, -12}});
    double norm;
    ErrorCode err;
    for (const auto &[type, expected] : {std::pair<int32_t, double>(1, 13.0), {3, 18.0}}) {
        CxNorm_head(z.handle(), &type, &norm, &err);
        EXPECT_EQ(norm, expected);
    }
}

TEST(Condition, IsInfiniteWhereTheInverseOverflows) {
    for (const int type : {1, 2, 3})
        EXPECT_EQ(Condition(DBLMatrix(2, 2, {1e-310, 0, 0, 1}), type), inf);
}

TEST(Condition, IsInfiniteForSingularMatrices) {
    for (const int type : {0, 1, 2, 3}) {
        EXPECT_EQ(Condition(DBLMatrix(2, 2, {0, 0, 0, 3}), type), inf) << type;
        EXPECT_NEAR(Condition(DBLMatrix(2, 2, {1, 0, 0, -4}), type), type == 2 ? 4.25 : 4.0, 1e-14);
    }
    EXPECT_NEAR(Condition(DBLMatrix(2, 3, {2, 0, 0, 0, 1, 0}), 0), 2.0, 1e-15);
    EXPECT_TRUE(std::isnan(Condition(DBLMatrix(2, 3, {2, 0, 0, 0, 1, 0}), 1, ErrNotSquare)));
    // Hilbert's matrix of order 4: 28375 in the 1-norm (N. J. Higham, Accuracy and Stability of
    // Numerical Algorithms, 2002, section 28.1).
    std::vector<double> hilbert;
    for (int i = 0; i < 16; ++i)
        hilbert.push_back(1.0 / (i / 4 + i % 4 + 1));
    EXPECT_NEAR(Condition(DBLMatrix(4, 4, hilbert), 1), 28375.0, 1e-6);
}

TEST(Rank, CountsSingularValuesAboveTheTolerance) {
    const DBLMatrix two(3, 3, {1, 2, 3, 4, 5, 6, 7, 8, 9}), scaled(2, 2, {1, 0, 0, 0.5});
    EXPECT_EQ(Rank(two, -1.0), 2);
    EXPECT_EQ(Rank(scaled, 0.5), 1); // strictly above
    EXPECT_EQ(Rank(scaled, 0.0), 2);
    EXPECT_EQ(Rank(DBLMatrix(2, 4), -1.0) >= 0, true);
    EXPECT_EQ(Rank(DBLMatrix(0, 0), -1.0, ErrEmptyInput), -1);
    EXPECT_EQ(Rank(DBLMatrix(1, 1, {nan}), -1.0, ErrNonFiniteInput), -1);
}

TEST(Revisions, OfNormConditionAndRankHoldOverTheWholeRange) {
    // Singular values 2, 1, and 1e-3 of the largest number.
    for (const double size : {1e-300, 1e-160, 1e-17, 1.0, 1e155, 8e307}) {
        SCOPED_TRACE(size);
        const DBLMatrix a(3, 3, {0, 2 * size, 0, size, 0, 0, 0, 0, 1e-3 * size});
        const CDBMatrix z(2, 3, {{0, 0}, {0, 2 * size}, {0, 0}, {-size, 0}, {0, 0}, {0, 0}});
        double value;
        int32_t rank;
        const double norms[] = {2, 2, std::sqrt(5.0 + 1e-6), 2};
        const double conditions[] = {2000, 2000, std::sqrt((5 + 1e-6) * (1.25 + 1e6)), 2000};
        for (const int type : {0, 1, 2, 3}) {
            EXPECT_EQ(Norm2026_head(a.handle(), type, &value), 0);
            EXPECT_NEAR(value / size, norms[type], 2e-15);
            EXPECT_EQ(CondNumber2026_head(a.handle(), type, &value), 0);
            EXPECT_NEAR(value, conditions[type], 1e-11);
            EXPECT_EQ(CxNorm2026_head(z.handle(), type, &value), 0);
            EXPECT_NEAR(value / size, type == 2 ? std::sqrt(5.0) : 2.0, 2e-15);
        }
        EXPECT_EQ(CxCondNumber2026_head(z.handle(), 0, &value), 0);
        EXPECT_NEAR(value, 2.0, 1e-15);
        EXPECT_EQ(CxCondNumber2026_head(z.handle(), 1, &value), ErrNotSquare);
        for (const auto &[tolerance, expected] :
             {std::pair(-1.0, 3), {0.9, 2}, {1.9, 1}, {2.5, 0}}) {
            EXPECT_EQ(Rank2026_head(a.handle(), tolerance * size, &rank), 0);
            EXPECT_EQ(rank, expected);
        }
        EXPECT_EQ(CxRank2026_head(z.handle(), nan, &rank), 0);
        EXPECT_EQ(rank, 2);
    }
    double value;
    const DBLMatrix huge(1, 2, {1.7e308, 1.7e308});
    EXPECT_EQ(Norm2026_head(huge.handle(), 3, &value), 0);
    EXPECT_EQ(value, inf);
}

TEST(Vectors, ProductsAndNorms) {
    double value;
    CDB z;
    ErrorCode err;
    const DBLVector x({3, -4, 12}), y({1, 2, 3}), none(0);
    DotProduct_head(x.handle(), y.handle(), &value, &err);
    EXPECT_EQ(value, 31.0);
    DotProduct_head(x.handle(), DBLVector({1, 2}).handle(), &value, &err);
    EXPECT_EQ(err, ErrSizeMismatch);
    EXPECT_TRUE(std::isnan(value));
    const CDBVector a(std::vector<CDB>{{0, 1}, {2, 0}});
    DotprodCx(a.handle(), a.handle(), &z, &err); // i^2 + 4
    EXPECT_EQ(z.re, 3.0);
    EXPECT_EQ(z.im, 0.0);

    const std::pair<double, double> norms[] = {
        {2, 13}, {1, 19}, {inf, 12}, {-inf, 3}, {3, std::cbrt(27. + 64 + 1728)}, {-1, 1.5}};
    for (const auto &[p, expected] : norms) {
        EXPECT_EQ(vectorNormH(x.handle(), p, &value), 0);
        EXPECT_NEAR(value, expected, 1e-14) << p;
    }
    for (const std::vector<double> &spoiled :
         {std::vector<double>{nan, 1, 2}, {1, nan, 2}, {2, 1, nan}})
        for (const double p : {inf, -inf, 1.0, 2.0, -3.0}) {
            EXPECT_EQ(vectorNormH(DBLVector(spoiled).handle(), p, &value), 0);
            EXPECT_TRUE(std::isnan(value)) << p;
        }
    EXPECT_EQ(vectorNormH(x.handle(), nan, &value), ErrNonFiniteInput);
    EXPECT_EQ(vectorNormH(x.handle(), 0.0, &value), ErrTooFewWeights);
    EXPECT_EQ(vectorNormH(none.handle(), 2.0, &value), ErrEmptyInput);
    CxVectorNormH(a.handle(), 1.0, &value);
    EXPECT_EQ(value, 3.0);
}

TEST(Vectors, AreScaledToUnitLength) {
    double norm;
    ErrorCode err;
    const DBLVector x({3, 0, -4}), zero({0, 0}), infinite({inf, 1});
    unitVector_head(x.handle(), &norm, &err);
    EXPECT_EQ(norm, 5.0);
    EXPECT_DOUBLE_EQ(x[2], -0.8);
    unitVector_head(zero.handle(), &norm, &err);
    EXPECT_EQ(norm, 0.0);
    EXPECT_EQ(zero[0], 0.0);
    unitVector_head(infinite.handle(), &norm, &err);
    EXPECT_EQ(infinite[1], 1.0);
    const CDBVector z(std::vector<CDB>{{3, 4}, {0, 5}});
    CxUnitVector80_head(z.handle(), 1.0, &norm, &err);
    EXPECT_EQ(norm, 10.0);
    EXPECT_DOUBLE_EQ(z[1].im, 0.5);
    unitVector80_head(x.handle(), 0.0, &norm, &err);
    EXPECT_EQ(x.size(), 0);
    EXPECT_TRUE(std::isnan(norm));
}

int Symmetric(const DBLMatrix &a, double tolerance, int relative) {
    int32_t answer = 7;
    EXPECT_EQ(CheckSym_head(a.handle(), tolerance, relative, &answer), 0);
    return answer;
}
TEST(Symmetry, WithinATolerance) {
    const DBLMatrix a(2, 2, {1, 8, 8.5, 1});
    EXPECT_EQ(Symmetric(a, -1.0, 0), 0); // exact
    EXPECT_EQ(Symmetric(a, 0.5, 0), 1);
    EXPECT_EQ(Symmetric(a, 0.49, 0), 0);
    EXPECT_EQ(Symmetric(a, 0.03, 1), 1); // 0.03 * 2 * 8.5 = 0.51
    EXPECT_EQ(Symmetric(a, 0.029, 1), 0);
    const DBLMatrix nearly(2, 2, {1, 1, 1 + 2e-16, 1});
    EXPECT_EQ(Symmetric(nearly, -1.0, 1), 1);
    EXPECT_EQ(Symmetric(nearly, -1.0, 0), 0);
    int32_t answer = 7;
    EXPECT_EQ(CheckSym_head(DBLMatrix(1, 2, {1, 2}).handle(), 1.0, 0, &answer), ErrNotSquare);
    EXPECT_EQ(answer, 0);
    const CDBMatrix z(2, 2, {{1, 0}, {2, 3}, {2, -3}, {1, 0}});
    CxCheckSym_head(z.handle(), -1.0, 0, 1, &answer);
    EXPECT_EQ(answer, 1);
    CxCheckSym_head(z.handle(), -1.0, 0, 0, &answer);
    EXPECT_EQ(answer, 0);
    const CDBMatrix imaginaryDiagonal(2, 2, {{1, 1}, {0, 0}, {0, 0}, {1, 0}});
    CxCheckSym_head(imaginaryDiagonal.handle(), -1.0, 0, 1, &answer);
    EXPECT_EQ(answer, 0);
}

struct SemiDefinite {
    int32_t answer, rank;
};
SemiDefinite TestSemi(const DBLMatrix &a, double tolerance = -1.0) {
    SemiDefinite result = {7, 7};
    EXPECT_EQ(CheckPosSemiDef_head(a.handle(), tolerance, &result.answer, &result.rank), 0);
    return result;
}
int Definite(const DBLMatrix &a) {
    int32_t answer = 7;
    ErrorCode err = 1;
    CheckPosdef_head(a.handle(), &answer, &err);
    EXPECT_EQ(err, 0);
    return answer;
}

TEST(Definiteness, OfSmallMatrices) {
    EXPECT_EQ(Definite(DBLMatrix(2, 2, {2, 1, 1, 2})), 1);
    EXPECT_EQ(Definite(DBLMatrix(2, 2, {1, 2, 2, 1})), 0);
    EXPECT_EQ(Definite(DBLMatrix(2, 2, {1, 1, 1, 1})), 0);
    EXPECT_EQ(Definite(DBLMatrix(2, 2, {2, 1, 0, 2})), 0); // not symmetric
    const CDBMatrix z(2, 2, {{2, 0}, {0, 1}, {0, -1}, {2, 0}});
    int32_t answer;
    ErrorCode err;
    CxCheckPosdef_head(z.handle(), &answer, &err);
    EXPECT_EQ(answer, 1);

    // The diagonal alone does not decide: the second pivot is negative, or 0 with nonzero elements
    // in its row.
    EXPECT_EQ(TestSemi(DBLMatrix(2, 2, {1, 2, 2, 1})).answer, 0);
    EXPECT_EQ(TestSemi(DBLMatrix(2, 2, {0, 1, 1, 0})).answer, 0);
    EXPECT_EQ(TestSemi(DBLMatrix(3, 3, {1, 1, 1, 1, 1, 2, 1, 2, 1})).answer, 0);
    EXPECT_EQ(TestSemi(DBLMatrix(2, 2, {-1, 0, 0, 2})).rank, -1);
    EXPECT_EQ(TestSemi(DBLMatrix(1, 1, {0})).rank, 0);
    EXPECT_EQ(TestSemi(DBLMatrix(1, 1, {0})).answer, 1);
    EXPECT_EQ(TestSemi(DBLMatrix(2, 2, {1, 0.5, 0.25, 1})).answer, 0); // not symmetric
    EXPECT_EQ(TestSemi(DBLMatrix(2, 2, {1, 0.5, 0.25, 1}), 0.25).answer, 1);
}

// b b^T has the rank of b, which the elimination finds; after subtracting a small multiple of the
// identity it is no longer semi-definite.
TEST(Definiteness, FindsTheRankOfAGramMatrix) {
    for (const int n : {1, 3, 10, 25})
        for (const int rank : {1, 2, n}) {
            if (rank > n)
                continue;
            SCOPED_TRACE(testing::Message() << n << " of rank " << rank);
            Noise noise(static_cast<uint64_t>(n));
            std::vector<double> b, a(n * n, 0.0);
            for (int i = 0; i < n * rank; ++i)
                b.push_back(noise.symmetric());
            for (int i = 0; i < n; ++i)
                for (int j = 0; j < n; ++j)
                    for (int k = 0; k < rank; ++k)
                        a[i * n + j] += b[i * rank + k] * b[j * rank + k];
            const SemiDefinite gram = TestSemi(DBLMatrix(n, n, a), 1e-13);
            EXPECT_EQ(gram.answer, 1);
            EXPECT_EQ(gram.rank, rank);
            if (rank == n)
                continue;
            for (int i = 0; i < n; ++i)
                a[i * n + i] -= 1e-6;
            EXPECT_EQ(TestSemi(DBLMatrix(n, n, a)).answer, 0);
        }
}

// (t - 1)(t - 2)(t - 3) for a full matrix; also a companion matrix with a conjugate pair.
TEST(CharacteristicPolynomial, OfKnownMatrices) {
    const DBLVector polynomial(0);
    ErrorCode err;
    const DBLMatrix a(3, 3, {2, -1, 0, -1, 2, -1, 0, -1, 2});
    MatrixCharacteristicPoly_head(a.handle(), polynomial.handle(), &err);
    EXPECT_EQ(err, 0);
    const double expected[] = {-4, 10, -6, 1};
    for (int k = 0; k < 4; ++k)
        EXPECT_NEAR(polynomial[k], expected[k], 4e-14);
    const DBLMatrix rotation(2, 2, {0, -2, 2, 0}); // t^2 + 4
    MatrixCharacteristicPoly_head(rotation.handle(), polynomial.handle(), &err);
    EXPECT_NEAR(polynomial[0], 4.0, 1e-15);
    EXPECT_NEAR(polynomial[1], 0.0, 1e-15);
    const CDBMatrix z(1, 1, {{2, 3}});
    const CDBVector cx(0);
    CxMatrixCharacteristicPoly_head(z.handle(), cx.handle(), &err);
    EXPECT_EQ(cx[0].im, -3.0);
    EXPECT_EQ(cx[1].re, 1.0);
}

TEST(CharacteristicPolynomial, RefusesCoefficientsThatOverflow) {
    ErrorCode err;
    const DBLVector polynomial(0);
    const CDBVector cx(0);
    for (const auto &[size, code] :
         {std::pair<double, ErrorCode>(1e100, 0), {1e110, ErrOverflow}}) {
        const DBLMatrix a(3, 3, {size, 0, 0, 0, size, 0, 0, 0, size});
        const CDBMatrix z(3, 3, {{size, 0}, {}, {}, {}, {size, 0}, {}, {}, {}, {size, 0}});
        MatrixCharacteristicPoly_head(a.handle(), polynomial.handle(), &err);
        EXPECT_EQ(err, code) << size;
        EXPECT_EQ(polynomial.size(), code == 0 ? 4 : 0);
        CxMatrixCharacteristicPoly_head(z.handle(), cx.handle(), &err);
        EXPECT_EQ(err, code) << size;
        EXPECT_EQ(cx.size(), code == 0 ? 4 : 0);
    }
}

} // namespace
} // namespace qx::test
