#include "linalg/eigenproblems/general.h"
#include "linalg/eigenproblems/symmetric.h"
#include "linalg/factorisations/balance.h"
#include "linalg/tests/host_matrix.h"
#include "linalg/tests/matrices.h"
#include "linalg/tests/residuals.h"
#include "qx/qx.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <limits>
#include <vector>

namespace qx::test {
namespace {

template <class Elements, class Solver>
void ExpectEigenproblemSolvedBy(Solver solve, const Elements &a, int n) {
    constexpr qx::ElementType E = elementIn<Elements>;
    std::vector<CDB> w(n), v(n * n), alone(n);
    ASSERT_EQ(solve(View(a, n, n), View(w), View(v, n, n)), 0);
    ExpectEigenpairs(a, n, w, v);
    ASSERT_EQ(solve(View(a, n, n), View(alone), {}), 0);
    for (int i = 0; E == qx::ElementType::DBL && i < n; ++i) {
        const bool lower = i > 0 && w[i].im < 0.0;
        EXPECT_EQ(w[i].im, lower ? -w[i - 1].im : std::abs(w[i].im)) << i;
    }
}
template <class Elements>
void ExpectEigenproblemSolved(const Elements &a, int n) {
    ExpectEigenproblemSolvedBy(qx::EigenGeneral<elementIn<Elements>>, a, n);
}

TEST(EigenGeneral, PairsSatisfyTheirEquation) {
    for (const int n : {1, 2, 3, 4, 7, 20, 50})
        for (const MatrixKind &kind : MatrixKinds()) {
            SCOPED_TRACE(testing::Message() << kind.name << ", order " << n);
            ExpectEigenproblemSolved(RealMatrix(kind, n, n), n);
            ExpectEigenproblemSolved(ComplexMatrix(kind, n, n), n);
        }
}

TEST(EigenGeneral, BlocksSolveLargeProblems) {
    for (const char *name : {"random", "Frank"})
        for (const MatrixKind &kind : MatrixKinds()) {
            if (kind.name != std::string(name))
                continue;
            for (const int n : {159, 170}) {
                SCOPED_TRACE(testing::Message() << name << ", order " << n);
                const auto real = RealMatrix(kind, n, n);
                const auto complex = ComplexMatrix(kind, n, n);
                ExpectEigenproblemSolvedBy(qx::EigenBlocked<qx::ElementType::DBL>, real, n);
                ExpectEigenproblemSolvedBy(qx::EigenBlocked<qx::ElementType::CDB>, complex, n);
            }
        }
    // Extreme sizes, and an element that is not finite.
    const int n = 160;
    std::vector<double> a(n * n);
    for (const double size : {1e-300, 1e300}) {
        for (int i = 0; i < n * n; ++i)
            a[i] = i % n <= i / n ? size * (1 + i / n) : 0.0; // lower triangle
        std::vector<CDB> w(n), v(n * n);
        ASSERT_EQ(qx::EigenBlocked<qx::ElementType::DBL>(View(a, n, n), View(w), View(v, n, n)), 0);
        double sum = 0.0, largest = 0.0;
        for (const CDB &value : w) {
            sum += value.re / size;
            largest = std::max(largest, static_cast<double>(value.re));
        }
        EXPECT_NEAR(sum / (n * (n + 1) / 2), 1.0, 1e-12);
        EXPECT_NEAR(largest / (n * size), 1.0, 1e-12);
    }
    a[3] = std::numeric_limits<double>::infinity();
    std::vector<CDB> w(n);
    EXPECT_EQ(qx::EigenBlocked<qx::ElementType::DBL>(View(a, n, n), View(w), {}),
              ErrNonFiniteInput);
}

// Only the lower triangle is used.
template <class T>
Exact Mirrored(const std::vector<T> &a, int n) {
    Exact result(n, n, a.data());
    for (int i = 0; i < n; ++i) {
        result(i, i) = result(i, i).real();
        for (int j = i + 1; j < n; ++j)
            result(i, j) = std::conj(result(j, i));
    }
    return result;
}
template <class T, class Solver>
void ExpectSpectralDecompositionBy(Solver solve, const std::vector<T> &a, int n,
                                   double slackOfValuesAlone) {
    std::vector<double> w(n), alone(n);
    std::vector<T> v(n * n);
    ASSERT_EQ(solve(View(a, n, n), View(w), View(v, n, n)), 0);
    const Exact V(n, n, v.data());
    EXPECT_LT(Deviation(V * Exact::Diagonal(n, w.data()) * V.adjoint(), Mirrored(a, n)), 4.0);
    EXPECT_LT(FromUnitary(V), 8.0);
    EXPECT_TRUE(std::is_sorted(w.begin(), w.end()));
    ASSERT_EQ(solve(View(a, n, n), View(alone), {}), 0);
    const double largest = std::max(std::abs(w[0]), std::abs(w[n - 1]));
    for (int i = 0; i < n; ++i)
        EXPECT_LE(std::abs(alone[i] - w[i]), slackOfValuesAlone * largest) << i;
}
template <class T>
void ExpectSpectralDecomposition(const std::vector<T> &a, int n) {
    ExpectSpectralDecompositionBy(qx::SymmetricEigen<elementIn<std::vector<T>>>, a, n, 0.0);
}
TEST(SymmetricEigen, ReconstructsTheMatrixFromOrthonormalVectors) {
    for (const int n : {1, 2, 3, 4, 7, 20, 50})
        for (const MatrixKind &kind : MatrixKinds()) {
            SCOPED_TRACE(testing::Message() << kind.name << ", order " << n);
            ExpectSpectralDecomposition(RealMatrix(kind, n, n), n);
            ExpectSpectralDecomposition(ComplexMatrix(kind, n, n), n);
        }
}

TEST(SymmetricEigen, BlocksSolveLargeProblems) {
    const auto real = qx::SymmetricEigenBlocked<qx::ElementType::DBL>;
    const auto complex = qx::SymmetricEigenBlocked<qx::ElementType::CDB>;
    for (const int n : {63, 64, 130})
        for (const MatrixKind &kind : MatrixKinds()) {
            SCOPED_TRACE(testing::Message() << kind.name << ", order " << n);
            ExpectSpectralDecompositionBy(real, RealMatrix(kind, n, n), n, 4e-16 * n);
            ExpectSpectralDecompositionBy(complex, ComplexMatrix(kind, n, n), n, 4e-16 * n);
        }
    // Equal eigenvalues, of which divide and conquer deflates all but one.
    const int n = 100;
    for (const double size : {1e-300, 1.0, 1e300}) {
        std::vector<double> a(n * n, size);
        for (int i = 0; i < n; ++i)
            a[i * n + i] = 3.0 * size;
        ExpectSpectralDecompositionBy(real, a, n, 4e-16 * n);
        std::vector<double> w(n);
        ASSERT_EQ(real(View(a, n, n), View(w), View(a, n, n)), 0); // in place
        EXPECT_NEAR(w[0] / size, 2.0, 1e-12);
        EXPECT_NEAR(w[n - 2] / size, 2.0, 1e-12);
        EXPECT_NEAR(w[n - 1] / size, 102.0, 1e-12);
        a[n] = std::numeric_limits<double>::quiet_NaN();
        EXPECT_EQ(real(View(a, n, n), View(w), {}), ErrNonFiniteInput);
    }
}

TEST(Eigenproblems, RefuseOtherSelectors) {
    const CDB2DArray z(1, 1, {{2.0, 0.0}});
    CDBArray values;
    CDB2DArray vectors;
    DBLArray realValues;
    const int32_t good = 0;
    for (const int32_t bad : {-1, 2}) {
        const DBL2DArray a(1, 1, {2.0}); // the last export overwrites it
        ErrorCode err[4] = {};
        EigenValueVector_head(a.handle(), &bad, values.handle(), vectors.handle(), &err[0]);
        CxEigenValueVector_head(z.handle(), &good, &bad, values.handle(), vectors.handle(),
                                &err[1]);
        CxEigenValueVector_head(z.handle(), &bad, &good, values.handle(), vectors.handle(),
                                &err[2]);
        SymEvectorEvalue_head(a.handle(), &bad, realValues.handle(), &err[3]);
        for (const ErrorCode each : err)
            EXPECT_EQ(each, ErrInvalidSelector) << bad;
    }
}

TEST(Eigenproblems, ExportsFollowTheirSelectors) {
    const DBL2DArray rotation(2, 2, {0.0, -1.0, 1.0, 0.0});
    CDBArray values;
    CDB2DArray vectors;
    ErrorCode err;
    int32_t output = 1;
    EigenValueVector_head(rotation.handle(), &output, values.handle(), vectors.handle(), &err);
    EXPECT_EQ(err, 0);
    EXPECT_NEAR(values[0].im, 1.0, 1e-15);
    EXPECT_NEAR(values[1].im, -1.0, 1e-15);
    const DBL2DArray single(1, 1, {-7.0});
    EigenValueVector_head(single.handle(), &output, values.handle(), vectors.handle(), &err);
    EXPECT_EQ(values[0].re, -7.0);
    EXPECT_EQ(vectors[0].re, 1.0);
    output = 0;
    EigenValueVector_head(rotation.handle(), &output, values.handle(), vectors.handle(), &err);
    EXPECT_EQ(err, 0);
    EXPECT_EQ(vectors.rows() + vectors.cols(), 0);
    output = 2;
    EigenValueVector_head(rotation.handle(), &output, values.handle(), vectors.handle(), &err);
    EXPECT_EQ(err, ErrInvalidSelector);
    const DBL2DArray bad(2, 2, {1.0, std::numeric_limits<double>::quiet_NaN(), 0.0, 1.0});
    output = 1;
    EigenValueVector_head(bad.handle(), &output, values.handle(), vectors.handle(), &err);
    EXPECT_EQ(err, ErrNonFiniteInput);
    EXPECT_EQ(values.size() + vectors.rows(), 0);
    const DBL2DArray symmetric(2, 2, {2.0, 9.0, 1.0, 2.0}); // the upper triangle is not read
    DBLArray real;
    output = 0;
    SymEvectorEvalue_head(symmetric.handle(), &output, real.handle(), &err);
    EXPECT_NEAR(real[0], 1.0, 1e-15);
    EXPECT_NEAR(real[1], 3.0, 1e-15);
    EXPECT_EQ(symmetric.values(), (std::vector<double>{2.0, 9.0, 1.0, 2.0}));
}

template <class Elements, class Export>
void ExpectSchur(const Elements &elements, int n, int32_t order, Export schur) {
    auto t = Matrix(n, n, elements);
    decltype(t) u;
    CDBArray w;
    ASSERT_EQ(schur(t.handle(), 1, order, u.handle(), w.handle()), 0);
    const Exact U = Contents(u), T = Contents(t), A(n, n, elements.data());
    EXPECT_LT(Deviation(U * T * U.adjoint(), A), 20.0);
    EXPECT_LT(FromUnitary(U), 20.0);
    const bool isComplex = std::is_same_v<Elements, std::vector<CDB>>;
    EXPECT_EQ(T.below(isComplex ? 0 : -1), 0.0);
    for (int i = 0; i < n; ++i) {
        if (isComplex) {
            EXPECT_EQ(std::complex<long double>(w[i].re, w[i].im), T(i, i));
        } else if (w[i].im == 0.0) {
            EXPECT_EQ(w[i].re, T(i, i).real());
        } else if (i + 1 < n && T(i + 1, i) != 0.0L) {
            EXPECT_GT(w[i].im, 0.0);
            EXPECT_EQ(w[i + 1].im, -w[i].im);
            EXPECT_NEAR(w[i].im * w[i].im, static_cast<double>(-(T(i + 1, i) * T(i, i + 1)).real()),
                        1e-14 * w[i].im * w[i].im);
        }
    }
    for (int i = 0; order != 0 && i + 1 < n; ++i) {
        const double a = order < 3 ? w[i].re : std::hypot(w[i].re, w[i].im);
        const double b = order < 3 ? w[i + 1].re : std::hypot(w[i + 1].re, w[i + 1].im);
        const double rounding = 1e-9 * (1.0 + std::abs(a));
        EXPECT_TRUE(order % 2 == 1 ? a <= b + rounding : a >= b - rounding) << i;
    }
}
TEST(Schur, ReconstructsTheMatrixWithItsEigenvaluesInOrder) {
    for (const int n : {1, 2, 6, 25})
        for (const int32_t order : {0, 1, 2, 3, 4}) {
            SCOPED_TRACE(testing::Message() << "order " << order << ", n " << n);
            ExpectSchur(RealMatrix(MatrixKinds()[0], n, n), n, order, Schur80_head);
            ExpectSchur(RealMatrix(MatrixKinds()[0], n, n), n, order, Schur2026_head);
            ExpectSchur(ComplexMatrix(MatrixKinds()[0], n, n), n, order, CxSchur80_head);
        }
    // From order 150 on, the number of LAPACK's shifts depends on logarithms.
    ExpectSchur(RealMatrix(MatrixKinds()[0], 160, 160), 160, 0, Schur80_head);
    ExpectSchur(ComplexMatrix(MatrixKinds()[0], 160, 160), 160, 0, CxSchur80_head);
}
TEST(Schur, OfTheRevisionIsInOrderForGradedMatrices) {
    constexpr int n = 30;
    int elderOutOfOrder = 0;
    for (uint64_t seed = 1; seed <= 8; ++seed)
        for (const int32_t order : {1, 2, 3, 4}) {
            SCOPED_TRACE(testing::Message() << "order " << order << ", seed " << seed);
            auto a = qx::test::Reals(n * n, seed);
            for (int i = 0; i < n * n; ++i)
                a[i] = std::ldexp(a[i], -2 * (i / n + i % n));
            ExpectSchur(a, n, order, Schur2026_head);
            const auto isInOrder = [&](auto schur) {
                auto t = Matrix(n, n, a);
                decltype(t) u;
                CDBArray w;
                EXPECT_EQ(schur(t.handle(), 0, order, u.handle(), w.handle()), 0);
                bool result = true;
                for (int i = 1; i < n; ++i) {
                    const double last =
                        order < 3 ? w[i - 1].re : std::hypot(w[i - 1].re, w[i - 1].im);
                    const double next = order < 3 ? w[i].re : std::hypot(w[i].re, w[i].im);
                    result = result && (order % 2 == 1 ? last <= next : last >= next);
                }
                return result;
            };
            EXPECT_TRUE(isInOrder(Schur2026_head));
            elderOutOfOrder += isInOrder(Schur80_head) ? 0 : 1;
        }
    EXPECT_GT(elderOutOfOrder, 0) << "the matrices are no test";
}

} // namespace
} // namespace qx::test
