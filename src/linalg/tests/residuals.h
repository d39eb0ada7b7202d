#ifndef QX_LINALG_TESTS_RESIDUALS_H
#define QX_LINALG_TESTS_RESIDUALS_H

#include "linalg/factorisations/balance.h"
#include "linalg/tests/exact.h"
#include "linalg/tests/matrices.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <vector>

namespace qx::test {

// How well results satisfy their defining equations, computed in long double.

// |a - b| / |b|
inline double RelativeDeviation(const Exact &a, const Exact &b) {
    return static_cast<double>((a - b).norm() / b.norm());
}
// The same in units of n eps, with the larger dimension of b as n; absolute where b is 0.
inline double Deviation(const Exact &a, const Exact &b) {
    const long double unit = std::max(b.rows(), b.cols()) * 0x1p-52L;
    const long double size = b.norm(), difference = (a - b).norm();
    return static_cast<double>((size == 0 ? difference : difference / size) / unit);
}
// The deviation of the columns from orthonormality, in the same unit.
inline double FromUnitary(const Exact &q) {
    const long double difference = (q.adjoint() * q - Exact::Identity(q.cols())).norm();
    return static_cast<double>(difference / (std::max(q.rows(), q.cols()) * 0x1p-52L));
}

// |b - a x| / (|a| |x|) in units of n eps: the backward error of a solution.
template <class T>
double BackwardError(const std::vector<T> &a, int n, const std::vector<T> &b,
                     const std::vector<T> &x) {
    const int columns = static_cast<int>(b.size()) / n;
    const Exact A(n, n, a.data()), X(n, columns, x.data());
    const Exact residual = Exact(n, columns, b.data()) - A * X;
    const long double scale = A.norm() * X.norm() * n * 0x1p-52L;
    return scale == 0 ? 0 : static_cast<double>(residual.norm() / scale);
}

// The minimum-norm solution: x is in the row space, and the residual is orthogonal to the columns.
template <class T>
void ExpectLeastSquares(const std::vector<T> &a, int m, int n, const std::vector<T> &b,
                        const std::vector<T> &x) {
    const Exact A(m, n, a.data()), X(n, 1, x.data()), B(m, 1, b.data());
    const Exact residual = B - A * X;
    EXPECT_LT(static_cast<double>((A.adjoint() * residual).norm() / (A.norm() * B.norm())),
              1e-14 * (m + n));
}

// The four conditions of Penrose.
inline void ExpectPseudoInverse(const Exact &a, const Exact &x) {
    const long double unit = 0x1p-52L * std::max(a.rows(), a.cols()) * a.norm() * x.norm();
    EXPECT_LT((a * x * a - a).norm(), 8 * unit * a.norm());
    EXPECT_LT((x * a * x - x).norm(), 8 * unit * x.norm());
    EXPECT_LT((a * x - (a * x).adjoint()).norm(), 8 * unit);
    EXPECT_LT((x * a - (x * a).adjoint()).norm(), 8 * unit);
}

// Checks that |a v - w v| is within 4 n eps |a| |v| for every column of v, and that the columns
// have unit length. Because of balancing, the bound holds for the balanced matrix, which differs
// from a if the scales of rows and columns are far apart.
template <class Elements>
void ExpectEigenpairs(const Elements &a, int n, const std::vector<CDB> &w,
                      const std::vector<CDB> &v) {
    constexpr ElementType E = elementIn<Elements>;
    Elements balanced = a;
    std::vector<double> scale(n);
    const Balanced range = Balance<E>(View(balanced, n, n), false, true, View(scale));
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

// The residual of a matrix equation (0: a x + x b = c, 1: a x - x b = c, 2: a x b - x = c) in units
// of eps (|a| + |b|) |x| or eps (|a| |b| + 1) |x|.
inline double ResidualRatio(const Exact &a, const Exact &b, const Exact &c, int32_t equation,
                            const Exact &x) {
    const Exact residual = equation == 0   ? a * x - (c - x * b)
                           : equation == 1 ? a * x - x * b - c
                                           : a * x * b - x - c;
    const long double size = equation == 2 ? a.norm() * b.norm() + 1 : a.norm() + b.norm();
    return static_cast<double>(residual.norm() / (0x1p-52L * size * x.norm()));
}

} // namespace qx::test

#endif
