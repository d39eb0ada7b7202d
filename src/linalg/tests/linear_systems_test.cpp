#include "qx/linear_systems.h"

#include "linalg/matrix.h"
#include "linalg/systems/least_squares.h"
#include "linalg/systems/lu.h"
#include "linalg/tests/host_matrix.h"
#include "linalg/tests/matrices.h"
#include "linalg/tests/residuals.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <limits>
#include <thread>

namespace qx::test {
namespace {

using qx::operator*;
using qx::operator+=;

typedef qx::test::Array1D<ElementType::DBL> DBLVector;
typedef qx::test::Array1D<ElementType::CDB> CDBVector;
typedef qx::test::Array1D<ElementType::I32> I32Vector;
typedef qx::test::DBL2DArray DBLMatrix;
typedef qx::test::CDB2DArray CDBMatrix;

constexpr double inf = std::numeric_limits<double>::infinity();
const double nan = std::numeric_limits<double>::quiet_NaN();

// Every nonsingular kind of matrix, and orders on both sides of the panels and strips.
TEST(LU, SolvesAndInvertsBackwardStably) {
    for (const auto &kind : qx::test::MatrixKinds())
        for (const int n : {1, 2, 5, 31, 33, 64, 97}) {
            SCOPED_TRACE(testing::Message() << kind.name << " " << n);
            const auto a = RealMatrix(kind, n, n);
            const auto za = ComplexMatrix(kind, n, n);
            const auto b = Reals(n, 5);
            const auto zb = Complexes(n, 5);
            std::vector<double> x(b.size());
            std::vector<CDB> zx(zb.size());
            const ErrorCode status =
                qx::SolveByLU<ElementType::DBL>(View(a, n, n), View(b), View(x));
            if (status == 0 && std::isfinite(x[0])) {
                EXPECT_LT(BackwardError(a, n, b, x), 4.0);
            } else {
                EXPECT_TRUE(status == 0 || status == ErrSingularMatrix);
            }
            const ErrorCode cxStatus =
                qx::SolveByLU<ElementType::CDB>(View(za, n, n), View(zb), View(zx));
            if (cxStatus == 0 && std::isfinite(zx[0].re)) {
                EXPECT_LT(BackwardError(za, n, zb, zx), 4.0);
            }
        }
}

// Solving for all right-hand sides together, as for the inverse, or one by one gives the same bits.
template <class T>
void ExpectStripsLikeSingles(const std::vector<T> &a, int n) {
    constexpr ElementType E = elementIn<std::vector<T>>;
    std::vector<T> lu = a, inverse(a.size());
    std::vector<int32_t> pivots(n);
    int32_t parity;
    ASSERT_EQ(qx::LUDecompose<E>(View(lu, n, n), View(pivots), &parity), 0);
    ASSERT_EQ(qx::InvertByLU<E>(View(a, n, n), View(inverse, n, n)), 0);
    for (int j = 0; j < n; ++j) {
        std::vector<T> column(n, T{});
        reinterpret_cast<double &>(column[j]) = 1.0;
        qx::LUSolve<E>(View(lu, n, n), View(pivots), View(column, n, 1), View(column, n, 1));
        for (int i = 0; i < n; ++i)
            ASSERT_EQ(std::memcmp(&column[i], &inverse[i * n + j], sizeof(T)), 0) << i << " " << j;
    }
    EXPECT_LT(Deviation(Exact(n, n, a.data()) * Exact(n, n, inverse.data()), Exact::Identity(n)),
              200.0);
}
TEST(LU, AnInverseHasTheBitsOfItsColumns) {
    for (const int n : {1, 3, 8, 19, 45}) {
        SCOPED_TRACE(n);
        ExpectStripsLikeSingles(Reals(n * n, 3), n);
        ExpectStripsLikeSingles(Complexes(n * n, 3), n);
    }
}

constexpr auto Decompose = &qx::LUDecompose<ElementType::DBL>;

// The order of operations is that of the unblocked algorithm, whatever the panels do. The last bits
// show it in sums whose terms absorb each other.
TEST(LU, SubtractsTermsInAscendingOrder) {
    const int n = 70;
    std::vector<double> a(n * n, 0.0);
    for (int i = 0; i < n; ++i)
        a[i * n + i] = 1.0;
    // Row n - 1 becomes 1 - 1e16 - 1 - 1 ... + 1e16: every 1 after the first huge term is lost.
    for (int j = 0; j < n - 1; ++j) {
        a[(n - 1) * n + j] = 1.0;
        a[j * n + n - 1] = j == 0 ? 1e16 : j == n - 2 ? -1e16 : 1.0;
    }
    std::vector<int32_t> pivots(n);
    int32_t parity;
    EXPECT_EQ(Decompose(View(a, n, n), View(pivots), &parity), WarnSingular);
    EXPECT_EQ(a[n * n - 1], 0.0);
}

TEST(LU, ReportsSingularityAndGoesOn) {
    std::vector<double> a = {0, 0, 2, 0, 0, 3, 0, 5, 1};
    std::vector<int32_t> pivots(3);
    int32_t parity = 7;
    EXPECT_EQ(Decompose(View(a, 3, 3), View(pivots), &parity), WarnSingular);
    EXPECT_EQ(pivots, (std::vector<int32_t>{0, 2, 2}));
    EXPECT_EQ(parity, 1);
    pivots.resize(2);
    // In a tie the earlier row is the pivot, and NaN is never a pivot.
    std::vector<double> ties = {-1, 2, 1, 3};
    Decompose(View(ties, 2, 2), View(pivots), &parity);
    EXPECT_EQ(pivots[0], 0);
    std::vector<double> withNaN = {nan, 2, 1, 3};
    EXPECT_EQ(Decompose(View(withNaN, 2, 2), View(pivots), &parity), WarnSingular);
    EXPECT_EQ(pivots[0], 1);
}

ErrorCode SolveSet(const DBLMatrix &a, const DBLMatrix &b, DBLMatrix &x, double *reciprocal) {
    return EqsSetByLU2026_head(a.handle(), b.handle(), x.handle(), reciprocal);
}
ErrorCode SolveSet(const CDBMatrix &a, const CDBMatrix &b, CDBMatrix &x, double *reciprocal) {
    return CxEqsSetByLU2026_head(a.handle(), b.handle(), x.handle(), reciprocal);
}
double OneNorm(const Exact &a) {
    long double largest = 0;
    for (int j = 0; j < a.cols(); ++j) {
        long double sum = 0;
        for (int i = 0; i < a.rows(); ++i)
            sum += std::abs(a(i, j));
        largest = std::max(largest, sum);
    }
    return static_cast<double>(largest);
}

// Two right-hand sides; the estimate is compared with the norm of the inverse where that is
// accurate.
template <class Elements>
void ExpectSolvedSet(const Elements &a, int n, const Elements &b) {
    constexpr ElementType E = elementIn<Elements>;
    const auto given = qx::test::Matrix(n, n, a), sides = qx::test::Matrix(n, 2, b);
    auto x = qx::test::Matrix(0, 0, Elements());
    double reciprocal = 7;
    const ErrorCode status = SolveSet(given, sides, x, &reciprocal);
    ASSERT_TRUE(status == 0 || status == WarnLowAccuracy || status == ErrSingularMatrix) << status;
    if (status == ErrSingularMatrix) {
        EXPECT_TRUE(std::isnan(reciprocal));
        return;
    }
    EXPECT_EQ(status == WarnLowAccuracy, reciprocal < 0x1p-52);
    if (std::isfinite(static_cast<double>(Exact(n, 2, x.data()).norm()))) {
        EXPECT_LT(BackwardError(a, n, b, x.values()), 4.0);
    }
    Elements inverse(a.size());
    ASSERT_EQ(qx::InvertByLU<E>(View(a, n, n), View(inverse, n, n)), 0);
    const double exact =
        1.0 / OneNorm(Exact(n, n, a.data())) / OneNorm(Exact(n, n, inverse.data()));
    if (exact > 1e-10) {
        EXPECT_GE(reciprocal, exact * (1 - 1e-5));
        EXPECT_LE(reciprocal, exact * 3);
    }
    // The accuracy does not depend on the scale; each column has its own scale.
    if (OneNorm(Exact(n, n, a.data())) < 0x1p60) {
        Elements bits = Scaled(b, 300);
        for (int i = 0; i < n; ++i)
            bits[2 * i] = b[2 * i];
        auto again = qx::test::Matrix(0, 0, Elements());
        double same = 7;
        SolveSet(qx::test::Matrix(n, n, Scaled(a, -700)), qx::test::Matrix(n, 2, bits), again,
                 &same);
        EXPECT_EQ(same, reciprocal);
        const Exact X(n, 2, x.data()), Y(n, 2, again.data());
        for (int i = 0; i < n; ++i)
            for (int j = 0; j < 2; ++j)
                if (std::abs(X(i, j)) < 0x1p20L) {
                    EXPECT_EQ(Y(i, j), X(i, j) * std::ldexp(1.0L, j == 0 ? 700 : 1000));
                }
    }
}
TEST(LU, SolvesForAllRightSidesAndEstimatesTheCondition) {
    for (const auto &kind : qx::test::MatrixKinds())
        for (const int n : {1, 2, 5, 33, 64}) {
            SCOPED_TRACE(testing::Message() << kind.name << " " << n);
            ExpectSolvedSet(RealMatrix(kind, n, n), n, Reals(2 * n, 5));
            ExpectSolvedSet(ComplexMatrix(kind, n, n), n, Complexes(2 * n, 5));
        }
}

TEST(LinearSystems, TheLastFailedCheckDecidesInOlderExports) {
    ErrorCode err;
    DBLMatrix a(2, 3);
    DBLVector b(1), x(0);
    EXPECT_EQ(EqsByLUDri_head(a.handle(), b.handle(), x.handle(), &err), 0);
    EXPECT_EQ(err, ErrSizeMismatch);
    DBLVector two(2);
    EqsByLUDri_head(a.handle(), two.handle(), x.handle(), &err);
    EXPECT_EQ(err, ErrNotSquare);
    DBLMatrix none(0, 0);
    DBLVector empty(0);
    EqsByLUDri_head(none.handle(), empty.handle(), x.handle(), &err);
    EXPECT_EQ(err, ErrEmptyInput);
    I32Vector pivots({0, 5});
    DBLMatrix lu(2, 2, {1, 0, 0, 1});
    LULinEqs_head(lu.handle(), pivots.handle(), two.handle(), &err);
    EXPECT_EQ(err, ErrIndexOutOfRange);
    EXPECT_EQ(two.size(), 0);
}

TEST(LinearSystems, SingularAndNonFiniteSystems) {
    ErrorCode err;
    DBLMatrix zero(1, 1, {0.0});
    DBLVector b({1.0}), x(0);
    EqsByLUDri_head(zero.handle(), b.handle(), x.handle(), &err);
    EXPECT_EQ(err, ErrSingularMatrix);
    EXPECT_EQ(x.size(), 0);
    DBLMatrix unsolvable(1, 1, {inf});
    GenLinEqs_head(unsolvable.handle(), b.handle(), x.handle(), &err);
    EXPECT_EQ(err, ErrNonFiniteInput);
    DBLMatrix fine(1, 1, {2.0}), right(1, 1, {1.0}), out(1, 1, {1.0});
    EXPECT_EQ(EqsSetByLUDri_head(fine.handle(), right.handle(), out.handle()), ErrNotAvailable);
    EXPECT_EQ(out.rows(), 0);
    CDBMatrix zfine(1, 1), zright(1, 1), zout(1, 1);
    EXPECT_EQ(CxEqsSetByLUDri_head(zfine.handle(), zright.handle(), zout.handle()),
              ErrNotAvailable);
}

TEST(LeastSquares, SatisfyTheNormalEquations) {
    for (const auto &[m, n] : {std::pair(7, 3), {3, 7}, {40, 40}, {1, 1}, {50, 20}}) {
        SCOPED_TRACE(testing::Message() << m << " by " << n);
        const auto a = Reals(m * n, 1), b = Reals(m, 2);
        const auto za = Complexes(m * n, 1), zb = Complexes(m, 2);
        std::vector<double> x(n), pseudo(n * m);
        std::vector<CDB> zx(n);
        ASSERT_EQ(
            qx::SolveBySVD<ElementType::DBL>(View(a, m, n), View(b, m, 1), View(x, n, 1), -1.0), 0);
        ExpectLeastSquares(a, m, n, b, x);
        ASSERT_EQ(
            qx::SolveBySVD<ElementType::CDB>(View(za, m, n), View(zb, m, 1), View(zx, n, 1), -1.0),
            0);
        ExpectLeastSquares(za, m, n, zb, zx);
        ASSERT_EQ(
            qx::PseudoInverseMatrix<ElementType::DBL>(View(a, m, n), -1.0, View(pseudo, n, m)), 0);
        ExpectPseudoInverse(Exact(m, n, a.data()), Exact(n, m, pseudo.data()));
    }
}

// A well-conditioned system scaled so that its numbers are tiny or huge.
TEST(LeastSquares, OfTheRevisionsKeepTheirDigitsAtAnyNorm) {
    for (const auto &[m, n] : {std::pair(7, 3), {3, 7}, {40, 40}, {1, 1}})
        for (const int power : {-1000, -60, -33, 0, 900}) {
            SCOPED_TRACE(testing::Message() << m << " by " << n << ", 2^" << power);
            const auto a = Reals(m * n, 1), b = Reals(m, 2);
            const auto za = Complexes(m * n, 1), zb = Complexes(m, 2);
            const auto back = [power](const auto &x) { return Scaled(x, power); };
            DBLMatrix x(0, 0);
            CDBMatrix zx(0, 0);
            DBLVector column(0);
            CDBVector zcolumn(0);
            ASSERT_EQ(EqsSetBySVD2026_head(DBLMatrix(m, n, Scaled(a, power)).handle(),
                                           DBLMatrix(m, 1, b).handle(), x.handle(), -1.0),
                      0);
            ExpectLeastSquares(a, m, n, b, back(x.values()));
            ASSERT_EQ(GenLinEqs2026_head(DBLMatrix(m, n, Scaled(a, power)).handle(),
                                         DBLVector(b).handle(), column.handle(), -1.0),
                      0);
            EXPECT_EQ(column.values(), x.values());
            ASSERT_EQ(CxEqsSetBySVD2026_head(CDBMatrix(m, n, Scaled(za, power)).handle(),
                                             CDBMatrix(m, 1, zb).handle(), zx.handle(), -1.0),
                      0);
            ExpectLeastSquares(za, m, n, zb, back(zx.values()));
            ASSERT_EQ(CxGenLinEqs2026_head(CDBMatrix(m, n, Scaled(za, power)).handle(),
                                           CDBVector(zb).handle(), zcolumn.handle(), -1.0),
                      0);
            EXPECT_EQ(zcolumn[n - 1].im, zx.values()[n - 1].im);
        }
    // The tolerance is relative, and a tolerance of 0 discards only zeros.
    const DBLMatrix a(2, 2, {1e-200, 0, 0, 1e-218});
    const DBLVector b({1, 1});
    DBLVector x(0);
    EXPECT_EQ(GenLinEqs2026_head(a.handle(), b.handle(), x.handle(), -1.0), WarnRankDeficient);
    EXPECT_EQ(x[1], 0.0);
    EXPECT_EQ(GenLinEqs2026_head(a.handle(), b.handle(), x.handle(), 0.0), 0);
    EXPECT_DOUBLE_EQ(x[1], 1e218);
}

// x + y = 2, twice: the minimum-norm solution is (1, 1).
TEST(LeastSquares, ReportALackOfRankOrDoNot) {
    ErrorCode err = 1;
    DBLMatrix a(2, 2, {1, 1, 1, 1}), sides(2, 1, {2, 2}), solutions(0, 0);
    DBLVector b({2, 2}), x(0), work(0);
    GenLinEqs_head(a.handle(), b.handle(), x.handle(), &err);
    EXPECT_EQ(err, 0);
    EXPECT_NEAR(x[0], 1.0, 1e-15);
    EXPECT_NEAR(x[1], 1.0, 1e-15);
    EXPECT_EQ(EqsSetBySVDDri_head(a.handle(), sides.handle(), solutions.handle()),
              WarnRankDeficient);
    EXPECT_NEAR(solutions.at(1, 0), 1.0, 1e-15);
    EXPECT_EQ(GenLinEqs2010_head(a.handle(), b.handle(), x.handle(), -1.0, work.handle()), 0);
    EXPECT_NEAR(x[1], 1.0, 1e-15);
    EXPECT_EQ(work.size(), 2 * 5 + 4 + 2 + 4);
    EXPECT_EQ(GenLinEqsbySVD2011_head(a.handle(), b.handle(), x.handle(), -1.0, 3, work.handle()),
              0);
    EXPECT_NEAR(x[0], 1.0, 1e-15);
    EXPECT_EQ(work.size(), 2 * 5 + 4 + 2 + 4 + 4);
    EXPECT_EQ(GenLinEqsbySVD2011_head(a.handle(), b.handle(), x.handle(), -1.0, -1, work.handle()),
              0);
    EXPECT_EQ(x[0], 0.0);
}

// The plain method cuts at max(m, n) times the tolerance, the refined one at the tolerance.
TEST(LeastSquares, CutSingularValuesByTheirTolerance) {
    DBLMatrix a(2, 2, {1, 0, 0, 0.15});
    DBLVector b({1, 0.15}), x(0), work(0);
    ErrorCode err;
    GenLinEqs82_head(a.handle(), b.handle(), x.handle(), 0.1, &err);
    EXPECT_NEAR(x[1], 0.0, 1e-15); // 0.15 is below 2 * 0.1
    GenLinEqsbySVD2011_head(a.handle(), b.handle(), x.handle(), 0.1, 1, work.handle());
    EXPECT_NEAR(x[1], 1.0, 1e-15);
    GenLinEqsbySVD2011_head(a.handle(), b.handle(), x.handle(), 0.2, 1, work.handle());
    EXPECT_EQ(x[1], 0.0);
}

// Hilbert's matrix of order 5 has the condition number 5e5: one refinement gains some digits.
TEST(LeastSquares, RefinementReducesTheResidual) {
    const int n = 5;
    std::vector<double> a, b(n, 0.0);
    for (int i = 0; i < n; ++i)
        for (int j = 0; j < n; ++j)
            a.push_back(1.0 / (i + j + 1));
    for (int i = 0; i < n; ++i)
        for (int j = 0; j < n; ++j)
            b[i] += a[i * n + j];
    std::vector<double> once(n), thrice(n), work(qx::LeastSquaresWork(n, n) + 2 * n);
    for (const auto &[refinements, x] : {std::pair(1, &once), std::pair(3, &thrice)})
        ASSERT_EQ(
            qx::SolveBySVDRefined(View(work), View(a, n, n), View(b), View(*x), -1.0, refinements),
            0);
    EXPECT_LE(BackwardError(a, n, b, thrice), BackwardError(a, n, b, once));
    EXPECT_LT(BackwardError(a, n, b, thrice), 0.5);
}

// A huge number of refinements ends early, with the solution that all steps would give.
TEST(LeastSquares, EndlessRefinementsTerminate) {
    const int n = 4;
    for (const double scale : {1.0, 1e300}) {
        std::vector<double> a, b(n, 1.0), work(qx::LeastSquaresWork(n, n) + 2 * n);
        for (int i = 0; i < n * n; ++i)
            a.push_back(scale / (1 + i / n + i % n));
        std::vector<std::vector<double>> steps;
        const auto solve = [&](int32_t refinements) {
            std::vector<double> x(n);
            EXPECT_EQ(qx::SolveBySVDRefined(View(work), View(a, n, n), View(b), View(x), -1.0,
                                            refinements),
                      0);
            return x;
        };
        for (int32_t refinements = 1; refinements <= 16; ++refinements)
            steps.push_back(solve(refinements));
        const auto isStep = [&](const std::vector<double> &x) {
            return std::any_of(steps.begin(), steps.end(), [&](const std::vector<double> &step) {
                return std::memcmp(x.data(), step.data(), n * sizeof(double)) == 0;
            });
        };
        EXPECT_TRUE(isStep(solve(60))) << scale;
        EXPECT_TRUE(isStep(solve(std::numeric_limits<int32_t>::max()))) << scale;
    }
}

// b^H b + 1 of noise.
std::vector<CDB> PositiveDefinite(int n) {
    const auto b = Complexes(n * n, 9);
    std::vector<CDB> a(n * n, CDB{0.0, 0.0});
    for (int i = 0; i < n; ++i)
        for (int j = 0; j < n; ++j) {
            for (int k = 0; k < n; ++k)
                a[i * n + j] += qx::Conj(b[k * n + i]) * b[k * n + j];
            a[i * n + j] += CDB{i == j ? 1.0 : 0.0, 0.0};
        }
    return a;
}

TEST(Cholesky, SolvesFromEitherTriangle) {
    for (const int n : {1, 2, 9, 40}) {
        SCOPED_TRACE(n);
        const auto a = PositiveDefinite(n);
        const auto b = Complexes(3 * n, 4);
        // The other triangle holds other numbers and is not read.
        for (const int useUpper : {0, 1}) {
            auto half = a;
            for (int i = 0; i < n; ++i)
                for (int j = 0; j < n; ++j)
                    if (useUpper != 0 ? j < i : j > i)
                        half[i * n + j] = {1.0, 1.0};
            const CDBMatrix A(n, n, half), B(n, 3, b), X(0, 0);
            ASSERT_EQ(CxEqsSetByCholeskyDri_head(A.handle(), useUpper, B.handle(), X.handle()), 0);
            EXPECT_LT(BackwardError(a, n, b, X.values()), 4.0);
        }
    }
    DBLMatrix indefinite(2, 2, {1, 2, 2, 1});
    DBLVector b({1, 1}), x(0);
    ErrorCode err;
    EqsByCholeskyDri_head(indefinite.handle(), b.handle(), x.handle(), &err);
    EXPECT_EQ(err, ErrNotPositiveDefinite);
    DBLVector fourElements(4);
    CholeskyLinEqs_head(fourElements.handle(), b.handle(), &err);
    EXPECT_EQ(err, ErrNotSquare);
}

// An empty array is the triangle of order 0.
TEST(Packed, EmptyTrianglesAreEmptyAndFitNoRightSide) {
    for (const int n : {0, 3}) {
        const ErrorCode expected = n == 0 ? ErrEmptyInput : ErrSizeMismatch;
        DBLVector packed(0), b(n), again(n);
        CDBVector cxPacked(0), z(n), cxAgain(n);
        const PackedTriangle a = {packed.handle(), 0};
        const CxPackedTriangle cxA = {cxPacked.handle(), 0};
        ErrorCode err[4] = {};
        CholeskyLinEqs_head(packed.handle(), b.handle(), &err[0]);
        CxCholeskyLinEqs_head(cxPacked.handle(), z.handle(), &err[1]);
        TriLinEqs_head(&a, again.handle(), &err[2]);
        CxTriLinEqs_head(&cxA, cxAgain.handle(), &err[3]);
        for (const ErrorCode each : err)
            EXPECT_EQ(each, expected) << n;
    }
}

template <class Matrix, class T, class Export>
void ExpectTriangularSolutions(int n, int triangle, std::vector<T> a, const std::vector<T> &b,
                               Export solve) {
    const Matrix B(n, 3, b), X(0, 0);
    for (int i = 0; i < n; ++i) {
        reinterpret_cast<double &>(a[i * n + i]) -= 4.0; // a negative diagonal is not a failure
        for (int j = 0; j < n; ++j)
            if (triangle == 0 ? j > i : j < i)
                reinterpret_cast<double &>(a[i * n + j]) = nan; // never read
    }
    const Matrix A(n, n, a);
    ASSERT_EQ(solve(A.handle(), triangle, B.handle(), X.handle()), 0);
    for (int i = 0; i < n; ++i)
        for (int j = 0; j < n; ++j)
            if (triangle == 0 ? j > i : j < i)
                a[i * n + j] = T{};
    EXPECT_LT(BackwardError(a, n, b, X.values()), 2.0);
}
TEST(Triangular, SolvesForAllRightSides) {
    for (const int n : {1, 2, 7, 30})
        for (const int triangle : {0, 1}) {
            SCOPED_TRACE(testing::Message() << n << " " << triangle);
            ExpectTriangularSolutions<DBLMatrix>(n, triangle, Reals(n * n, 1), Reals(3 * n, 2),
                                                 TriEqsSetDri_head);
            ExpectTriangularSolutions<CDBMatrix>(n, triangle, Complexes(n * n, 1),
                                                 Complexes(3 * n, 2), CxTriEqsSetDri_head);
        }
    ErrorCode err;
    DBLVector packed({1, 1, 1e-17}), b({1, 1});
    const PackedTriangle a = {packed.handle(), 0}, wrong = {packed.handle(), 2};
    TriLinEqs_head(&a, b.handle(), &err);
    EXPECT_EQ(err, ErrSingularMatrix);
    DBLVector again({1, 1});
    TriLinEqs_head(&wrong, again.handle(), &err);
    EXPECT_EQ(err, ErrInvalidSelector);
}

TEST(Banded, SolvesLikeTheFullMatrix) {
    const int n = 12, lower = 2, upper = 1;
    const auto diagonals = Complexes((lower + upper + 1) * n, 1);
    const auto b = Complexes(n, 2);
    std::vector<CDB> full(n * n, CDB{0.0, 0.0});
    for (int i = 0; i < n; ++i)
        for (int j = std::max(0, i - lower); j <= std::min(n - 1, i + upper); ++j)
            full[i * n + j] = diagonals[(upper + i - j) * n + j];
    const CDBMatrix band(lower + upper + 1, n, diagonals);
    const CDBVector x(b);
    ASSERT_EQ(CxBandEqsDriH(band.handle(), x.handle(), lower, upper), 0);
    EXPECT_LT(BackwardError(full, n, b, x.values()), 4.0);

    EXPECT_EQ(CxBandEqsDriH(band.handle(), x.handle(), lower, upper + 1), ErrSizesDisagree);
    CDBVector tooShort(n - 1);
    EXPECT_EQ(CxBandEqsDriH(band.handle(), tooShort.handle(), lower, upper), ErrBandVectorSize);
    DBLMatrix two(2, 1, {1, 1}), zero(1, 2, {0, 0});
    DBLVector one({1}), ones({1, 1});
    EXPECT_EQ(BandEqsDriH(two.handle(), one.handle(), 2, -1), ErrSizesDisagree);
    EXPECT_EQ(BandEqsDriH(zero.handle(), ones.handle(), 0, 0), ErrSingularMatrix);
}

// As many diagonals as the order are allowed, and one more is refused, although all could hold
// elements.
TEST(Banded, HasNoMoreDiagonalsThanItsOrder) {
    const DBLMatrix band(3, 3, {9, 2, 2, 5, 5, 5, 1, 1, 9}), wide(3, 2, {9, 2, 5, 5, 1, 9});
    const CDBMatrix zwide(3, 2, {{9, 0}, {2, 0}, {5, 0}, {5, 0}, {1, 0}, {9, 0}});
    const DBLVector x({7, 8, 6}), b({1, 1});
    EXPECT_EQ(BandEqsDriH(band.handle(), x.handle(), 1, 1), 0);
    for (int i = 0; i < 3; ++i)
        EXPECT_NEAR(x[i], 1.0, 1e-15);
    EXPECT_EQ(BandEqsDriH(wide.handle(), b.handle(), 1, 1), ErrSizesDisagree);
    EXPECT_EQ(b.size(), 0);
    EXPECT_EQ(BandEqsSetDriH(wide.handle(), DBLMatrix(2, 2).handle(), 2, 0), ErrSizesDisagree);
    EXPECT_EQ(CxBandEqsDriH(zwide.handle(), CDBVector(2).handle(), 1, 1), ErrSizesDisagree);
    EXPECT_EQ(CxBandEqsSetDriH(zwide.handle(), CDBMatrix(2, 2).handle(), 0, 2), ErrSizesDisagree);
}

TEST(Tridiagonal, FactorsSolveForMatrixAndTranspose) {
    const int n = 20;
    const auto lower = Reals(n - 1, 1), diagonal = Reals(n, 2), upper = Reals(n - 1, 3);
    const auto b = Reals(2 * n, 4);
    DBLVector l(lower), d(diagonal), u(upper), u2(0);
    I32Vector pivots(0);
    ASSERT_EQ(TriDiagLU_head(l.handle(), d.handle(), u.handle(), u2.handle(), pivots.handle()), 0);
    for (const int transposed : {0, 1}) {
        std::vector<double> full(n * n, 0.0);
        for (int i = 0; i < n; ++i) {
            full[i * n + i] = diagonal[i];
            if (i + 1 < n) {
                full[(i + transposed) * n + i + 1 - transposed] = upper[i];
                full[(i + 1 - transposed) * n + i + transposed] = lower[i];
            }
        }
        const DBLMatrix x(n, 2, b);
        ASSERT_EQ(TriDiagEqsSetByLU_head(transposed, l.handle(), d.handle(), u.handle(),
                                         u2.handle(), pivots.handle(), x.handle()),
                  0);
        EXPECT_LT(BackwardError(full, n, b, x.values()), 4.0);
    }
    DBLVector one({1}), two({1, 1}), other({1}), out(0);
    I32Vector none(0);
    EXPECT_EQ(
        TriDiagLU_head(one.handle(), two.handle(), other.handle(), out.handle(), none.handle()),
        ErrFewerThanThree);
    // An invalid pivot index would make the solver read outside b.
    pivots.data()[n - 1] = n + 1;
    DBLVector x(n);
    EXPECT_EQ(TriDiagEqsByLU_head(0, l.handle(), d.handle(), u.handle(), u2.handle(),
                                  pivots.handle(), x.handle()),
              ErrIndexOutOfRange);
    DBLVector z1({0, 0}), z2({0, 1, 1}), z3({0, 0}), z4(0);
    EXPECT_EQ(TriDiagLU_head(z1.handle(), z2.handle(), z3.handle(), z4.handle(), none.handle()),
              WarnSingular);
}

// Eight systems solved in eight threads, by our own elimination and by LAPACK, give the bits of
// systems solved one after the other.
TEST(LinearSystems, OfDifferentThreadsHaveTheBitsOfOne) {
    constexpr int threads = 8, n = 120, diagonals = 7, columns = 3;
    struct Solutions {
        std::vector<double> byElimination, byBand;
        bool operator==(const Solutions &) const = default;
    };
    const auto solve = [](int t) {
        const auto a = Reals(n * n, 10 + t), b = Reals(n, 20 + t);
        Solutions found = {std::vector<double>(n), {}};
        qx::SolveByLU<ElementType::DBL>(View(a, n, n), View(b), View(found.byElimination));
        const DBLMatrix band(diagonals, n, Reals(diagonals * n, 30 + t));
        const DBLMatrix right(n, columns, Reals(n * columns, 40 + t));
        BandEqsSetDriH(band.handle(), right.handle(), diagonals / 2, diagonals / 2);
        found.byBand = right.values();
        return found;
    };
    std::vector<Solutions> alone;
    for (int t = 0; t < threads; ++t)
        alone.push_back(solve(t));
    for (const Solutions &solutions : alone) {
        EXPECT_NE(solutions.byElimination[0], 0.0);
        EXPECT_EQ(solutions.byBand.size(), static_cast<std::size_t>(n * columns));
    }
    std::vector<int> different(threads, 0);
    std::vector<std::thread> pool;
    for (int t = 0; t < threads; ++t)
        pool.emplace_back([&, t] {
            for (int round = 0; round < 10; ++round)
                different[t] += solve(t) != alone[t];
        });
    for (std::thread &thread : pool)
        thread.join();
    EXPECT_EQ(different, std::vector<int>(threads, 0));
}

} // namespace
} // namespace qx::test
