#include "linalg/blas/arguments.h"
#include "linalg/blas/blas.h"
#include "linalg/kernels.h"
#include "linalg/products/ordered.h"

#include <algorithm>

namespace qx::blas {

namespace {

constexpr auto Real = ElementType::DBL, Complex = ElementType::CDB;

// A matrix as the products take it: element (i, j) is data[i * down + j * across].
template <ElementType E>
struct Operand {
    const ElementOf<E> *data;
    std::ptrdiff_t down, across;
    bool isConjugated;

    Operand transposed() const { return {data, across, down, isConjugated}; }
    Operand from(std::ptrdiff_t i, std::ptrdiff_t j) const {
        return {data + i * down + j * across, down, across, isConjugated};
    }
    typename ScalarOf<E>::type operator()(std::ptrdiff_t i, std::ptrdiff_t j) const {
        const ElementOf<E> &element = data[i * down + j * across];
        return isConjugated ? Conj(element) : element;
    }
};

// op(a), where a is stored column by column.
template <ElementType E>
Operand<E> Operated(const char *trans, const ElementOf<E> *a, std::ptrdiff_t lda) {
    if (Is(trans, 'N'))
        return {a, 1, lda, false};
    return {a, lda, 1, E == Complex && Is(trans, 'C')};
}

// c += factor a b, where c is stored row by row.
void AddProductOf(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, double factor,
                  const Operand<Real> &a, const Operand<Real> &b, DBL *c, std::ptrdiff_t stride) {
    AddProductReal(m, n, k, {factor}, {a.data, a.down, a.across}, {b.data, b.down, b.across}, c,
                   stride);
}
void AddProductOf(std::ptrdiff_t m, std::ptrdiff_t n, std::ptrdiff_t k, CDB factor,
                  const Operand<Complex> &a, const Operand<Complex> &b, CDB *c,
                  std::ptrdiff_t stride) {
    AddProductComplex(m, n, k, {factor.re, factor.im}, {a.data, a.down, a.across, a.isConjugated},
                      {b.data, b.down, b.across, b.isConjugated}, c, stride);
}

// The rows of c are the columns of its transpose, which is the product of the transposes.
template <ElementType E>
void MatrixMatrix(const char *transA, const char *transB, std::ptrdiff_t m, std::ptrdiff_t n,
                  std::ptrdiff_t k, typename ScalarOf<E>::type alpha, const ElementOf<E> *a,
                  std::ptrdiff_t lda, const ElementOf<E> *b, std::ptrdiff_t ldb,
                  typename ScalarOf<E>::type beta, ElementOf<E> *c, std::ptrdiff_t ldc) {
    if (m <= 0 || n <= 0)
        return;
    for (std::ptrdiff_t j = 0; j < n; ++j)
        Scale<E>({c + j * ldc, m, 1}, m, beta);
    if (k > 0 && !IsReal(alpha, 0.0))
        AddProductOf(n, m, k, alpha, Operated<E>(transB, b, ldb).transposed(),
                     Operated<E>(transA, a, lda).transposed(), c, ldc);
}

// One triangle of c = alpha a b^H + conj(alpha) b a^H + beta c, by blocks of columns: the rectangle of a
// block by products in place, its triangle by products into a copy of the square block.
template <ElementType E>
class RankTwoUpdate {
public:
    typedef typename ScalarOf<E>::type Scalar;

    RankTwoUpdate(const char *trans, std::ptrdiff_t k, Scalar alpha, const ElementOf<E> *a,
                  std::ptrdiff_t lda, const ElementOf<E> *b, std::ptrdiff_t ldb)
        : k_(k), alpha_(alpha), a_(Operated<E>(trans, a, lda)), b_(Operated<E>(trans, b, ldb)) {}

    void add(bool isLower, std::ptrdiff_t n, ElementOf<E> *c, std::ptrdiff_t ldc) const {
        ElementOf<E> block[blockCols * blockCols];
        for (std::ptrdiff_t j = 0; j < n; j += blockCols) {
            const std::ptrdiff_t cols = std::min(blockCols, n - j), end = j + cols;
            ElementOf<E> *const triangle = c + j + j * ldc;
            CopyTriangle(isLower, cols, triangle, ldc, block, blockCols);
            addRectangle(j, cols, j, cols, block, blockCols);
            CopyTriangle(isLower, cols, block, blockCols, triangle, ldc);
            for (std::ptrdiff_t i = 0; E == Complex && i < cols; ++i)
                triangle[i + i * ldc] = ScalarOf<E>::Of(RealPart(triangle[i + i * ldc]));
            const std::ptrdiff_t first = isLower ? end : 0;
            addRectangle(first, isLower ? n - end : j, j, cols, c + first + j * ldc, ldc);
        }
    }

private:
    static constexpr std::ptrdiff_t blockCols = 64;

    static void CopyTriangle(bool isLower, std::ptrdiff_t n, const ElementOf<E> *from,
                             std::ptrdiff_t fromStride, ElementOf<E> *to, std::ptrdiff_t toStride) {
        for (std::ptrdiff_t j = 0; j < n; ++j)
            for (std::ptrdiff_t i = isLower ? j : 0; i < (isLower ? n : j + 1); ++i)
                to[i + j * toStride] = from[i + j * fromStride];
    }

    // The elements of c from row i and column j on, which are the columns and rows of its transpose.
    void addRectangle(std::ptrdiff_t i, std::ptrdiff_t rows, std::ptrdiff_t j, std::ptrdiff_t cols,
                      ElementOf<E> *c, std::ptrdiff_t ldc) const {
        if (rows <= 0)
            return;
        AddProductOf(cols, rows, k_, alpha_, Adjoint(b_.from(j, 0)), a_.from(i, 0).transposed(), c,
                     ldc);
        AddProductOf(cols, rows, k_, Conj(alpha_), Adjoint(a_.from(j, 0)),
                     b_.from(i, 0).transposed(), c, ldc);
    }
    static Operand<E> Adjoint(Operand<E> a) {
        a.isConjugated = E == Complex && !a.isConjugated;
        return a;
    }

    std::ptrdiff_t k_;
    Scalar alpha_;
    Operand<E> a_, b_;
};

template <ElementType E>
void AddRankTwo(const char *uplo, const char *trans, std::ptrdiff_t n, std::ptrdiff_t k,
                typename ScalarOf<E>::type alpha, const ElementOf<E> *a, std::ptrdiff_t lda,
                const ElementOf<E> *b, std::ptrdiff_t ldb, double beta, ElementOf<E> *c,
                std::ptrdiff_t ldc) {
    const bool isLower = Is(uplo, 'L');
    for (std::ptrdiff_t j = 0; j < n; ++j) {
        const std::ptrdiff_t first = isLower ? j : 0, rows = isLower ? n - j : j + 1;
        Scale<E>({c + first + j * ldc, rows, 1}, rows, ScalarOf<E>::Of(beta));
    }
    if (n > 0 && k > 0 && !IsReal(alpha, 0.0))
        RankTwoUpdate<E>(trans, k, alpha, a, lda, b, ldb).add(isLower, n, c, ldc);
}

// A triangular factor acts on the lines of b: its columns if the factor is on the right, otherwise
// its rows. Multiples of the lines before line i, or of those after it, are added to line i.
template <ElementType E>
class TriangularFactor {
public:
    TriangularFactor(const char *side, const char *uplo, const char *trans, const char *diag,
                     std::ptrdiff_t m, std::ptrdiff_t n, const ElementOf<E> *a, std::ptrdiff_t lda,
                     ElementOf<E> *b, std::ptrdiff_t ldb)
        : isRight_(Is(side, 'R')), isUnit_(Is(diag, 'U')), count_(isRight_ ? n : m),
          width_(isRight_ ? m : n), b_(b), ldb_(ldb) {
        const Operand<E> operated = Operated<E>(trans, a, lda);
        factors_ = isRight_ ? operated.transposed() : operated;
        const bool isUpper = Is(uplo, 'U') == Is(trans, 'N');
        takesBefore_ = isUpper == isRight_;
    }

    void multiply() {
        forBlocks(takesBefore_, [this](std::ptrdiff_t first, std::ptrdiff_t end) {
            withinBlock<false>(first, end);
            fromOtherBlocks(first, end, 1.0);
        });
    }
    void solve() {
        forBlocks(!takesBefore_, [this](std::ptrdiff_t first, std::ptrdiff_t end) {
            fromOtherBlocks(first, end, -1.0);
            withinBlock<true>(first, end);
        });
    }

private:
    typedef typename ScalarOf<E>::type Scalar;
    // Lines of one block are combined here, those of different blocks by products.
    static constexpr std::ptrdiff_t blockLines = 64;
    // This many elements of each line are processed at once; rows are processed in a copy.
    static constexpr std::ptrdiff_t chunk = 32;

    template <class Action>
    void forBlocks(bool lastFirst, const Action &action) {
        const std::ptrdiff_t blocks = (count_ + blockLines - 1) / blockLines;
        for (std::ptrdiff_t i = 0; i < blocks; ++i) {
            const std::ptrdiff_t first = (lastFirst ? blocks - 1 - i : i) * blockLines;
            action(first, std::min(first + blockLines, count_));
        }
    }

    // Adds `sign` times the contributions of the lines of other blocks to those of this one.
    void fromOtherBlocks(std::ptrdiff_t first, std::ptrdiff_t end, double sign) {
        const std::ptrdiff_t source = takesBefore_ ? 0 : end;
        const std::ptrdiff_t terms = takesBefore_ ? first : count_ - end;
        if (terms == 0)
            return;
        const Operand<E> factors = factors_.from(first, source);
        ElementOf<E> *const to = line(first);
        const Operand<E> lines = {line(source), isRight_ ? ldb_ : 1, isRight_ ? 1 : ldb_, false};
        const Scalar factor = ScalarOf<E>::Of(sign);
        if (isRight_)
            AddProductOf(end - first, width_, terms, factor, factors, lines, to, ldb_);
        else
            AddProductOf(width_, end - first, terms, factor, lines.transposed(),
                         factors.transposed(), to, ldb_);
    }

    template <bool Solve>
    void withinBlock(std::ptrdiff_t first, std::ptrdiff_t end) {
        ElementOf<E> copy[blockLines * chunk];
        const std::ptrdiff_t lines = end - first;
        for (std::ptrdiff_t at = 0; at < width_; at += chunk) {
            const std::ptrdiff_t width = std::min(chunk, width_ - at);
            if (isRight_) {
                withinChunk<Solve>(first, lines, line(first) + at, ldb_, width);
                continue;
            }
            ElementOf<E> *const rows = line(first) + at * ldb_;
            for (std::ptrdiff_t j = 0; j < width; ++j)
                for (std::ptrdiff_t i = 0; i < lines; ++i)
                    copy[i * chunk + j] = rows[i + j * ldb_];
            withinChunk<Solve>(first, lines, copy, chunk, width);
            for (std::ptrdiff_t j = 0; j < width; ++j)
                for (std::ptrdiff_t i = 0; i < lines; ++i)
                    rows[i + j * ldb_] = copy[i * chunk + j];
        }
    }

    // Multiplies or solves within a block, whose lines are `stride` elements apart.
    template <bool Solve>
    void withinChunk(std::ptrdiff_t first, std::ptrdiff_t lines, ElementOf<E> *b,
                     std::ptrdiff_t stride, std::ptrdiff_t width) {
        const bool lastFirst = takesBefore_ != Solve;
        for (std::ptrdiff_t step = 0; step < lines; ++step) {
            const std::ptrdiff_t i = lastFirst ? lines - 1 - step : step;
            ElementOf<E> *const to = b + i * stride;
            if (!Solve && !isUnit_)
                for (std::ptrdiff_t j = 0; j < width; ++j)
                    to[j] = factors_(first + i, first + i) * to[j];
            const std::ptrdiff_t source = takesBefore_ ? 0 : i + 1;
            const std::ptrdiff_t terms = takesBefore_ ? i : lines - 1 - i;
            ElementOf<E> factors[blockLines];
            for (std::ptrdiff_t k = 0; k < terms; ++k) {
                const Scalar factor = factors_(first + i, first + source + k);
                factors[k] = Solve ? -factor : factor;
            }
            AddTransposedProduct<E>({b + source * stride, static_cast<int32_t>(terms),
                                     static_cast<int32_t>(width), stride},
                                    {factors, terms}, {to, width});
            if (Solve && !isUnit_)
                for (std::ptrdiff_t j = 0; j < width; ++j)
                    to[j] = to[j] / factors_(first + i, first + i);
        }
    }

    ElementOf<E> *line(std::ptrdiff_t i) const { return b_ + i * (isRight_ ? ldb_ : 1); }

    bool isRight_, isUnit_, takesBefore_;
    std::ptrdiff_t count_, width_;
    Operand<E> factors_;
    ElementOf<E> *b_;
    std::ptrdiff_t ldb_;
};

template <ElementType E, bool Solve>
void Triangular(const char *side, const char *uplo, const char *trans, const char *diag,
                std::ptrdiff_t m, std::ptrdiff_t n, typename ScalarOf<E>::type alpha,
                const ElementOf<E> *a, std::ptrdiff_t lda, ElementOf<E> *b, std::ptrdiff_t ldb) {
    if (m <= 0 || n <= 0)
        return;
    for (std::ptrdiff_t j = 0; j < n; ++j)
        Scale<E>({b + j * ldb, m, 1}, m, alpha);
    if (IsReal(alpha, 0.0))
        return;
    TriangularFactor<E> factor(side, uplo, trans, diag, m, n, a, lda, b, ldb);
    if (Solve)
        factor.solve();
    else
        factor.multiply();
}

} // namespace

} // namespace qx::blas

using qx::blas::AddRankTwo, qx::blas::Complex, qx::blas::MatrixMatrix, qx::blas::Real,
    qx::blas::Triangular;

void dgemm_(const char *transA, const char *transB, const int32_t *m, const int32_t *n,
            const int32_t *k, const DBL *alpha, const DBL *a, const int32_t *lda, const DBL *b,
            const int32_t *ldb, const DBL *beta, DBL *c, const int32_t *ldc, std::size_t,
            std::size_t) {
    MatrixMatrix<Real>(transA, transB, *m, *n, *k, *alpha, a, *lda, b, *ldb, *beta, c, *ldc);
}
void zgemm_(const char *transA, const char *transB, const int32_t *m, const int32_t *n,
            const int32_t *k, const CDB *alpha, const CDB *a, const int32_t *lda, const CDB *b,
            const int32_t *ldb, const CDB *beta, CDB *c, const int32_t *ldc, std::size_t,
            std::size_t) {
    MatrixMatrix<Complex>(transA, transB, *m, *n, *k, *alpha, a, *lda, b, *ldb, *beta, c, *ldc);
}

void dsyr2k_(const char *uplo, const char *trans, const int32_t *n, const int32_t *k,
             const DBL *alpha, const DBL *a, const int32_t *lda, const DBL *b, const int32_t *ldb,
             const DBL *beta, DBL *c, const int32_t *ldc, std::size_t, std::size_t) {
    AddRankTwo<Real>(uplo, trans, *n, *k, *alpha, a, *lda, b, *ldb, *beta, c, *ldc);
}
void zher2k_(const char *uplo, const char *trans, const int32_t *n, const int32_t *k,
             const CDB *alpha, const CDB *a, const int32_t *lda, const CDB *b, const int32_t *ldb,
             const DBL *beta, CDB *c, const int32_t *ldc, std::size_t, std::size_t) {
    AddRankTwo<Complex>(uplo, trans, *n, *k, *alpha, a, *lda, b, *ldb, *beta, c, *ldc);
}

void dtrmm_(const char *side, const char *uplo, const char *trans, const char *diag,
            const int32_t *m, const int32_t *n, const DBL *alpha, const DBL *a, const int32_t *lda,
            DBL *b, const int32_t *ldb, std::size_t, std::size_t, std::size_t, std::size_t) {
    Triangular<Real, false>(side, uplo, trans, diag, *m, *n, *alpha, a, *lda, b, *ldb);
}
void ztrmm_(const char *side, const char *uplo, const char *trans, const char *diag,
            const int32_t *m, const int32_t *n, const CDB *alpha, const CDB *a, const int32_t *lda,
            CDB *b, const int32_t *ldb, std::size_t, std::size_t, std::size_t, std::size_t) {
    Triangular<Complex, false>(side, uplo, trans, diag, *m, *n, *alpha, a, *lda, b, *ldb);
}
void dtrsm_(const char *side, const char *uplo, const char *trans, const char *diag,
            const int32_t *m, const int32_t *n, const DBL *alpha, const DBL *a, const int32_t *lda,
            DBL *b, const int32_t *ldb, std::size_t, std::size_t, std::size_t, std::size_t) {
    Triangular<Real, true>(side, uplo, trans, diag, *m, *n, *alpha, a, *lda, b, *ldb);
}
void ztrsm_(const char *side, const char *uplo, const char *trans, const char *diag,
            const int32_t *m, const int32_t *n, const CDB *alpha, const CDB *a, const int32_t *lda,
            CDB *b, const int32_t *ldb, std::size_t, std::size_t, std::size_t, std::size_t) {
    Triangular<Complex, true>(side, uplo, trans, diag, *m, *n, *alpha, a, *lda, b, *ldb);
}
