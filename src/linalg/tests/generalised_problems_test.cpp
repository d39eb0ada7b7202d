#include "linalg/tests/host_matrix.h"
#include "linalg/tests/matrices.h"
#include "linalg/tests/residuals.h"
#include "qx/qx.h"

#include <gtest/gtest.h>

#include <cmath>
#include <vector>

namespace qx::test {
namespace {

template <class T>
std::vector<T> Noisy(int m, int n, int seed);
template <>
std::vector<double> Noisy(int m, int n, int seed) {
    std::vector<double> a = RealMatrix(MatrixKinds()[0], m, n + seed);
    a.resize(m * n);
    return a;
}
template <>
std::vector<CDB> Noisy(int m, int n, int seed) {
    std::vector<CDB> a = ComplexMatrix(MatrixKinds()[0], m, n + seed);
    a.resize(m * n);
    return a;
}

std::complex<long double> Number(double x) { return x; }
std::complex<long double> Number(CDB x) { return {x.re, x.im}; }

template <class T, class Vector, class Export>
void ExpectPencil(int n, int32_t order, Export qz) {
    auto a = Matrix(n, n, Noisy<T>(n, n, 0)), b = Matrix(n, n, Noisy<T>(n, n, 1));
    const Exact A = Contents(a), B = Contents(b);
    decltype(a) q, z;
    CDBArray alpha;
    Vector beta;
    CDB2DArray vectors;
    ASSERT_EQ(qz(a.handle(), b.handle(), order, q.handle(), z.handle(), alpha.handle(),
                 beta.handle(), vectors.handle()),
              0);
    const Exact Q = Contents(q), Z = Contents(z), V = Contents(vectors);
    EXPECT_LT(Deviation(Q * Contents(a) * Z.adjoint(), A), 20.0);
    EXPECT_LT(Deviation(Q * Contents(b) * Z.adjoint(), B), 20.0);
    EXPECT_LT(FromUnitary(Q), 20.0);
    EXPECT_LT(FromUnitary(Z), 20.0);
    EXPECT_EQ(Contents(b).below(), 0.0);
    EXPECT_EQ(Contents(a).below(std::is_same_v<T, double> ? -1 : 0), 0.0);

    const Exact AV = A * V, BV = B * V;
    long double last = 0;
    for (int j = 0; j < n; ++j) {
        const auto x = Number(alpha[j]), y = Number(beta[j]);
        long double length = 0, residual = 0;
        for (int i = 0; i < n; ++i) {
            length += std::norm(V(i, j));
            residual += std::norm(y * AV(i, j) - x * BV(i, j));
        }
        EXPECT_NEAR(static_cast<double>(length), 1.0, 1e-14);
        EXPECT_LT(std::sqrt(residual),
                  1e-13L * n * (std::abs(y) * A.norm() + std::abs(x) * B.norm()));
        const long double key = order >= 3 ? std::abs(x / y) : (x / y).real();
        const long double rounding = 1e-9L * (1 + std::abs(key));
        if (order != 0 && j > 0) {
            EXPECT_TRUE(order % 2 == 1 ? key >= last - rounding : key <= last + rounding) << j;
        }
        last = key;
    }
}
TEST(GeneralisedSchur, ReconstructsBothMatricesInOrderWithEigenvectors) {
    for (const int n : {1, 2, 5, 16})
        for (const int32_t order : {0, 1, 2, 3, 4}) {
            SCOPED_TRACE(testing::Message() << "n " << n << ", order " << order);
            ExpectPencil<double, DBLArray>(n, order, TmiQZ_head);
            ExpectPencil<CDB, CDBArray>(n, order, CxTmiQZ_head);
        }
}

// A Schur form that contains NaN has no eigenvalues.
TEST(GeneralisedSchur, OverflowHasItsOwnCode) {
    std::vector<CDB> elements = Noisy<CDB>(20, 20, 0), others = Noisy<CDB>(20, 20, 1);
    for (CDB &z : others)
        z = {z.re < 0 ? -1.7e308 : 1.7e308, z.im < 0 ? -1.7e308 : 1.7e308};
    auto a = Matrix(20, 20, elements), b = Matrix(20, 20, others);
    CDB2DArray q, z, vectors;
    CDBArray alpha, beta;
    EXPECT_EQ(CxTmiQZ_head(a.handle(), b.handle(), 0, q.handle(), z.handle(), alpha.handle(),
                           beta.handle(), vectors.handle()),
              ErrConditionTooHigh);
    EXPECT_EQ(vectors.rows(), 0);
}

TEST(GeneralisedSchur, RevisionsAgree) {
    const std::vector<double> elements = Noisy<double>(6, 6, 0), others = Noisy<double>(6, 6, 1);
    DBL2DArray a(6, 6, elements), b(6, 6, others), c = a, d = b, q, z;
    CDBArray alpha;
    DBLArray beta;
    EXPECT_EQ(
        QZ_head(a.handle(), b.handle(), 0, q.handle(), z.handle(), alpha.handle(), beta.handle()),
        0);
    EXPECT_EQ(q.rows() + z.rows(), 0);
    EXPECT_EQ(QZ80_head(c.handle(), d.handle(), 1, 0, q.handle(), z.handle(), alpha.handle(),
                        beta.handle()),
              0);
    EXPECT_EQ(a.values(), c.values());
    EXPECT_EQ(b.values(), d.values());
}

TEST(GeneralisedEigen, ReportsInfiniteAndUndeterminedValues) {
    const DBL2DArray a(3, 3, {6, 0, 0, 0, 5, 0, 0, 0, 0}), b(3, 3, {2, 0, 0, 0, 0, 0, 0, 0, 0});
    CDBArray values;
    CDB2DArray vectors;
    EXPECT_EQ(GenEigenEx_head(a.handle(), b.handle(), 0, values.handle(), vectors.handle()), 0);
    EXPECT_EQ(vectors.rows(), 0);
    EXPECT_DOUBLE_EQ(values[0].re, 3.0);
    EXPECT_TRUE(std::isinf(values[1].re));
    EXPECT_TRUE(std::isnan(values[2].re));
    EXPECT_EQ(GenEigenEx_head(a.handle(), DBL2DArray(3, 2).handle(), 0, values.handle(),
                              vectors.handle()),
              ErrBandVectorSize);
    EXPECT_EQ(GenEigenEx_head(a.handle(), b.handle(), 2, values.handle(), vectors.handle()),
              ErrInvalidSelector);
    EXPECT_EQ(values.size(), 0);
}

template <class T, class Export>
void ExpectGSVD(int m, int n, int p, Export gsvd) {
    auto a = Matrix(m, n, Noisy<T>(m, n, 0)), b = Matrix(p, n, Noisy<T>(p, n, 1));
    const Exact A = Contents(a), B = Contents(b);
    decltype(a) u, v, q;
    DBLArray alpha, beta;
    int32_t k, l;
    ASSERT_EQ(gsvd(a.handle(), b.handle(), alpha.handle(), beta.handle(), u.handle(), v.handle(),
                   q.handle(), &k, &l),
              0);
    const Exact U = Contents(u), V = Contents(v), Q = Contents(q);
    for (const Exact *factor : {&U, &V, &Q})
        EXPECT_LT(FromUnitary(*factor), 20.0);
    EXPECT_EQ(l, std::min(p, n));
    EXPECT_EQ(k + l, std::min(m + p, n));
    const Exact C = U.adjoint() * A * Q, S = V.adjoint() * B * Q;
    const double rounding = 1e-13 * (m + n + p);
    for (int i = 0; i < k + l; ++i)
        EXPECT_NEAR(alpha[i] * alpha[i] + beta[i] * beta[i], 1.0, 1e-14);
    // The rows of both are multiples of the same rows of r.
    for (int i = 0; k + i < std::min(m, k + l); ++i)
        for (int j = 0; j < n; ++j)
            EXPECT_NEAR(
                static_cast<double>(std::abs(static_cast<long double>(beta[k + i]) * C(k + i, j) -
                                             static_cast<long double>(alpha[k + i]) * S(i, j))),
                0.0, rounding);
    for (int i = l; i < p; ++i)
        for (int j = 0; j < n; ++j)
            EXPECT_NEAR(static_cast<double>(std::abs(S(i, j))), 0.0, rounding);
}
TEST(GeneralisedSingularValues, MakeBothMatricesDiagonalOverOneTriangle) {
    for (const auto &[m, n, p] :
         {std::tuple{1, 1, 1}, {6, 4, 5}, {3, 5, 4}, {2, 6, 3}, {4, 5, 2}}) {
        SCOPED_TRACE(testing::Message() << m << ' ' << n << ' ' << p);
        ExpectGSVD<double>(m, n, p, GSVD_head);
        ExpectGSVD<CDB>(m, n, p, CxGSVD_head);
    }
}

} // namespace
} // namespace qx::test
