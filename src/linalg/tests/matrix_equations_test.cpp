#include "linalg/tests/host_matrix.h"
#include "linalg/tests/matrices.h"
#include "linalg/tests/residuals.h"
#include "qx/qx.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <limits>
#include <string>
#include <vector>

namespace qx::test {
namespace {

typedef std::vector<double> Elements;

template <class Array>
ErrorCode Sylvester(const Array &a, const Array &b, const Array &c, int32_t equation, Array &x) {
    if constexpr (std::is_same_v<Array, DBL2DArray>)
        return Sylvester2011_head(a.handle(), b.handle(), c.handle(), equation, x.handle());
    else
        return CxSylvester2011_head(a.handle(), b.handle(), c.handle(), equation, x.handle());
}
template <class Array>
ErrorCode Lyapunov(const Array &a, const Array &q, int32_t equation, Array &x) {
    if constexpr (std::is_same_v<Array, DBL2DArray>)
        return Lyapunov2011_head(a.handle(), q.handle(), equation, x.handle());
    else
        return CxLyapunov2011_head(a.handle(), q.handle(), equation, x.handle());
}

// Solves all equations, except those that are reported as singular. Returns the number solved.
template <class Array>
int ExpectSmallResiduals(const Array &a, const Array &b, const Array &c) {
    int solved = 0;
    for (int32_t equation = 0; equation < 3; ++equation) {
        Array x;
        const ErrorCode status = Sylvester(a, b, c, equation, x);
        if (status == ErrSingularMatrix)
            continue;
        EXPECT_EQ(status, 0) << equation;
        EXPECT_LT(ResidualRatio(Contents(a), Contents(b), Contents(c), equation, Contents(x)), 10)
            << equation;
        ++solved;
    }
    for (int32_t equation = 0; equation < 2; ++equation) {
        Array x, q = a;
        for (int i = 0; i < a.rows() * a.rows(); ++i)
            q.data()[i] = c[i % (c.rows() * c.cols())];
        const ErrorCode status = Lyapunov(a, q, equation, x);
        if (status == ErrSingularMatrix)
            continue;
        EXPECT_EQ(status, 0) << "Lyapunov " << equation;
        const Exact A = Contents(a), zero(a.rows(), a.rows());
        const Exact right = equation == 0 ? Contents(q) : zero - Contents(q);
        EXPECT_LT(ResidualRatio(A, A.adjoint(), right, 2 * equation, Contents(x)), 10)
            << "Lyapunov " << equation;
        ++solved;
    }
    return solved;
}

const std::vector<MatrixKind> &Kinds() {
    typedef qx::test::Noise Noise;
    static const std::vector<MatrixKind> kinds = {
        MatrixKinds()[0], // random
        {"graded, regular",
         [](int i, int j, int, int n, Noise &noise) {
             return (noise.symmetric() + (i == j ? n : 0)) * std::ldexp(1.0, -(i + j) % 40);
         }},
        {"badly scaled, regular",
         [](int i, int j, int, int n, Noise &noise) {
             return (noise.symmetric() + (i == j ? n : 0)) * std::ldexp(1.0, (i % 3 - j % 3) * 15);
         }},
        {"defective",
         [](int i, int j, int, int, Noise &) { return i == j       ? 0.75
                                                      : j == i + 1 ? 1.0
                                                                   : 0.0; }},
        {"nearly defective",
         [](int i, int j, int, int, Noise &) {
             return i == j ? 2.0 : j == i + 1 ? 1.0 : j == 0 && i > 0 ? 1e-10 : 0.0;
         }},
        {"nearly singular",
         [](int i, int j, int, int n, Noise &noise) {
             return i > j ? 0.0 : i == j ? (i == n / 2 ? 1e-12 : 1.0 + i) : noise.symmetric();
         }},
        {"rotations",
         [](int i, int j, int, int, Noise &noise) {
             return i / 2 == j / 2 ? (i == j ? 0.3 + 0.1 * (i / 2) : i - j)
                                   : noise.symmetric() * (j > i);
         }},
        {"permutation",
         [](int i, int j, int, int n, Noise &) { return (i + 1) % n == j ? 1.5 : 0.0; }},
        MatrixKinds()[10], // Frank
        MatrixKinds()[12], // Grcar
    };
    return kinds;
}

TEST(MatrixEquations, LeaveSmallResiduals) {
    for (const MatrixKind &kind : Kinds())
        for (const auto &[m, n] : {std::pair{1, 1}, {2, 5}, {8, 8}, {31, 12}, {40, 40}}) {
            SCOPED_TRACE(testing::Message() << kind.name << ' ' << m << " by " << n);
            const int solved = ExpectSmallResiduals(Matrix(m, m, RealMatrix(kind, m, m)),
                                                    Matrix(n, n, RealMatrix(kind, n, n)),
                                                    Matrix(m, n, Reals(m * n, 1)));
            const int complex = ExpectSmallResiduals(Matrix(m, m, ComplexMatrix(kind, m, m)),
                                                     Matrix(n, n, ComplexMatrix(kind, n, n)),
                                                     Matrix(m, n, Complexes(m * n, 1)));
            EXPECT_GE(std::min(solved, complex), 2) << "most of them have solutions";
        }
}
TEST(MatrixEquations, LeaveSmallResidualsAtOrderTwoHundred) {
    const int n = 200;
    EXPECT_EQ(ExpectSmallResiduals(Matrix(n, n, Reals(n * n, 1)), Matrix(n, n, Reals(n * n, 2)),
                                   Matrix(n, n, Reals(n * n, 3))),
              5);
}
// Elements from 2^-400 to 1; the eigenvalues far down the diagonal are below eps times the norm.
TEST(MatrixEquations, TakeStronglyGradedMatrices) {
    const int n = 200;
    DBL2DArray a = Matrix(n, n, Reals(n * n, 1)), x;
    const DBL2DArray b = Matrix(2, 2, Elements{4, 1, -1, 4}), c = Matrix(n, 2, Reals(2 * n, 2));
    for (int i = 0; i < n; ++i)
        for (int j = 0; j < n; ++j)
            a.data()[i * n + j] = std::ldexp(a[i * n + j], -i - j);
    ASSERT_EQ(Sylvester(a, b, c, 0, x), 0);
    EXPECT_LT(ResidualRatio(Contents(a), Contents(b), Contents(c), 0, Contents(x)), 10);
}

// a and b have well-separated integer eigenvalues, and x consists of integers, so that c is exact.
TEST(MatrixEquations, FindAKnownSolution) {
    const DBL2DArray a(3, 3, {4, 1, 0, -2, 5, 1, 1, 0, 6}), b(2, 2, {2, 3, -1, 1});
    const DBL2DArray x(3, 2, {3, -7, 2, 5, -1, 4});
    const Exact A = Contents(a), B = Contents(b), X = Contents(x), zero(3, 2);
    const Exact right[] = {A * X - (zero - X * B), A * X - X * B, A * X * B - X};
    for (int32_t equation = 0; equation < 3; ++equation) {
        DBL2DArray c(3, 2), found;
        CDB2DArray complexC(3, 2), complexFound, complexA(3, 3), complexB(2, 2);
        for (int i = 0; i < 6; ++i) {
            c.data()[i] = static_cast<double>(right[equation](i / 2, i % 2).real());
            complexC.data()[i] = {-c[i], c[i]}; // (-1 + i) c belongs to (-1 + i) x
        }
        for (int i = 0; i < 9; ++i)
            complexA.data()[i] = {a[i], 0.0};
        for (int i = 0; i < 4; ++i)
            complexB.data()[i] = {b[i], 0.0};
        ASSERT_EQ(Sylvester(a, b, c, equation, found), 0);
        ASSERT_EQ(Sylvester(complexA, complexB, complexC, equation, complexFound), 0);
        for (int i = 0; i < 6; ++i) {
            EXPECT_NEAR(found[i], x[i], 1e-13) << equation;
            EXPECT_NEAR(complexFound[i].re, -x[i], 1e-13) << equation;
            EXPECT_NEAR(complexFound[i].im, x[i], 1e-13) << equation;
        }
    }
}

// For a = (0 -2; 1 -3) and q = -1 by hand: x = (5 1; 1 1) / 4.
TEST(LyapunovEquation, HasTheUsualSigns) {
    const DBL2DArray a(2, 2, {0, -2, 1, -3}), q(2, 2, {-1, 0, 0, -1});
    DBL2DArray x;
    ASSERT_EQ(Lyapunov_head(a.handle(), q.handle(), x.handle()), 0);
    const double expected[] = {1.25, 0.25, 0.25, 0.25};
    for (int i = 0; i < 4; ++i)
        EXPECT_NEAR(x[i], expected[i], 1e-15);
    // x = sum of a^k q a'^k; with a = (0 1; 0 1/2) and q = 1 by hand: (7/3 2/3; 2/3 4/3).
    const DBL2DArray stable(2, 2, {0, 1, 0, 0.5}), one(2, 2, {1, 0, 0, 1});
    ASSERT_EQ(Lyapunov(stable, one, 1, x), 0);
    const double positive[] = {7.0 / 3, 2.0 / 3, 2.0 / 3, 4.0 / 3};
    for (int i = 0; i < 4; ++i)
        EXPECT_NEAR(x[i], positive[i], 1e-15);
}

TEST(LyapunovEquation, KeepsTheSymmetryOfTheRightSide) {
    for (const int n : {1, 2, 9, 40})
        for (int32_t equation = 0; equation < 2; ++equation) {
            const DBL2DArray a = Matrix(n, n, Reals(n * n, 4));
            const CDB2DArray z = Matrix(n, n, Complexes(n * n, 5));
            DBL2DArray q = a, x;
            CDB2DArray h = z, y;
            for (int i = 0; i < n; ++i)
                for (int j = 0; j <= i; ++j) {
                    q.data()[j * n + i] = q[i * n + j];
                    h.data()[j * n + i] = {h[i * n + j].re, -h[i * n + j].im};
                    if (i == j)
                        h.data()[i * n + i].im = 0.0;
                }
            ASSERT_EQ(Lyapunov(a, q, equation, x), 0);
            ASSERT_EQ(Lyapunov(z, h, equation, y), 0);
            for (int i = 0; i < n; ++i)
                for (int j = 0; j <= i; ++j) {
                    EXPECT_EQ(x[i * n + j], x[j * n + i]);
                    EXPECT_EQ(y[i * n + j].re, y[j * n + i].re);
                    EXPECT_EQ(y[i * n + j].im, -y[j * n + i].im);
                }
            if (n > 1) { // any other right-hand side is not symmetrised
                q.data()[1] += 1.0;
                ASSERT_EQ(Lyapunov(a, q, equation, x), 0);
                EXPECT_NE(x[1], x[n]);
            }
        }
}

TEST(MatrixEquations, AreSingularAtTheStatedDistance) {
    const auto scalar = [](double a, double b, int32_t equation) {
        DBL2DArray x;
        return Sylvester(DBL2DArray(1, 1, {a}), DBL2DArray(1, 1, {b}), DBL2DArray(1, 1, {1.0}),
                         equation, x);
    };
    for (const double scale : {1.0, 0x1p900, 0x1p-900}) {
        EXPECT_EQ(scalar(scale, -(1 - 0x1p-52) * scale, 0), ErrSingularMatrix);
        EXPECT_EQ(scalar(scale, -(1 - 0x1p-51) * scale, 0), 0);
        EXPECT_EQ(scalar(scale, (1 - 0x1p-52) * scale, 1), ErrSingularMatrix);
        EXPECT_EQ(scalar(scale, (1 - 0x1p-51) * scale, 1), 0);
        EXPECT_EQ(scalar(scale, (1 - 0x1p-52) / scale, 2), ErrSingularMatrix);
        EXPECT_EQ(scalar(scale, (1 - 0x1p-51) / scale, 2), 0);
    }
    EXPECT_EQ(scalar(0.0, 0.0, 0), ErrSingularMatrix);
    EXPECT_EQ(scalar(0.0, 0.0, 2), 0);
    // The norm is that of the whole matrix: |l + m| = 2^-40 against eps |a| = 2^-39.
    DBL2DArray x;
    const DBL2DArray b(1, 1, {0.0}), c(2, 1, {1.0, 1.0});
    EXPECT_EQ(Sylvester(DBL2DArray(2, 2, {0x1p-40, 0, 0, 0x1p13}), b, c, 0, x), ErrSingularMatrix);
    EXPECT_EQ(Sylvester(DBL2DArray(2, 2, {0x1p-40, 0, 0, 0x1p11}), b, c, 0, x), 0);
    // The eigenvalues are i and -i, whose sum is 0 although the matrix is nonsingular.
    const DBL2DArray turn(2, 2, {0, 1, -1, 0});
    for (int32_t equation = 0; equation < 2; ++equation)
        EXPECT_EQ(Lyapunov(turn, turn, equation, x), ErrSingularMatrix);
    EXPECT_EQ(x.rows(), 0);
}

// Scaling by powers of two changes no digits, however large they are.
TEST(MatrixEquations, ScaleWithTheirMatrices) {
    const int m = 12, n = 9;
    const DBL2DArray a = Matrix(m, m, Reals(m * m, 1)), b = Matrix(n, n, Reals(n * n, 2)),
                     c = Matrix(m, n, Reals(m * n, 3));
    const auto scaled = [](DBL2DArray matrix, int exponent) {
        for (int i = 0; i < matrix.rows() * matrix.cols(); ++i)
            matrix.data()[i] = std::ldexp(matrix[i], exponent);
        return matrix;
    };
    for (const int exponent : {-1000, -300, 300, 1023})
        for (int32_t equation = 0; equation < 3; ++equation) {
            DBL2DArray x, y;
            ASSERT_EQ(Sylvester(a, b, c, equation, x), 0);
            const bool products = equation == 2;
            const int other = products ? -exponent : exponent, shift = products ? 0 : -exponent;
            const int right = std::clamp(exponent, -900, 900);
            ASSERT_EQ(
                Sylvester(scaled(a, exponent), scaled(b, other), scaled(c, right), equation, y), 0);
            EXPECT_EQ(y.values(), scaled(x, right + shift).values()) << exponent << ' ' << equation;
        }
}

// Each element of x is the one below it times -2^30, from 2^-970 to 2^800.
TEST(MatrixEquations, FollowGrowthBeyondTheRangeOfADouble) {
    const int n = 60;
    DBL2DArray a(n, n), c(n, 1), x;
    const DBL2DArray b(1, 1, {0.0});
    for (int i = 0; i < n; ++i) {
        a.data()[i * n + i] = 0x1p-30;
        if (i + 1 < n)
            a.data()[i * n + i + 1] = 1.0;
    }
    c.data()[n - 1] = 0x1p-1000;
    ASSERT_EQ(Sylvester(a, b, c, 0, x), 0);
    for (int i = 0; i < 20; ++i)
        EXPECT_EQ(x[i], std::ldexp(i % 2 == 0 ? -1.0 : 1.0, 800 - 30 * i));
    c.data()[n - 1] = 1.0;
    EXPECT_EQ(Sylvester(a, b, c, 0, x), ErrOverflow);
    EXPECT_EQ(x.rows(), 0);
}

TEST(MatrixEquations, RefuseInTheStatedOrder) {
    const double nan = std::numeric_limits<double>::quiet_NaN();
    const DBL2DArray empty, wide(2, 3), two(2, 2, {1, nan, 0, 1}), three(3, 3), one(1, 1, {1});
    DBL2DArray x;
    EXPECT_EQ(Sylvester(empty, wide, wide, 9, x), ErrEmptyInput);
    EXPECT_EQ(Sylvester(wide, two, empty, 9, x), ErrEmptyInput);
    EXPECT_EQ(Sylvester(two, wide, two, 9, x), ErrNotSquare);
    EXPECT_EQ(Sylvester(two, three, two, 9, x), ErrSizesDisagree);
    EXPECT_EQ(Sylvester(two, two, two, 3, x), ErrInvalidSelector);
    EXPECT_EQ(Sylvester(two, two, two, -1, x), ErrInvalidSelector);
    EXPECT_EQ(Sylvester(two, two, two, 0, x), ErrNonFiniteInput);
    EXPECT_EQ(Lyapunov(empty, wide, 9, x), ErrEmptyInput);
    EXPECT_EQ(Lyapunov(two, wide, 9, x), ErrNotSquare);
    EXPECT_EQ(Lyapunov(two, three, 9, x), ErrSizesDisagree);
    EXPECT_EQ(Lyapunov(two, two, 2, x), ErrInvalidSelector);
    EXPECT_EQ(Lyapunov(two, two, 1, x), ErrNonFiniteInput);
    const double largest = std::numeric_limits<double>::max();
    EXPECT_EQ(Sylvester(one, one, DBL2DArray(1, 1, {largest}), 0, x), 0);
    EXPECT_EQ(x[0], largest / 2);
}

} // namespace
} // namespace qx::test
