#include "linalg/blas/blas.h"
#include "linalg/products/panel_memory.h"
#include "linalg/products/products.h"
#include "linalg/scalar.h"
#include "linalg/tests/matrices.h"

#include <gtest/gtest.h>

#include <cmath>
#include <complex>
#include <cstring>
#include <initializer_list>
#include <memory>
#include <string>
#include <vector>

namespace qx::test {
namespace {

using qx::operator*, qx::operator-;

typedef std::complex<long double> Exact;

Exact Of(double x) { return x; }
Exact Of(CDB z) { return {z.re, z.im}; }
template <class T>
T Number(double re, double im);
template <>
double Number(double re, double) {
    return re;
}
template <>
CDB Number(double re, double im) {
    return {re, im};
}
template <class T>
std::vector<T> Random(std::size_t count, int seed);
template <>
std::vector<double> Random(std::size_t count, int seed) {
    return Reals(static_cast<int>(count), seed);
}
template <>
std::vector<CDB> Random(std::size_t count, int seed) {
    return Complexes(static_cast<int>(count), seed);
}

// Elements of a matrix or vector in a block of exactly the size that BLAS may access, so that the
// address sanitizer detects accesses beyond it; its start is not aligned for vectors.
template <class T>
class Block {
public:
    Block(std::ptrdiff_t rows, std::ptrdiff_t cols, std::ptrdiff_t leading, int seed)
        : leading_(leading), size_(rows > 0 && cols > 0 ? (cols - 1) * leading + rows : 0),
          memory_(new char[size_ * sizeof(T) + 8]) {
        const std::vector<T> values = Random<T>(static_cast<std::size_t>(size_), seed);
        if (size_ > 0)
            std::memcpy(memory_.get() + 8, values.data(), size_ * sizeof(T));
    }
    T *data() { return reinterpret_cast<T *>(memory_.get() + 8); }
    T at(std::ptrdiff_t i, std::ptrdiff_t j) {
        T value;
        std::memcpy(&value, data() + i + j * leading_, sizeof value);
        return value;
    }
    void set(std::ptrdiff_t i, std::ptrdiff_t j, T value) {
        std::memcpy(data() + i + j * leading_, &value, sizeof value);
    }
    std::vector<T> all() {
        std::vector<T> values(static_cast<std::size_t>(size_));
        if (size_ > 0)
            std::memcpy(values.data(), data(), size_ * sizeof(T));
        return values;
    }
    int32_t leading() const { return static_cast<int32_t>(leading_); }

private:
    std::ptrdiff_t leading_, size_;
    std::unique_ptr<char[]> memory_;
};

// Element (i, j) of op(a), as stored.
template <class T>
Exact Operated(Block<T> &a, char trans, std::ptrdiff_t i, std::ptrdiff_t j) {
    const Exact value = trans == 'N' ? Of(a.at(i, j)) : Of(a.at(j, i));
    return trans == 'C' ? std::conj(value) : value;
}

template <class T>
struct Routines;
template <>
struct Routines<double> {
    static constexpr auto gemm = dgemm_;
    static constexpr auto gemv = dgemv_;
    static constexpr auto trmm = dtrmm_;
    static constexpr auto trsm = dtrsm_;
    static constexpr auto axpy = daxpy_;
    static constexpr auto hemv = dsymv_;
    static constexpr auto her2k = dsyr2k_;
    static constexpr char adjoint = 'T';
};
template <>
struct Routines<CDB> {
    static constexpr auto gemm = zgemm_;
    static constexpr auto gemv = zgemv_;
    static constexpr auto trmm = ztrmm_;
    static constexpr auto trsm = ztrsm_;
    static constexpr auto axpy = zaxpy_;
    static constexpr auto hemv = zhemv_;
    static constexpr auto her2k = zher2k_;
    static constexpr char adjoint = 'C';
};

template <class T>
class Blas : public testing::Test {};
typedef testing::Types<double, CDB> Elements;
TYPED_TEST_SUITE(Blas, Elements);

constexpr double eps = 0x1p-52;

std::string Sizes(std::initializer_list<int> sizes) {
    std::string text;
    for (const int size : sizes)
        text += " " + std::to_string(size);
    return text;
}

template <class T>
void ExpectProduct(char transA, char transB, int m, int n, int k, T alpha, T beta) {
    SCOPED_TRACE((std::string{transA, transB} + Sizes({m, n, k})));
    const bool plainA = transA == 'N', plainB = transB == 'N';
    Block<T> a(plainA ? m : k, plainA ? k : m, (plainA ? m : k) + 3, 1);
    Block<T> b(plainB ? k : n, plainB ? n : k, (plainB ? k : n) + 1, 2);
    Block<T> c(m, n, m + 2, 3), before = Block<T>(m, n, m + 2, 3);
    const int32_t lda = a.leading(), ldb = b.leading(), ldc = c.leading();
    // c is not read if beta is 0.
    const bool isRead = std::abs(Of(beta)) != 0;
    for (int j = 0; j < n && !isRead; ++j)
        for (int i = 0; i < m; ++i)
            c.set(i, j, Number<T>(NAN, NAN));
    Routines<T>::gemm(&transA, &transB, &m, &n, &k, &alpha, a.data(), &lda, b.data(), &ldb, &beta,
                      c.data(), &ldc, 1, 1);
    for (int j = 0; j < n; ++j)
        for (int i = 0; i < m; ++i) {
            Exact sum = isRead ? Of(beta) * Of(before.at(i, j)) : Exact(0);
            long double size = std::abs(sum);
            for (int p = 0; p < k; ++p) {
                const Exact term =
                    Of(alpha) * Operated(a, transA, i, p) * Operated(b, transB, p, j);
                sum += term;
                size += std::abs(term);
            }
            const long double error = std::abs(Of(c.at(i, j)) - sum);
            ASSERT_TRUE(error <= (k + 4) * eps * size) << i << " " << j;
        }
    // Nothing is written between the columns.
    const auto now = c.all(), then = before.all();
    for (int j = 0; m > 0 && j + 1 < n; ++j)
        for (int i = m; i < ldc; ++i)
            ASSERT_EQ(std::memcmp(&now[j * ldc + i], &then[j * ldc + i], sizeof(T)), 0);
}

TYPED_TEST(Blas, ProductsAreThoseOfTheDefinition) {
    typedef TypeParam T;
    const T one = Number<T>(1, 0), minus = Number<T>(-1, 0), none = Number<T>(0, 0),
            some = Number<T>(0.7, -1.3);
    const int sizes[] = {0, 1, 3, 4, 5, 8, 9, 17};
    for (const char transA : {'N', 'T', 'C'})
        for (const char transB : {'N', 'T', 'C'}) {
            for (const int m : sizes)
                for (const int n : sizes)
                    ExpectProduct<T>(transA, transB, m, n, (m * 5 + n) % 11, some, one);
            for (const T alpha : {one, minus, none, some})
                for (const T beta : {one, minus, none, some}) {
                    ExpectProduct<T>(transA, transB, 6, 9, 3, alpha, beta);
                    if (transA == transB)
                        ExpectProduct<T>(transA, transB, 41, 22, 73, alpha, beta);
                }
            // Sizes on both sides of the blocks of rows, of terms and of small products.
            ExpectProduct<T>(transA, transB, 97, 13, 65, one, one);
            ExpectProduct<T>(transA, transB, 31, 11, 257, minus, one);
        }
    ExpectProduct<T>('N', 'N', 3, 2051, 40, one, none);
    ExpectProduct<T>('N', 'N', 2051, 9, 70, one, none);
}

// The sum of each element has a fixed order, however the product is blocked; compared with the
// plain loop.
TYPED_TEST(Blas, ProductsKeepTheOrderOfTheirTerms) {
    typedef TypeParam T;
    for (const int n : {5, 64, 131, 300}) {
        Block<T> a(n, n, n, 1), b(n, n, n, 2), c(n, n, n, 3), sums(n, n, n, 3);
        const T one = Number<T>(1, 0), minus = Number<T>(-1, 0);
        for (int j = 0; j < n; ++j)
            for (int i = 0; i < n; ++i) {
                T sum = sums.at(i, j);
                for (int p = 0; p < n; ++p) {
                    const T term = b.at(p, j) * a.at(i, p);
                    sum = sum - term;
                }
                sums.set(i, j, sum);
            }
        Routines<T>::gemm("N", "N", &n, &n, &n, &minus, a.data(), &n, b.data(), &n, &one, c.data(),
                          &n, 1, 1);
        EXPECT_EQ(std::memcmp(c.data(), sums.data(), sizeof(T) * n * n), 0) << n;
    }
}

// If no pages can be allocated, the operands are not packed; the bits are the same.
TEST(Products, WithoutPagesGiveTheSameBits) {
    const int n = 150;
    const auto a = Reals(n * n, 1);
    std::vector<double> packed(n * n), c(n * n);
    const auto multiply = [&](std::vector<double> &to) {
        qx::MatrixProduct<ElementType::DBL>(qx::test::View(a, n, n), qx::test::View(a, n, n),
                                            qx::test::View(to, n, n));
    };
    multiply(packed);
    std::vector<std::unique_ptr<qx::PanelMemory>> taken;
    do
        taken.push_back(std::make_unique<qx::PanelMemory>());
    while (taken.back()->data() != nullptr);
    multiply(c);
    EXPECT_EQ(c, packed);
}

template <class T>
void ExpectMatrixVector(char trans, int m, int n, int incx, int incy, T alpha, T beta) {
    SCOPED_TRACE(std::string(1, trans) + Sizes({m, n, incx, incy}));
    const int from = trans == 'N' ? n : m, to = trans == 'N' ? m : n;
    Block<T> a(m, n, m + 1, 1), x(1, from, std::abs(incx), 2), y(1, to, std::abs(incy), 3),
        before(1, to, std::abs(incy), 3);
    const int32_t lda = a.leading();
    const bool isRead = std::abs(Of(beta)) != 0;
    for (int i = 0; i < to && !isRead; ++i)
        y.set(0, i, Number<T>(NAN, NAN));
    Routines<T>::gemv(&trans, &m, &n, &alpha, a.data(), &lda, x.data(), &incx, &beta, y.data(),
                      &incy, 1);
    const auto at = [](int i, int count, int step) { return step > 0 ? i : count - 1 - i; };
    if (m == 0 || n == 0) { // y is not even multiplied by beta
        for (int i = 0; i < to; ++i)
            EXPECT_TRUE(isRead ? Of(y.at(0, i)) == Of(before.at(0, i))
                               : std::isnan(Of(y.at(0, i)).real()));
        return;
    }
    for (int i = 0; i < to; ++i) {
        Exact sum = isRead ? Of(beta) * Of(before.at(0, at(i, to, incy))) : Exact(0);
        long double size = std::abs(sum);
        for (int p = 0; p < from; ++p) {
            const Exact term =
                Of(alpha) * Operated(a, trans, i, p) * Of(x.at(0, at(p, from, incx)));
            sum += term;
            size += std::abs(term);
        }
        ASSERT_TRUE(std::abs(Of(y.at(0, at(i, to, incy))) - sum) <= (from + 4) * eps * size) << i;
    }
}

TYPED_TEST(Blas, MatrixTimesVectorIsThatOfTheDefinition) {
    typedef TypeParam T;
    const T one = Number<T>(1, 0), none = Number<T>(0, 0), some = Number<T>(0.7, -1.3);
    for (const char trans : {'N', 'T', 'C'})
        for (const int step : {1, 2, -1, -3}) {
            for (const int m : {0, 1, 3, 8, 17})
                for (const int n : {0, 1, 4, 9, 66}) {
                    ExpectMatrixVector<T>(trans, m, n, step, 1, some, one);
                    ExpectMatrixVector<T>(trans, m, n, 1, step, one, none);
                }
            ExpectMatrixVector<T>(trans, 515, 67, step, step, some, some);
            ExpectMatrixVector<T>(trans, 5, 4, step, step, none, some);
        }
}

// op(a) x = alpha b or x op(a) = alpha b: trsm finds x, and trmm, with alpha on the other side, b.
template <class T>
void ExpectTriangular(char side, char uplo, char trans, char diag, int m, int n, T alpha,
                      bool solve) {
    SCOPED_TRACE(
        (std::string{side, uplo, trans, diag} + (solve ? " solve" : " multiply") + Sizes({m, n})));
    const int order = side == 'L' ? m : n;
    Block<T> a(order, order, order + 2, 1), b(m, n, m + 1, 2), before(m, n, m + 1, 2);
    const int32_t lda = a.leading(), ldb = b.leading();
    // Elements that must not be read are NaN; the others make a well-conditioned matrix.
    for (int j = 0; j < order; ++j)
        for (int i = 0; i < order; ++i) {
            const bool isStored = uplo == 'U' ? i < j : i > j;
            if (i == j)
                a.set(i, j, diag == 'U' ? Number<T>(NAN, NAN) : Number<T>(2.0 + i % 3, 0.5));
            else if (isStored)
                a.set(i, j, a.at(i, j) * (1.0 / order));
            else
                a.set(i, j, Number<T>(NAN, NAN));
        }
    (solve ? Routines<T>::trsm : Routines<T>::trmm)(&side, &uplo, &trans, &diag, &m, &n, &alpha,
                                                    a.data(), &lda, b.data(), &ldb, 1, 1, 1, 1);
    const auto factor = [&](int i, int j) {
        if (i == j)
            return diag == 'U' ? Exact(1) : Operated(a, trans, i, i);
        const bool isUpper = (uplo == 'U') == (trans == 'N');
        return (isUpper ? i < j : i > j) ? Operated(a, trans, i, j) : Exact(0);
    };
    Block<T> &from = solve ? b : before, &to = solve ? before : b;
    for (int j = 0; j < n; ++j)
        for (int i = 0; i < m; ++i) {
            Exact sum = 0;
            long double size = 0;
            for (int k = 0; k < order; ++k) {
                const Exact term = side == 'L' ? factor(i, k) * Of(from.at(k, j))
                                               : Of(from.at(i, k)) * factor(k, j);
                sum += solve ? term : Of(alpha) * term;
                size += std::abs(term);
            }
            const Exact right = solve ? Of(alpha) * Of(to.at(i, j)) : Of(to.at(i, j));
            ASSERT_TRUE(std::abs(right - sum) <= (order + 8) * eps * (size + std::abs(right)))
                << i << " " << j;
        }
}

TYPED_TEST(Blas, TrianglesMultiplyAndSolve) {
    typedef TypeParam T;
    const T one = Number<T>(1, 0), some = Number<T>(0.7, -1.3);
    for (const bool solve : {false, true})
        for (const char side : {'L', 'R'})
            for (const char uplo : {'U', 'L'})
                for (const char trans : {'N', 'T', 'C'})
                    for (const char diag : {'N', 'U'}) {
                        for (const int m : {0, 1, 33})
                            for (const int n : {0, 1, 34})
                                ExpectTriangular<T>(side, uplo, trans, diag, m, n, some, solve);
                        ExpectTriangular<T>(side, uplo, trans, diag, side == 'L' ? 70 : 5,
                                            side == 'L' ? 5 : 70, one, solve);
                    }
}

bool IsIn(char uplo, int i, int j) { return uplo == 'U' ? i <= j : i >= j; }

// A full Hermitian matrix, in which the elements that BLAS must not read are set to NaN.
template <class T>
std::vector<Exact> HermitianOf(Block<T> &a, char uplo, int n) {
    std::vector<Exact> whole(n * n);
    for (int j = 0; j < n; ++j)
        for (int i = 0; i < n; ++i)
            if (IsIn(uplo, i, j)) {
                whole[i + j * n] = i == j ? Exact(Of(a.at(i, i)).real()) : Of(a.at(i, j));
                whole[j + i * n] = std::conj(whole[i + j * n]);
            } else
                a.set(i, j, Number<T>(NAN, NAN));
    for (int i = 0; i < n; ++i)
        a.set(i, i, Number<T>(static_cast<double>(whole[i + i * n].real()), NAN));
    return whole;
}

TYPED_TEST(Blas, HermitianMatricesMultiplyVectors) {
    typedef TypeParam T;
    const T alpha = Number<T>(0.7, -1.3);
    for (const char uplo : {'U', 'L'})
        for (const int n : {0, 1, 7, 64, 65, 200})
            for (const int stepX : {1, -2})
                for (const int stepY : {1, 3})
                    for (const double beta : {0.0, 1.0, 0.5}) {
                        SCOPED_TRACE(uplo + Sizes({n, stepX, stepY}));
                        Block<T> a(n, n, n + 1, 4), x(n, 1, n, 5), y(n, 1, n, 6);
                        const std::vector<Exact> whole = HermitianOf(a, uplo, n);
                        std::vector<T> from(n * 2 + 1), to(n * 3 + 1, Number<T>(NAN, NAN));
                        for (int i = 0; i < n; ++i) {
                            from[stepX > 0 ? i : (n - 1 - i) * 2] = x.at(i, 0);
                            if (beta != 0.0)
                                to[i * stepY] = y.at(i, 0);
                        }
                        const int32_t lda = n + 1;
                        const T factor = Number<T>(beta, 0);
                        Routines<T>::hemv(&uplo, &n, &alpha, a.data(), &lda, from.data(), &stepX,
                                          &factor, to.data(), &stepY, 1);
                        for (int i = 0; i < n; ++i) {
                            Exact sum = static_cast<long double>(beta) * Of(y.at(i, 0));
                            long double size = std::abs(sum);
                            for (int j = 0; j < n; ++j) {
                                const Exact term = Of(alpha) * whole[i + j * n] * Of(x.at(j, 0));
                                sum += term;
                                size += std::abs(term);
                            }
                            ASSERT_TRUE(std::abs(Of(to[i * stepY]) - sum) <= (n + 8) * eps * size)
                                << i;
                        }
                    }
}

TYPED_TEST(Blas, UpdatesOfRankTwoChangeOneTriangle) {
    typedef TypeParam T;
    const T alpha = Number<T>(0.7, -1.3);
    for (const char uplo : {'U', 'L'})
        for (const char trans : {'N', Routines<T>::adjoint})
            for (const int n : {0, 1, 7, 64, 65, 150})
                for (const int k : {0, 1, 33})
                    for (const double beta : {0.0, 1.0, 0.5}) {
                        if (n == 150 && (k < 33 || beta != 0.5)) // takes seconds
                            continue;
                        SCOPED_TRACE((std::string{uplo, trans} + Sizes({n, k})));
                        const bool plain = trans == 'N';
                        const int rows = plain ? n : k, cols = plain ? k : n;
                        Block<T> a(rows, cols, rows + 2, 7), b(rows, cols, rows + 1, 8);
                        Block<T> c(n, n, n + 3, 9);
                        const std::vector<Exact> before = HermitianOf(c, uplo, n);
                        for (int i = 0; i < n; ++i)
                            c.set(i, i,
                                  Number<T>(static_cast<double>(before[i + i * n].real()), 0));
                        const int32_t lda = a.leading(), ldb = b.leading(), ldc = c.leading();
                        const DBL factor = beta;
                        Routines<T>::her2k(&uplo, &trans, &n, &k, &alpha, a.data(), &lda, b.data(),
                                           &ldb, &factor, c.data(), &ldc, 1, 1);
                        for (int j = 0; j < n; ++j)
                            for (int i = 0; i < n; ++i) {
                                if (!IsIn(uplo, i, j)) {
                                    ASSERT_TRUE(std::isnan(Of(c.at(i, j)).real())) << i << " " << j;
                                    continue;
                                }
                                Exact sum = static_cast<long double>(beta) * before[i + j * n];
                                long double size = std::abs(sum);
                                for (int p = 0; p < k; ++p) {
                                    const Exact left = Of(alpha) * Operated(a, trans, i, p) *
                                                       std::conj(Operated(b, trans, j, p));
                                    const Exact right = std::conj(Of(alpha)) *
                                                        Operated(b, trans, i, p) *
                                                        std::conj(Operated(a, trans, j, p));
                                    sum += left + right;
                                    size += std::abs(left) + std::abs(right);
                                }
                                ASSERT_TRUE(std::abs(Of(c.at(i, j)) - sum) <=
                                            (2 * k + 8) * eps * size)
                                    << i << " " << j;
                            }
                    }
}

// With integers, for which every order of summation gives the same result.
TEST(Blas, OuterProductsAndRotations) {
    for (const int stepX : {1, 2, -2})
        for (const int stepY : {1, 3, -1})
            for (const int m : {0, 1, 6, 515}) {
                const int n = 67;
                std::vector<CDB> x(m * 2 + 1), y(n * 3 + 1), a(m * n), c(m * n);
                for (std::size_t i = 0; i < x.size(); ++i)
                    x[i] = {1.0 + static_cast<double>(i % 7), 2.0};
                for (std::size_t i = 0; i < y.size(); ++i)
                    y[i] = {3.0, static_cast<double>(i % 5)};
                const CDB alpha = {2.0, 1.0};
                zgerc_(&m, &n, &alpha, x.data(), &stepX, y.data(), &stepY, a.data(), &m);
                zgeru_(&m, &n, &alpha, x.data(), &stepX, y.data(), &stepY, c.data(), &m);
                for (int j = 0; j < n; ++j)
                    for (int i = 0; i < m; ++i) {
                        const CDB u = x[stepX > 0 ? i * stepX : (i - m + 1) * stepX];
                        const CDB v = y[stepY > 0 ? j * stepY : (j - n + 1) * stepY];
                        ASSERT_EQ(Of(a[j * m + i]), Of(alpha) * Of(u) * std::conj(Of(v)));
                        ASSERT_EQ(Of(c[j * m + i]), Of(alpha) * Of(u) * Of(v));
                    }
            }
    for (const int step : {1, 2, -1})
        for (const int n : {0, 1, 5, 33}) {
            std::vector<CDB> p(n * 2 + 1), q(n * 2 + 1);
            for (int i = 0; i < 2 * n; ++i) {
                p[i] = {1.0 + i, 2.0};
                q[i] = {3.0, 4.0 - i};
            }
            const auto x = p, y = q;
            const double c = 3.0;
            const CDB s = {2.0, -5.0};
            zrot_(&n, p.data(), &step, q.data(), &step, &c, &s);
            for (int i = 0; i < n; ++i) {
                const int at = i * std::abs(step);
                const Exact u = Of(x[at]), v = Of(y[at]);
                EXPECT_EQ(Of(p[at]), 3.0L * u + Of(s) * v);
                EXPECT_EQ(Of(q[at]), 3.0L * v - std::conj(Of(s)) * u);
            }
            p = x;
            q = y;
            zdrot_(&n, p.data(), &step, q.data(), &step, &c, &s.re);
            for (int i = 0; i < n; ++i) {
                const int at = i * std::abs(step);
                EXPECT_EQ(Of(p[at]), 3.0L * Of(x[at]) + 2.0L * Of(y[at]));
                EXPECT_EQ(Of(q[at]), 3.0L * Of(y[at]) - 2.0L * Of(x[at]));
            }
        }
}

TYPED_TEST(Blas, MultiplesOfVectorsAreAdded) {
    typedef TypeParam T;
    const T factor = Number<T>(2.0, 3.0);
    for (const int stepX : {1, 2, -1})
        for (const int stepY : {1, -2})
            for (const int n : {-1, 0, 1, 7, 40}) {
                const int count = n < 0 ? 0 : n;
                std::vector<T> x(2 * count + 1), y(2 * count + 1);
                for (int i = 0; i < 2 * count; ++i) {
                    x[i] = Number<T>(i, 1.0);
                    y[i] = Number<T>(1.0, i);
                }
                const auto before = y;
                Routines<T>::axpy(&n, &factor, x.data(), &stepX, y.data(), &stepY);
                for (int i = 0; i < count; ++i) {
                    const T u = x[stepX > 0 ? i * stepX : (i - n + 1) * stepX];
                    const int at = stepY > 0 ? i * stepY : (i - n + 1) * stepY;
                    EXPECT_EQ(Of(y[at]), Of(before[at]) + Of(factor) * Of(u));
                }
            }
}

} // namespace
} // namespace qx::test
