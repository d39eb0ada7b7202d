#include "linalg/factorisations/qr.h"
#include "linalg/factorisations/svd.h"
#include "linalg/tests/host_matrix.h"
#include "linalg/tests/matrices.h"
#include "linalg/tests/residuals.h"
#include "qx/qx.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <limits>
#include <numeric>
#include <random>
#include <stdexcept>
#include <string>
#include <tuple>
#include <vector>

namespace qx::test {
namespace {

const double nan = std::numeric_limits<double>::quiet_NaN();

const std::vector<std::pair<int, int>> shapes = {{1, 1}, {1, 5}, {5, 1},   {2, 2},
                                                 {9, 4}, {4, 9}, {17, 17}, {40, 33}};

// Calls check(a, m, n, kind) with real and complex matrices of every kind and shape.
template <class Check>
void ForEveryMatrix(Check check) {
    for (const auto &[m, n] : shapes)
        for (const MatrixKind &kind : MatrixKinds()) {
            SCOPED_TRACE(testing::Message() << m << " by " << n << ", " << kind.name);
            check(RealMatrix(kind, m, n), m, n);
            check(ComplexMatrix(kind, m, n), m, n);
        }
}

TEST(SingularValueDecomposition, ReconstructsTheMatrixFromUnitaryFactors) {
    ForEveryMatrix([](const auto &a, int m, int n) {
        typedef std::decay_t<decltype(a)> Elements;
        constexpr qx::ElementType E = elementIn<Elements>;
        const int k = std::min(m, n);
        for (const int full : {0, 1}) {
            const int uCols = full ? m : k, vCols = full ? n : k;
            Elements u(m * uCols), v(n * vCols);
            std::vector<double> s(k), alone(k);
            ASSERT_EQ(
                qx::SVDecompose<E>(View(a, m, n), View(u, m, uCols), View(s), View(v, n, vCols)),
                0);
            Exact sigma(uCols, vCols);
            for (int i = 0; i < k; ++i)
                sigma(i, i) = s[i];
            const Exact U(m, uCols, u.data()), V(n, vCols, v.data());
            EXPECT_LT(Deviation(U * sigma * V.adjoint(), Exact(m, n, a.data())), 4.0);
            EXPECT_LT(FromUnitary(U), 8.0);
            EXPECT_LT(FromUnitary(V), 8.0);
            EXPECT_TRUE(std::is_sorted(s.rbegin(), s.rend()));
            EXPECT_GE(s.back(), 0.0);
            ASSERT_EQ(qx::SingularValues<E>(View(a, m, n), View(alone)), 0);
            EXPECT_EQ(alone, s);
        }
    });
}

TEST(SingularValueDecomposition, TreatsValuesBelowEpsilonAsZero) {
    // Regardless of the norm: this matrix has the singular value 3e-17, but no rotation is made,
    // and the result is the length of the first column.
    const std::vector<double> a = {1e-17, 2e-17, 2e-17, 1e-17};
    std::vector<double> s(2);
    ASSERT_EQ(qx::SingularValues<qx::ElementType::DBL>(View(a, 2, 2), View(s)), 0);
    EXPECT_NEAR(s[0], std::sqrt(5.0) * 1e-17, 1e-31);
}

ErrorCode SVD2026(const DBL2DArray &a, DBL2DArray &u, DBLArray &s, DBL2DArray &v) {
    return SVD2026_head(a.handle(), 0, u.handle(), s.handle(), v.handle());
}
ErrorCode SVD2026(const CDB2DArray &a, CDB2DArray &u, DBLArray &s, CDB2DArray &v) {
    return CxSVD2026_head(a.handle(), 0, u.handle(), s.handle(), v.handle());
}
ErrorCode Values2026(const DBL2DArray &a, DBLArray &s) {
    return SVDS2026_head(a.handle(), s.handle());
}
ErrorCode Values2026(const CDB2DArray &a, DBLArray &s) {
    return CxSVDS2026_head(a.handle(), s.handle());
}

TEST(SingularValueDecomposition, OfTheRevisionHasTheSameDigitsAtAnyNorm) {
    ForEveryMatrix([](const auto &a, int m, int n) {
        const auto given = Matrix(m, n, a);
        std::decay_t<decltype(given)> scaledU, scaledV, u, v;
        DBLArray s, scaledS;
        ASSERT_EQ(SVD2026(given, scaledU, s, scaledV), 0);
        const Exact U = Contents(scaledU), V = Contents(scaledV);
        EXPECT_LT(FromUnitary(U), 8.0);
        EXPECT_LT(FromUnitary(V), 8.0);
        EXPECT_LT(
            Deviation(U * Exact::Diagonal(std::min(m, n), s.data()) * V.adjoint(), Contents(given)),
            4.0);
        // Down to a scale at which the smallest elements of these matrices are still normal
        // numbers.
        const double largest = static_cast<double>(Contents(given).norm());
        for (const int power : {-900, -60, 20, 900}) {
            if (!(std::ldexp(largest, power) < 0x1p1020) || largest > 0x1p60 * (power < 0))
                continue;
            const auto scaled = Matrix(m, n, Scaled(a, power));
            ASSERT_EQ(SVD2026(scaled, u, scaledS, v), 0);
            EXPECT_EQ(scaledS.values(), Scaled(s.values(), power)) << power;
            EXPECT_EQ((Contents(u) - U).norm(), 0.0L);
            EXPECT_EQ((Contents(v) - V).norm(), 0.0L);
            ASSERT_EQ(Values2026(scaled, scaledS), 0);
            EXPECT_EQ(scaledS.values(), Scaled(s.values(), power)) << power;
        }
    });
}

TEST(QRDecomposition, ReconstructsTheMatrixFromAUnitaryAndATriangularFactor) {
    ForEveryMatrix([](const auto &a, int m, int n) {
        typedef std::decay_t<decltype(a)> Elements;
        constexpr qx::ElementType E = elementIn<Elements>;
        for (const qx::QRForm form : {qx::qrFull, qx::qrEconomical, qx::qrOnlyR}) {
            const int size = form == qx::qrFull ? m : std::min(m, n);
            Elements q(m * size), r(size * n), alone(size * n);
            ASSERT_EQ(qx::QRDecompose<E>(View(a, m, n), form, View(q, m, size), View(r, size, n)),
                      0);
            const Exact A(m, n, a.data()), R(size, n, r.data());
            EXPECT_EQ(R.below(), 0.0);
            if (form == qx::qrOnlyR) {
                EXPECT_LT(Deviation(R.adjoint() * R, A.adjoint() * A), 8.0);
                continue;
            }
            const Exact Q(m, size, q.data());
            EXPECT_LT(Deviation(Q * R, A), 4.0);
            EXPECT_LT(FromUnitary(Q), 8.0);
        }
    });
}

TEST(QRDecomposition, TakesTheLongestColumnFirst) {
    ForEveryMatrix([](const auto &a, int m, int n) {
        typedef std::decay_t<decltype(a)> Elements;
        constexpr qx::ElementType E = elementIn<Elements>;
        const int k = std::min(m, n);
        Elements q(m * k), r(k * n);
        std::vector<int32_t> pivots(n);
        ASSERT_EQ(qx::QRDecomposePivoted<E>(View(a, m, n), qx::qrEconomical, View(pivots),
                                            View(q, m, k), View(r, k, n)),
                  0);
        Exact permuted(m, n);
        const Exact A(m, n, a.data()), Q(m, k, q.data()), R(k, n, r.data());
        for (int i = 0; i < m; ++i)
            for (int j = 0; j < n; ++j)
                permuted(i, j) = A(i, pivots[j]);
        EXPECT_LT(Deviation(Q * R, permuted), 4.0);
        EXPECT_LT(FromUnitary(Q), 8.0);
        for (int i = 1; i < k; ++i)
            EXPECT_LE(std::abs(R(i, i)), std::abs(R(i - 1, i - 1)) * (1.0L + 1e-7L)) << i;
        std::sort(pivots.begin(), pivots.end());
        for (int j = 0; j < n; ++j)
            EXPECT_EQ(pivots[j], j);
    });
}

const MatrixKind &Kind(const char *name) {
    for (const MatrixKind &kind : MatrixKinds())
        if (kind.name == std::string(name))
            return kind;
    throw std::out_of_range(name);
}

template <class Elements>
void ExpectBlockedQR(const Elements &a, int m, int n, qx::QRForm form, bool pivoting) {
    constexpr qx::ElementType E = elementIn<Elements>;
    const int size = form == qx::qrFull ? m : std::min(m, n);
    Elements q(m * size), r(size * n);
    std::vector<int32_t> pivots(pivoting ? n : 0);
    ASSERT_EQ(qx::QRDecomposeBlocked<E>(View(a, m, n), form, View(pivots), View(q, m, size),
                                        View(r, size, n)),
              0);
    const Exact A(m, n, a.data()), Q(m, size, q.data()), R(size, n, r.data());
    Exact permuted(m, n);
    for (int i = 0; i < m; ++i)
        for (int j = 0; j < n; ++j)
            permuted(i, j) = A(i, pivoting ? pivots[j] : j);
    EXPECT_EQ(R.below(), 0.0);
    EXPECT_LT(Deviation(Q * R, permuted), 4.0);
    EXPECT_LT(FromUnitary(Q), 8.0);
    for (int i = 0; i < std::min(m, n); ++i) {
        EXPECT_EQ(R(i, i).imag(), 0.0L);
        if (pivoting && i > 0) {
            EXPECT_LE(std::abs(R(i, i)), std::abs(R(i - 1, i - 1)) * (1.0L + 1e-7L)) << i;
        }
    }
}

TEST(QRDecomposition, BlocksFactorLargeMatrices) {
    for (const auto &sizes : {std::pair(170, 161), std::pair(160, 175)})
        for (const bool pivoting : {false, true})
            for (const qx::QRForm form : {qx::qrFull, qx::qrEconomical}) {
                SCOPED_TRACE(testing::Message() << sizes.first << pivoting << form);
                const int m = sizes.first, n = sizes.second;
                auto real = RealMatrix(Kind("random"), m, n);
                ExpectBlockedQR(real, m, n, form, pivoting);
                ExpectBlockedQR(ComplexMatrix(Kind("random"), m, n), m, n, form, pivoting);
                for (const double size : {0x1p-1015, 0x1p1016}) { // products overflow or underflow
                    auto scaled = real;
                    for (double &element : scaled)
                        element *= size;
                    std::vector<double> q(m * m), r(m * n), same(m * n);
                    ASSERT_EQ(
                        qx::QRDecomposeBlocked<qx::ElementType::DBL>(
                            View(real, m, n), qx::qrFull, {}, View(q, m, m), View(same, m, n)),
                        0);
                    ASSERT_EQ(qx::QRDecomposeBlocked<qx::ElementType::DBL>(
                                  View(scaled, m, n), qx::qrFull, {}, View(q, m, m), View(r, m, n)),
                              0);
                    for (int i = 0; i < m * n; i += 97)
                        EXPECT_NEAR(r[i] / size, same[i], 1e-13);
                }
            }
}

TEST(QRDecomposition, GramSchmidtStaysUnitaryOnDependentColumns) {
    ForEveryMatrix([](const auto &a, int m, int n) {
        typedef std::decay_t<decltype(a)> Elements;
        constexpr qx::ElementType E = elementIn<Elements>;
        for (const auto order : {qx::GramSchmidt::Modified, qx::GramSchmidt::Classical}) {
            Elements q(m * m), r(m * n);
            ASSERT_EQ(qx::QRByGramSchmidt<E>(View(a, m, n), order, View(q, m, m), View(r, m, n)),
                      0);
            const Exact Q(m, m, q.data()), R(m, n, r.data());
            EXPECT_EQ(R.below(), 0.0);
            EXPECT_LT(Deviation(Q * R, Exact(m, n, a.data())), 4.0);
            EXPECT_LT(FromUnitary(Q), 8.0);
            for (int i = 0; i < std::min(m, n); ++i)
                EXPECT_GE(R(i, i).real(), 0.0L);
        }
    });
}

template <class Elements, class Export>
void ExpectLU(const Elements &elements, int m, int n, Export lu) {
    auto a = Matrix(m, n, elements);
    const Exact before = Contents(a);
    I32Array pivots;
    int32_t parity;
    ErrorCode err;
    ASSERT_EQ(lu(a.handle(), pivots.handle(), &parity, &err), 0);
    ASSERT_GE(err, 0);
    const int k = std::min(m, n);
    Exact L(m, k), U(k, n), permuted = before;
    const Exact factors = Contents(a);
    for (int i = 0; i < m; ++i)
        for (int j = 0; j < n; ++j)
            (j < i && j < k ? L(i, j) : U(i, j)) = factors(i, j);
    int exchanges = 0;
    for (int i = 0; i < k; ++i)
        L(i, i) = 1;
    for (int i = 0; i < m; ++i)
        if (pivots.data()[i] != i) {
            ++exchanges;
            for (int j = 0; j < n; ++j)
                std::swap(permuted(i, j), permuted(pivots.data()[i], j));
        }
    EXPECT_LT(Deviation(L * U, permuted), 4.0);
    EXPECT_EQ(parity, exchanges % 2);
    for (int i = 0; i < m; ++i)
        for (int j = 0; j < std::min(i, k); ++j)
            EXPECT_LE(std::abs(L(i, j)), 1.0L);
}
TEST(LU, ReconstructsThePermutedMatrix) {
    for (const char *kind : {"random", "graded", "Hilbert", "Frank"})
        for (const auto &[m, n] : shapes) {
            SCOPED_TRACE(testing::Message() << m << " by " << n << ", " << kind);
            ExpectLU(RealMatrix(Kind(kind), m, n), m, n, LU_head);
            ExpectLU(ComplexMatrix(Kind(kind), m, n), m, n, CxLU_head);
        }
}
TEST(LU, KeepsTheFactorsOfASingularMatrix) {
    const DBL2DArray a(2, 2, {2.0, 4.0, 1.0, 2.0});
    I32Array pivots;
    int32_t parity;
    ErrorCode err;
    LU_head(a.handle(), pivots.handle(), &parity, &err);
    EXPECT_EQ(err, WarnSingular);
    EXPECT_EQ(a.values(), (std::vector<double>{2.0, 4.0, 0.5, 0.0}));
}

// b b^H + I, which is positive definite, and its lower triangle in packed storage.
template <class T>
struct PositiveDefinite {
    explicit PositiveDefinite(const std::vector<T> &b, int n) : a(b) {
        const Exact B(n, n, b.data());
        const Exact A = B * B.adjoint();
        for (int i = 0; i < n; ++i)
            for (int j = 0; j < n; ++j)
                set(a[i * n + j], A(i, j) + static_cast<long double>(i == j));
        for (int j = 0; j < n; ++j)
            for (int i = j; i < n; ++i)
                packed.push_back(a[i * n + j]);
    }
    static void set(double &x, std::complex<long double> value) {
        x = static_cast<double>(value.real());
    }
    static void set(CDB &x, std::complex<long double> value) {
        x = {static_cast<double>(value.real()), static_cast<double>(value.imag())};
    }
    std::vector<T> a, packed;
};
template <class Array>
Exact FromPacked(const Array &packed, int n) {
    const Exact elements(1, packed.size(), packed.data());
    Exact lower(n, n);
    int index = 0;
    for (int j = 0; j < n; ++j)
        for (int i = j; i < n; ++i)
            lower(i, j) = elements(0, index++);
    return lower;
}

template <class T, class Packed, class Full>
void ExpectCholesky(const std::vector<T> &b, int n, Packed cholesky, Packed invert, Full full,
                    Full inverse) {
    const PositiveDefinite<T> matrix(b, n);
    const Exact A(n, n, matrix.a.data());
    auto packed = Vector(matrix.packed);
    ErrorCode err;
    ASSERT_EQ(cholesky(packed.handle(), &err), 0);
    ASSERT_EQ(err, 0);
    const Exact L = FromPacked(packed, n);
    EXPECT_LT(Deviation(L * L.adjoint(), A), 4.0);

    auto square = Matrix(n, n, matrix.a);
    full(square.handle(), &err);
    ASSERT_EQ(err, 0);
    EXPECT_EQ((Contents(square) - L).norm(), 0.0L);

    auto inverted = Matrix(n, n, matrix.a);
    inverse(inverted.handle(), &err);
    ASSERT_EQ(err, 0);
    const Exact inverseMatrix = Contents(inverted);
    const long double condition = A.norm() * inverseMatrix.norm();
    EXPECT_LT((A * inverseMatrix - Exact::Identity(n)).norm(), 4.0L * n * 0x1p-52L * condition);
    EXPECT_EQ((inverseMatrix - inverseMatrix.adjoint()).norm(), 0.0L);

    invert(packed.handle(), &err);
    ASSERT_EQ(err, 0);
    const Exact triangle = FromPacked(packed, n);
    for (int i = 0; i < n; ++i)
        for (int j = 0; j <= i; ++j)
            EXPECT_EQ(triangle(i, j), inverseMatrix(i, j));
}
// The order of operations of every element is the same with and without blocks.
template <class T, class Packed>
void ExpectLeadingBlocks(const std::vector<T> &b, int n, Packed cholesky) {
    const PositiveDefinite<T> matrix(b, n);
    ErrorCode err;
    const auto whole = Vector(matrix.packed);
    ASSERT_EQ(cholesky(whole.handle(), &err), 0);
    const Exact factor = FromPacked(whole, n);
    for (const int order : {7, 30, 61, n - 1}) {
        std::vector<T> block;
        for (int j = 0; j < order; ++j)
            for (int i = j; i < order; ++i)
                block.push_back(matrix.a[i * n + j]);
        const auto leading = Vector(block);
        ASSERT_EQ(cholesky(leading.handle(), &err), 0);
        const Exact some = FromPacked(leading, order);
        for (int i = 0; i < order; ++i)
            for (int j = 0; j <= i; ++j)
                ASSERT_EQ(some(i, j), factor(i, j)) << order << ": " << i << ", " << j;
    }
}
TEST(Cholesky, OfALeadingBlockIsTheLeadingBlock) {
    ExpectLeadingBlocks(RealMatrix(Kind("random"), 130, 130), 130, Cholesky_head);
    ExpectLeadingBlocks(ComplexMatrix(Kind("random"), 130, 130), 130, CxCholesky_head);
}
TEST(Cholesky, FactorsAndInverts) {
    for (const int n : {1, 2, 5, 30, 120}) {
        ExpectCholesky(RealMatrix(Kind("random"), n, n), n, Cholesky_head, Cholesky_InvMatrix_head,
                       FullCholesky_head, InvMatrixChoDri_head);
        ExpectCholesky(ComplexMatrix(Kind("random"), n, n), n, CxCholesky_head,
                       CxCholesky_InvMatrix_head, CxFullCholesky_head, CxInvMatrixChoDri_head);
    }
}
TEST(Cholesky, RefusesWhatIsNotPositiveDefinite) {
    ErrorCode err;
    for (const std::vector<double> &packed :
         {std::vector<double>{1.0, 2.0, 1.0},
          {0.0, 0.0, 1.0},
          {nan, 0.0, 1.0},
          {1.0, 0.0, 1e-17}}) { // the last matrix is definite, but counts as singular
        const DBLArray a(packed);
        Cholesky_head(a.handle(), &err);
        EXPECT_EQ(err, ErrNotPositiveDefinite);
        EXPECT_EQ(a.size(), 0);
    }
    // The factor is (1, 0; 2e7, 0.25): the last diagonal element is small compared with its left
    // neighbour.
    const DBLArray leaning(std::vector<double>{1.0, 2e7, 4e14 + 0.0625});
    Cholesky_head(leaning.handle(), &err);
    EXPECT_EQ(err, ErrNotPositiveDefinite);
    const DBLArray scaled(std::vector<double>{1.0, 0.0, 1e-15});
    Cholesky_head(scaled.handle(), &err);
    EXPECT_EQ(err, 0);
    std::vector<double> late(145 * 146 / 2, 0.0); // a matrix that is factored in blocks
    for (int k = 0, at = 0; k < 145; at += 145 - k++)
        late[static_cast<std::size_t>(at)] = k < 140 ? 1.0 : -1.0;
    const DBLArray lateFailure(late);
    Cholesky_head(lateFailure.handle(), &err);
    EXPECT_EQ(err, ErrNotPositiveDefinite);
    EXPECT_EQ(lateFailure.size(), 0);
    const DBLArray noTriangle(4);
    Cholesky_head(noTriangle.handle(), &err);
    EXPECT_EQ(err, ErrNotSquare);
    const DBLArray zero(std::vector<double>{1.0, 1.0, 0.0});
    Cholesky_InvMatrix_head(zero.handle(), &err);
    EXPECT_EQ(err, ErrSingularMatrix);
}
TEST(Cholesky, InvertsInTheCallersMemory) {
    const PositiveDefinite<double> matrix(RealMatrix(Kind("random"), 6, 6), 6);
    const DBL2DArray a(6, 6, matrix.a), other(6, 6, matrix.a);
    const DBLArray work(25), tooShort(20);
    ErrorCode err;
    PreallocInvMatrixChoDri_H(a.handle(), work.handle(), &err);
    EXPECT_EQ(err, 0);
    EXPECT_EQ(work.size(), 25);
    InvMatrixChoDri_head(other.handle(), &err);
    EXPECT_EQ(a.values(), other.values());
    PreallocInvMatrixChoDri_H(other.handle(), tooShort.handle(), &err);
    EXPECT_EQ(err, ErrSizeMismatch);
    EXPECT_EQ(tooShort.size(), 20);
}

template <class T, class Record, class Packed, class Full>
void ExpectTriangularInverse(const std::vector<T> &b, int n, Packed invertPacked, Full invert) {
    for (const int32_t triangle : {0, 1}) {
        std::vector<T> packed, square(b);
        Exact A(n, n);
        const Exact B(n, n, b.data());
        for (int j = 0; j < n; ++j)
            for (int i = triangle ? 0 : j; i < (triangle ? j + 1 : n); ++i) {
                packed.push_back(b[i * n + j]);
                A(i, j) = B(i, j);
            }
        auto inverse = Matrix(n, n, square);
        ErrorCode err;
        invert(inverse.handle(), &triangle, &err);
        ASSERT_EQ(err, 0);
        const Exact X = Contents(inverse);
        EXPECT_LT((A * X - Exact::Identity(n)).norm(), 4.0L * n * 0x1p-52L * A.norm() * X.norm());
        auto vector = Vector(packed);
        Record record = {vector.handle(), triangle};
        invertPacked(&record, &err);
        ASSERT_EQ(err, 0);
        const Exact elements(1, vector.size(), vector.data());
        int index = 0;
        for (int j = 0; j < n; ++j)
            for (int i = 0; i < n; ++i) {
                const bool inside = triangle ? i <= j : i >= j;
                EXPECT_EQ(X(i, j), inside ? elements(0, index++) : 0) << i << ' ' << j;
            }
    }
}
TEST(TriangularInverse, IsTheInverseAndATriangle) {
    for (const int n : {1, 2, 5, 20})
        for (const char *kind : {"Frank", "graded"}) {
            ExpectTriangularInverse<double, PackedTriangle>(
                RealMatrix(Kind(kind), n, n), n, Tri_InvMatrix_head, InvMatrixTriDri_head);
            ExpectTriangularInverse<CDB, CxPackedTriangle>(
                ComplexMatrix(Kind(kind), n, n), n, CxTri_InvMatrix_head, CxInvMatrixTriDri_head);
        }
}
TEST(TriangularInverse, ChecksPivotAndSelector) {
    ErrorCode err;
    int32_t triangle = 1;
    const DBL2DArray negative(2, 2, {-2.0, 1.0, 0.0, -4.0});
    InvMatrixTriDri_head(negative.handle(), &triangle, &err);
    EXPECT_EQ(err, 0);
    EXPECT_EQ(negative.values(), (std::vector<double>{-0.5, -0.125, 0.0, -0.25}));
    const DBL2DArray small(2, 2, {1.0, 0.0, 0.0, 1e-16});
    InvMatrixTriDri_head(small.handle(), &triangle, &err);
    EXPECT_EQ(err, ErrSingularMatrix);
    triangle = 2;
    InvMatrixTriDri_head(negative.handle(), &triangle, &err);
    EXPECT_EQ(err, ErrInvalidSelector);
    EXPECT_EQ(negative.rows() + negative.cols(), 0);
}

TEST(QRDecomposition, ExportsFollowTheirSelectors) {
    const DBL2DArray a(4, 3, RealMatrix(Kind("Frank"), 4, 3));
    DBL2DArray q, r;
    I32_2DArray permutation;
    EXPECT_EQ(QRDecH(a.handle(), 1, 0, permutation.handle(), q.handle(), r.handle()), 0);
    Exact P(3, 3);
    for (int i = 0; i < 9; ++i)
        P(i / 3, i % 3) = permutation[i];
    EXPECT_LT(Deviation(Contents(q) * Contents(r), Contents(a) * P), 4.0);
    EXPECT_EQ(QRDecH(a.handle(), 0, 2, permutation.handle(), q.handle(), r.handle()), 0);
    EXPECT_EQ(permutation.rows() + permutation.cols() + q.rows() + q.cols(), 0);
    EXPECT_EQ(r.rows(), 3);
    EXPECT_EQ(QRDecH(a.handle(), 0, 3, permutation.handle(), q.handle(), r.handle()),
              ErrInvalidSelector);
    ErrorCode err;
    for (const int32_t algorithm : {0, 1, 2}) {
        qrd_head(a.handle(), &algorithm, q.handle(), r.handle(), &err);
        EXPECT_EQ(err, 0);
        EXPECT_LT(Deviation(Contents(q) * Contents(r), Contents(a)), 4.0) << algorithm;
    }
}

TEST(SingularValueDecomposition, ExportsShapeTheirOutputs) {
    const std::vector<double> elements = RealMatrix(Kind("random"), 3, 5);
    const DBL2DArray a(3, 5, elements), inPlace(3, 5, elements);
    DBL2DArray u, v;
    DBLArray s, alone;
    ErrorCode err;
    EXPECT_EQ(SVDEx_head(a.handle(), 0, u.handle(), s.handle(), v.handle()), 0);
    EXPECT_EQ(SVD_head(inPlace.handle(), alone.handle(), v.handle(), &err), 0);
    EXPECT_EQ(err, 0);
    EXPECT_EQ(inPlace.values(), u.values());
    EXPECT_EQ(v.rows() * 10 + v.cols(), 53);
    EXPECT_EQ(alone.values(), s.values());
    SVDS_head(a.handle(), alone.handle(), &err);
    EXPECT_EQ(alone.values(), s.values());
    EXPECT_EQ(SVDEx_head(a.handle(), 1, u.handle(), s.handle(), v.handle()), 0);
    EXPECT_EQ(v.rows() * 10 + v.cols(), 55);
}

template <class Array, class Reduce, class Balance, class Back>
void ExpectBalancedReduction(Array a, Reduce reduce, Balance balance, Back back) {
    const Exact before = Contents(a);
    const int n = a.rows();
    for (const int32_t job : {0, 1, 2, 3}) {
        Array h = a, q, undone(n, n);
        DBLArray scale;
        int32_t low, high;
        ASSERT_EQ(balance(h.handle(), job, &low, &high, scale.handle()), 0);
        const Exact balanced = Contents(h);
        ASSERT_EQ(reduce(h.handle(), low, high, q.handle()), 0);
        const Exact Q = Contents(q), H = Contents(h);
        EXPECT_LT(Deviation(Q * H * Q.adjoint(), balanced), 4.0);
        EXPECT_LT(FromUnitary(Q), 8.0);
        EXPECT_EQ(H.below(-1), 0.0);
        // The columns of D P, which transforms the original matrix to the balanced one.
        std::vector<typename Array::Value> unit(n * n);
        for (int i = 0; i < n; ++i)
            PositiveDefinite<typename Array::Value>::set(unit[i * n + i], 1.0L);
        Array identity(n, n, unit);
        Array left = identity;
        ASSERT_EQ(back(job, 0, low, high, scale.handle(), identity.handle()), 0);
        ASSERT_EQ(back(job, 1, low, high, scale.handle(), left.handle()), 0);
        const Exact X = Contents(identity), Y = Contents(left);
        EXPECT_EQ((Y.adjoint() * X - Exact::Identity(n)).norm(), 0.0L);
        EXPECT_EQ((before * X - X * balanced).norm(), 0.0L);
        if (job == 2) {
            EXPECT_LT(balanced.norm(), 0.01L * before.norm());
        }
        if (job == 1) {
            EXPECT_EQ(low, 2);
            EXPECT_EQ(high, n - 1);
        }
    }
}
TEST(Balancing, IsAnExactSimilarityForReductionAndBackTransformation) {
    // Row 2 and column 4 are zero except on the diagonal, and the rest is badly scaled.
    const int n = 7;
    std::vector<double> a = RealMatrix(Kind("random"), n, n);
    std::vector<CDB> z = ComplexMatrix(Kind("random"), n, n);
    for (int i = 0; i < n; ++i)
        for (int j = 0; j < n; ++j) {
            const bool isZero = i != j && (i == 2 || j == 4);
            const double factor = isZero ? 0.0 : std::ldexp(1.0, 6 * (i - j));
            a[i * n + j] *= factor;
            z[i * n + j] = {z[i * n + j].re * factor, z[i * n + j].im * factor};
        }
    ExpectBalancedReduction(DBL2DArray(n, n, a), Hessenberg_head, MatrixBalance_head,
                            EigenVBack_head);
    ExpectBalancedReduction(CDB2DArray(n, n, z), CxHessenberg_head, CxMatrixBalance_head,
                            CxEigenVBack_head);
}
TEST(Balancing, ChecksItsRangeAndEndsOnHugeElements) {
    const DBL2DArray a(3, 3, std::vector<double>(9, 1.7e308)), v(3, 3);
    DBL2DArray q;
    DBLArray scale;
    int32_t low, high;
    EXPECT_EQ(MatrixBalance_head(a.handle(), 3, &low, &high, scale.handle()), 0);
    EXPECT_EQ(low * 10 + high, 13);
    EXPECT_EQ(Hessenberg_head(v.handle(), 0, 3, q.handle()), ErrIndexOutOfRange);
    const DBLArray bad(std::vector<double>{4.0, 1.0, 1.0});
    for (const auto &[job, side, lowest, code] : {std::tuple{1, 0, 2, ErrIndexOutOfRange},
                                                  {4, 0, 1, ErrInvalidSelector},
                                                  {1, 2, 1, ErrInvalidSelector},
                                                  {1, 0, 0, ErrIndexOutOfRange}}) {
        const DBL2DArray vectors(3, 3);
        EXPECT_EQ(EigenVBack_head(job, side, lowest, 3, bad.handle(), vectors.handle()), code);
    }
}

// A column is halved while its sum is at least twice that of its row: from 8 and 1 to 2 and 4.
TEST(Balancing, ScalesDownToLessThanTwiceTheRow) {
    const DBL2DArray a(2, 2, {1.0, 1.0, 8.0, 1.0});
    DBLArray scale;
    int32_t low, high;
    EXPECT_EQ(MatrixBalance_head(a.handle(), 2, &low, &high, scale.handle()), 0);
    EXPECT_EQ(scale.values(), (std::vector<double>{0.25, 1.0}));
    EXPECT_EQ(a.values(), (std::vector<double>{1.0, 4.0, 2.0, 1.0}));
}

// Isolated eigenvalues at both ends, found by exchanges that meet the same rows repeatedly.
TEST(Balancing, UndoesManyExchangesInTheirOrder) {
    constexpr int n = 9, front = 3, behind = 3;
    std::vector<int> order(n);
    std::iota(order.begin(), order.end(), 0);
    std::mt19937 random(3);
    for (int round = 0; round < 20; ++round) {
        std::shuffle(order.begin(), order.end(), random);
        const std::vector<double> full = RealMatrix(Kind("random"), n, n);
        std::vector<double> a(n * n, 0.0);
        for (int i = 0; i < n; ++i)
            for (int j = 0; j < n; ++j) // triangular in the first columns and the last rows
                if (i <= j || (j >= front && i < n - behind))
                    a[order[i] * n + order[j]] = full[i * n + j];
        const DBL2DArray matrix(n, n, a);
        const Exact before = Contents(matrix);
        std::vector<double> unit(n * n, 0.0);
        for (int i = 0; i < n; ++i)
            unit[i * n + i] = 1.0;
        const DBL2DArray right(n, n, unit);
        DBLArray scale;
        int32_t low, high;
        ASSERT_EQ(MatrixBalance_head(matrix.handle(), 1, &low, &high, scale.handle()), 0);
        EXPECT_EQ(low, front + 1);
        EXPECT_EQ(high, n - behind);
        ASSERT_EQ(EigenVBack_head(1, 0, low, high, scale.handle(), right.handle()), 0);
        const Exact X = Contents(right), balanced = Contents(matrix);
        EXPECT_EQ((before * X - X * balanced).norm(), 0.0L);
    }
}

// Row indices before and after the block, and beyond both ends of the rows.
TEST(Balancing, RefusesExchangesWithMissingRows) {
    for (const double row : {0.0, 4.0, 1e300, nan})
        for (const int at : {0, 2}) {
            DBLArray scale({1.0, 2.0, 3.0});
            scale.data()[at] = row;
            const DBL2DArray v(3, 1, {1.0, 2.0, 3.0});
            EXPECT_EQ(EigenVBack_head(1, 0, 2, 2, scale.handle(), v.handle()), ErrIndexOutOfRange)
                << row << " at " << at;
        }
}

// Sums whose multiples overflow, and elements that scaling would round.
TEST(Balancing, TerminatesAtBothEndsOfTheExponentRange) {
    DBLArray scale;
    int32_t low, high;
    const DBL2DArray huge(2, 2, {1.0, 1e308, 0.46e308, 1.0});
    EXPECT_EQ(MatrixBalance_head(huge.handle(), 2, &low, &high, scale.handle()), 0);
    EXPECT_EQ(huge[1], 1e308);
    for (int n = 2; n <= 40; ++n) {
        std::vector<double> elements = RealMatrix(MatrixKinds()[0], n, n);
        for (std::size_t i = 0; i < elements.size(); ++i)
            elements[i] = std::ldexp(elements[i], i % 3 == 0 ? -1060 : i % 7 == 0 ? 900 : -1020);
        const DBL2DArray a(n, n, elements);
        EXPECT_EQ(MatrixBalance_head(a.handle(), 2, &low, &high, scale.handle()), 0);
        for (int i = 0; i < n; ++i) {
            int exponent;
            EXPECT_EQ(std::frexp(scale[i], &exponent), 0.5) << "a power of two";
        }
        for (const double x : a.values())
            EXPECT_TRUE(std::isfinite(x));
    }
}

} // namespace
} // namespace qx::test
