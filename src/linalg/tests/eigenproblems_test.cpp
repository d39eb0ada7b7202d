#include "linalg/eigenproblems/general.h"
#include "linalg/eigenproblems/symmetric.h"
#include "linalg/factorisations/balance.h"
#include "linalg/tests/exact.h"
#include "linalg/tests/matrices.h"
#include "qx/qx.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <limits>
#include <vector>

namespace {

using namespace qx::test;

// |a v - w v| is within 4 n eps |a| |v| for every column v of v, and v has unit length. Balancing
// makes that true of the balanced matrix, so it is held against that; where the scales of rows and
// columns lie far apart the two differ.
template <qx::ElementType E, class Elements>
void ExpectEigenpairs(const Elements &a, int n, const std::vector<CDB> &w,
                      const std::vector<CDB> &v) {
    Elements balanced = a;
    std::vector<double> scale(n);
    const qx::Balanced range = qx::Balance<E>(balanced.data(), n, n, false, true, scale.data());
    ASSERT_EQ(range.high, n - 1);
    Exact A(n, n, a.data()), V(n, n, v.data());
    for (int j = 0; j < n; ++j) {
        long double squares = 0;
        for (int i = 0; i < n; ++i)
            squares += std::norm(V(i, j));
        EXPECT_NEAR(static_cast<double>(squares), 1.0, 4e-16 * (n + 4));
        for (int i = 0; i < n; ++i) {
            A(i, j) *= static_cast<long double>(scale[j]) / scale[i];
            V(i, j) /= scale[i];
        }
    }
    const Exact difference = A * V - V * Exact::Diagonal(n, w.data());
    for (int j = 0; j < n; ++j) {
        long double squares = 0, length = 0;
        for (int i = 0; i < n; ++i) {
            squares += std::norm(difference(i, j));
            length += std::norm(V(i, j));
        }
        EXPECT_LE(std::sqrt(squares), 4.0L * n * 0x1p-52L * A.norm() * std::sqrt(length)) << j;
    }
}

TEST(EigenGeneral, PairsSatisfyTheirEquation) {
    for (const int n : {1, 2, 3, 4, 7, 20, 50})
        for (const MatrixKind &kind : MatrixKinds()) {
            SCOPED_TRACE(testing::Message() << kind.name << ", order " << n);
            const std::vector<double> a = RealMatrix(kind, n, n);
            std::vector<CDB> w(n), v(n * n), alone(n);
            ASSERT_EQ(qx::EigenGeneral(a.data(), n, 1, w.data(), v.data()), 0);
            ExpectEigenpairs<qx::ElementType::DBL>(a, n, w, v);
            ASSERT_EQ(qx::EigenGeneral(a.data(), n, 0, alone.data(), nullptr), 0);
            for (int i = 0; i < n; ++i) {
                const bool lower = i > 0 && w[i].im < 0.0;
                EXPECT_EQ(w[i].im, lower ? -w[i - 1].im : std::abs(w[i].im)) << i;
            }
        }
}

TEST(CxEigenGeneral, PairsSatisfyTheirEquation) {
    for (const int n : {1, 2, 3, 4, 7, 20, 50})
        for (const MatrixKind &kind : MatrixKinds()) {
            SCOPED_TRACE(testing::Message() << kind.name << ", order " << n);
            const std::vector<CDB> a = ComplexMatrix(kind, n, n);
            std::vector<CDB> w(n), v(n * n);
            ASSERT_EQ(qx::CxEigenGeneral(a.data(), n, 0, 1, w.data(), v.data()), 0);
            ExpectEigenpairs<qx::ElementType::CDB>(a, n, w, v);
        }
}

// The lower triangle counts.
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
template <class T>
void ExpectSpectralDecomposition(const std::vector<T> &a, int n) {
    std::vector<double> w(n), alone(n);
    std::vector<T> v(n * n);
    ASSERT_EQ(qx::SymmetricEigen(a.data(), n, 1, w.data(), v.data()), 0);
    const Exact V(n, n, v.data());
    EXPECT_LT(Deviation(V * Exact::Diagonal(n, w.data()) * V.adjoint(), Mirrored(a, n)), 4.0);
    EXPECT_LT(FromUnitary(V), 8.0);
    EXPECT_TRUE(std::is_sorted(w.begin(), w.end()));
    ASSERT_EQ(qx::SymmetricEigen(a.data(), n, 0, alone.data(), static_cast<T *>(nullptr)), 0);
    EXPECT_EQ(alone, w);
}
TEST(SymmetricEigen, GivesTheMatrixBackFromOrthonormalVectors) {
    for (const int n : {1, 2, 3, 4, 7, 20, 50})
        for (const MatrixKind &kind : MatrixKinds()) {
            SCOPED_TRACE(testing::Message() << kind.name << ", order " << n);
            ExpectSpectralDecomposition(RealMatrix(kind, n, n), n);
            ExpectSpectralDecomposition(ComplexMatrix(kind, n, n), n);
        }
}

} // namespace
